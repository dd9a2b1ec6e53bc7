#include "materials/BaseMaterial.h"

#include "materials/SceneMaterials.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

const char16_t kDefaultMaterialName[] = u"DefaultMaterial";

namespace {

const int kBaseRecordVersion = 2;

}  // namespace

std::u16string uniqueMaterialName(const std::u16string& candidate) {
    return SceneMaterials::instance()->getUniqueName(candidate);
}

BaseMaterial::BaseMaterial() { BaseMaterial::reset(); }

BaseMaterial::~BaseMaterial() = default;

void BaseMaterial::reset() {
    name = uniqueMaterialName(kDefaultMaterialName);
    uuid.clear();
}

bool BaseMaterial::save(QuickArchive& ar) const {
    writeVersion(ar, kBaseRecordVersion);
    ar.writeWString(name);
    ar.writeWString(uuid);
    return true;
}

bool BaseMaterial::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kBaseRecordVersion);
    if (version >= 1) {
        ar.readWString(name);
        // The emptiness test comes before the cleaning, so a name made only
        // of control characters ends up empty.
        if (name.empty()) name = uniqueMaterialName(kDefaultMaterialName);
        if (version >= 2) ar.readWString(uuid);
    }
    platform::removeControlCharacters(name);
    return version >= 1;
}

void BaseMaterial::loadInlineName(QuickArchive& ar, bool defaultWhenEmpty) {
    ar.readWString(name);
    if (defaultWhenEmpty && name.empty()) name = uniqueMaterialName(kDefaultMaterialName);
}

void BaseMaterial::writeXml(AssetXmlWriter& writer, std::u16string url) {}

std::u16string BaseMaterial::getPluginName() const { return std::u16string(); }

std::u16string BaseMaterial::getAssetType() const { return u"material"; }

}  // namespace OrvaneLumoCore
