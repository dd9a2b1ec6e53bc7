#include "textures/SkyTexture.h"

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/Uuid.h"
#include "platform/WideChar.h"
#include "textures/TextureFrame.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

constexpr int kNewest = 3;

// The url under which the consumer of the XML knows the document sun.
const char16_t kDocumentSunReference[] = u"/Rhino Document Sun";

}  // namespace

SkyTexture::SkyTexture() : sun(documentSun()), skyId(platform::newUuidString()) {}

void SkyTexture::reset() { *this = SkyTexture(); }

const SunLight* SkyTexture::sunLight() const {
    if (!sun || sun->getType() != SunLight::kType) return nullptr;
    return static_cast<const SunLight*>(sun.get());
}

// Written by hand: the transform's place and form change with the version.
// Version 3: own sun (flag, record without a type tag), settings, skyFlag,
// skyId, transform, the document sun's record, and whether the sun is the
// document sun.
bool SkyTexture::save(QuickArchive& ar) const {
    writeVersion(ar, kNewest);
    const SunLight* own = sunLight();
    ar.writeByte(own != nullptr);
    const bool sunSaved = own ? own->save(ar) : true;
    writeSunSettings(ar, *this);
    ar.writeByte(skyFlag);
    ar.writeWString(skyId);
    if (!transform.save(ar)) return false;
    if (!documentSun()->save(ar)) return false;
    // Whether the sun is the document sun as it stands now, whatever its id.
    ar.writeByte(own != nullptr && platform::iequals(own->id, documentSun()->id));
    return sunSaved;
}

bool SkyTexture::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, kNewest);
    if (v < 0) return false;
    bool ownSun = false;
    ar.readByte(ownSun);
    if (ownSun) {
        sun = createLight(SunLight::kType);
        if (!sun || !loadNested(ar, *sun)) return false;
    }
    if (v == 1) return true;

    if (v == 2) {
        Transform t;
        ar.readTransform(t);
        transform.setValue(t, 0.0);
    }
    readSunSettings(ar, *this);
    ar.readByte(skyFlag);
    ar.readWString(skyId);
    if (v == 2) return true;

    if (!loadNested(ar, transform)) return false;
    // The document sun of the whole process takes the record's settings.
    if (!loadNested(ar, *documentSun())) return false;
    bool isDocumentSun = false;
    ar.readByte(isDocumentSun);
    // The record held a copy of the document sun; share the one object.
    if (isDocumentSun) sun = documentSun();
    return true;
}

void SkyTexture::finishClone() {
    sun = cloneChild(sun);
    skyId = platform::newUuidString();
}

bool SkyTexture::sameContent(const SkyTexture& o) const {
    return platform::iequals(skyId, o.skyId) && childrenEqual(sun, o.sun) &&
           transform == o.transform && sunSettingsEqual(*this, o) && skyFlag == o.skyFlag;
}

void SkyTexture::writeXml(AssetXmlWriter& w, std::u16string url) {
    TextureFrame frame(w, *this, url);
    std::u16string reference;
    if (const SunLight* s = sunLight()) {
        if (isDocumentSunId(s->id)) {
            sun->writeXml(w, std::u16string());  // writes nothing for the document sun
            reference = kDocumentSunReference;
        } else {
            const auto registered = w.sunRegistry.find(s->id);
            reference = registered != w.sunRegistry.end() ? registered->second : u"/" + s->id;
        }
    }
    frame.open();
    // A sun's reference is the url alone, without a plugin name behind it.
    w.writePluginRef("sun", sun.get(), reference);
    frame.close();
}

}  // namespace OrvaneLumoCore
