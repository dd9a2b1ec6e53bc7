#include "materials/ToonMaterial.h"

#include "materials/MaterialMembers.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

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

// A number or a flag with its two words.
template <class T>
struct ToonValue {
    T Toon::*field;
    const char* ownWord;
    const char* conversionWord;
};
const ToonValue<float> kToonFloats[] = {
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

const ToonValue<bool> kToonBools[] = {
    {&Toon::doSecondary, "do_secondary", "doSecondary"},
    {&Toon::divideByDist, "divide_by_distance", "divideByDist"},
    {&Toon::doSilhouetteMult, "do_silhouette_mult", "doSilhouetteMult"},
};

}  // namespace

typedef RowsOf<Toon> ToonRow;

// Version 1 ends behind the base record; version 2 adds doSilhouetteMult
// and silhouetteMult.
const RecordRow<Toon> kToonRecord[] = {
    &Toon::base_mtl,
    ToonRow::f32(&Toon::lineWidth, 1.5, 1),
    ToonRow::f32(&Toon::lineWidthTexMult, 1, 1),
    &Toon::lineWidthTex,
    ToonRow::f32(&Toon::opacity, 1, 1),
    ToonRow::f32(&Toon::opacityTexMult, 1, 1),
    &Toon::opacityTex,
    ToonRow::f32(&Toon::distort, 0, 1),
    ToonRow::f32(&Toon::distortTexMult, 1, 1),
    &Toon::distortTex,
    ToonRow::color(&Toon::lineColor, Color(0, 0, 0), 1),
    ToonRow::f32(&Toon::lineColorTexMult, 1, 1),
    &Toon::lineColorTex,
    ToonRow::f32(&Toon::zThreshold, 0.95, 1),
    ToonRow::f32(&Toon::traceBias, 0.02, 1),
    ToonRow::f32(&Toon::normalThreshold, 0.7, 1),
    ToonRow::f32(&Toon::lineUnits, 1, 1),
    ToonRow::b8(&Toon::doSecondary, true, 1),
    ToonRow::b8(&Toon::divideByDist, false, 1),
    kBaseRecord,
    ToonRow::b8(&Toon::doSilhouetteMult, false, 2),
    ToonRow::f32(&Toon::silhouetteMult, 1.5, 2),
};

MaterialToon::MaterialToon() { MaterialToon::reset(); }

RowSpan<RecordRow<MaterialToon>> MaterialToon::record() { return rowSpan(kToonRecord); }

void MaterialToon::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, true);
    for (const ToonTexture& t : kToonTextures) this->*t.field = cloneChild(this->*t.field);
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
    for (const ToonValue<float>& f : kToonFloats) {
        const char* word = own ? f.ownWord : f.conversionWord;
        if (word) writer.writeFloat(word, this->*f.field);
    }
    for (const ToonValue<bool>& b : kToonBools) writer.writeBool(own ? b.ownWord : b.conversionWord, this->*b.field);
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
