#include "materials/ToonMaterial.h"

#include "materials/MaterialMembers.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

const int kToonVersion = 2;

// The line parameters in the order of both XML forms, with the word of the
// material's own writeXml and the word of the conversion. A row without a
// conversion word is left out there.
typedef MaterialToon Toon;

struct ToonTexture {
    TexturePtr Toon::*field;
    const char16_t* ownWord;  // also the slot word in both forms
    const char* conversionWord;
};
const ToonTexture kToonTextures[] = {
    {&Toon::lineColorTex, u"color_tex", "lineColorTex"},
    {&Toon::distortTex, u"distort_tex", "distortTex"},
    {&Toon::opacityTex, u"opacity_tex", "opacityTex"},
    {&Toon::lineWidthTex, u"width_tex", "lineWidthTex"},
};

struct ToonFloat {
    float Toon::*field;
    const char* ownWord;
    const char* conversionWord;
};
const ToonFloat kToonFloats[] = {
    {&Toon::lineColorTexMult, "color_tex_mult", "lineColorTexMult"},
    {&Toon::distort, "distort", "distort"},
    {&Toon::distortTexMult, "distort_tex_mult", "distortTexMult"},
    {&Toon::opacity, "opacity", "opacity"},
    {&Toon::opacityTexMult, "opacity_tex_mult", "opacityTexMult"},
    {&Toon::lineWidth, "width", "lineWidth"},
    {&Toon::lineWidthTexMult, "width_tex_mult", "lineWidthTexMult"},
    {&Toon::zThreshold, "z_threshold", "zThreshold"},
    {&Toon::traceBias, "trace_bias", "traceBias"},
    {&Toon::normalThreshold, "normal_threshold", "normalThreshold"},
    {&Toon::lineUnits, "line_units", nullptr},
    {&Toon::silhouetteMult, "silhouette_mult", "silhouetteMult"},
};

struct ToonBool {
    bool Toon::*field;
    const char* ownWord;
    const char* conversionWord;
};
const ToonBool kToonBools[] = {
    {&Toon::doSecondary, "do_secondary", "doSecondary"},
    {&Toon::divideByDist, "divide_by_distance", "divideByDist"},
    {&Toon::doSilhouetteMult, "do_silhouette_mult", "doSilhouetteMult"},
};

}  // namespace

MaterialToon::MaterialToon() { MaterialToon::reset(); }

void MaterialToon::reset() {
    base_mtl.reset();
    lineColor = Color(0, 0, 0);
    for (const ToonTexture& t : kToonTextures) (this->*t.field).reset();
    lineColorTexMult = 1;
    distort = 0;
    distortTexMult = 1;
    opacity = 1;
    opacityTexMult = 1;
    lineWidth = 1.5f;
    lineWidthTexMult = 1;
    zThreshold = 0.95f;
    traceBias = 0.02f;
    normalThreshold = 0.7f;
    lineUnits = 1;
    silhouetteMult = 1.5f;
    doSecondary = true;
    divideByDist = false;
    doSilhouetteMult = false;
}

bool MaterialToon::save(QuickArchive& ar) const {
    writeVersion(ar, kToonVersion);
    if (!saveOptionalMember(ar, base_mtl)) return false;
    ar.writeFloat(lineWidth);
    ar.writeFloat(lineWidthTexMult);
    if (!saveOptionalMember(ar, lineWidthTex)) return false;
    ar.writeFloat(opacity);
    ar.writeFloat(opacityTexMult);
    if (!saveOptionalMember(ar, opacityTex)) return false;
    ar.writeFloat(distort);
    ar.writeFloat(distortTexMult);
    if (!saveOptionalMember(ar, distortTex)) return false;
    ar.writeColor(lineColor);
    ar.writeFloat(lineColorTexMult);
    if (!saveOptionalMember(ar, lineColorTex)) return false;
    ar.writeFloat(zThreshold);
    ar.writeFloat(traceBias);
    ar.writeFloat(normalThreshold);
    ar.writeFloat(lineUnits);
    ar.writeByte(doSecondary);
    ar.writeByte(divideByDist);
    if (!BaseMaterial::save(ar)) return false;
    ar.writeByte(doSilhouetteMult);
    ar.writeFloat(silhouetteMult);
    return true;
}

// Version 1 ends behind the base record; version 2 adds doSilhouetteMult
// and silhouetteMult.
bool MaterialToon::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, kToonVersion);
    reset();  // also when the tag is refused
    if (v < 0) return false;
    if (!loadMaterialMember(ar, base_mtl)) return false;
    ar.readFloat(lineWidth);
    ar.readFloat(lineWidthTexMult);
    if (!loadTextureMember(ar, lineWidthTex)) return false;
    ar.readFloat(opacity);
    ar.readFloat(opacityTexMult);
    if (!loadTextureMember(ar, opacityTex)) return false;
    ar.readFloat(distort);
    ar.readFloat(distortTexMult);
    if (!loadTextureMember(ar, distortTex)) return false;
    ar.readColor(lineColor);
    ar.readFloat(lineColorTexMult);
    if (!loadTextureMember(ar, lineColorTex)) return false;
    ar.readFloat(zThreshold);
    ar.readFloat(traceBias);
    ar.readFloat(normalThreshold);
    ar.readFloat(lineUnits);
    ar.readByte(doSecondary);
    ar.readByte(divideByDist);
    if (!BaseMaterial::load(ar)) return false;
    if (v >= 2) {
        ar.readByte(doSilhouetteMult);
        ar.readFloat(silhouetteMult);
    }
    return true;
}

void MaterialToon::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, true);
    for (const ToonTexture& t : kToonTextures) this->*t.field = cloneChild(this->*t.field);
}

bool MaterialToon::sameContent(const MaterialToon& o) const {
    if (!childrenEqual(base_mtl, o.base_mtl) || lineColor != o.lineColor) return false;
    for (const ToonTexture& t : kToonTextures)
        if (!childrenEqual(this->*t.field, o.*t.field)) return false;
    for (const ToonFloat& f : kToonFloats)
        if (this->*f.field != o.*f.field) return false;
    for (const ToonBool& b : kToonBools)
        if (this->*b.field != o.*b.field) return false;
    return true;
}

void MaterialToon::writeTextureAssets(AssetXmlWriter& writer, const std::u16string& url) const {
    for (const ToonTexture& t : kToonTextures)
        OrvaneLumoCore::writeTextureAssets(writer, this->*t.field, childUrl(url, t.ownWord));
}

void MaterialToon::writeLineParameters(AssetXmlWriter& writer, const std::u16string& url,
                                       Words words) const {
    const bool own = words == Words::Own;
    for (const ToonTexture& t : kToonTextures) {
        const WriterText word = own ? WriterText(t.ownWord) : WriterText(t.conversionWord);
        writeTextureRef(writer, word, this->*t.field, childUrl(url, t.ownWord));
    }
    writer.writeColor(own ? "color" : "lineColor", lineColor);
    for (const ToonFloat& f : kToonFloats) {
        const char* word = own ? f.ownWord : f.conversionWord;
        if (word) writer.writeFloat(word, this->*f.field);
    }
    for (const ToonBool& b : kToonBools) writer.writeBool(own ? b.ownWord : b.conversionWord, this->*b.field);
}

void MaterialToon::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (base_mtl) base_mtl->writeXml(writer, url);
    writeTextureAssets(writer, url);
    openMaterialAsset(writer, *this, url, "");
    writeMaterialRef(writer, "base_mtl", base_mtl, url);
    writeLineParameters(writer, url, Words::Own);
    closeMaterialAsset(writer);
}

}  // namespace OrvaneLumoCore
