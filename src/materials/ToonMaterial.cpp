#include "materials/ToonMaterial.h"

#include "materials/MaterialMembers.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

typedef MaterialToon Toon;
typedef RowsOf<Toon> ToonRow;

// Version 1 ends behind the base record; version 2 adds doSilhouetteMult
// and silhouetteMult. Each row names the field's parameter in the material's
// own XML (a texture's slot word too) and its place there, and the word of
// the conversion (alsoAs), which has none for lineUnits.
const RecordRow<Toon> kToonRecord[] = {
    &Toon::base_mtl,
    ToonRow::f32(&Toon::lineWidth, 1.5, 1).shownAs("width", 11).alsoAs("lineWidth"),
    ToonRow::f32(&Toon::lineWidthTexMult, 1, 1).shownAs("width_tex_mult", 12).alsoAs("lineWidthTexMult"),
    RecordRow<Toon>(&Toon::lineWidthTex, "width_tex", 4).alsoAs("lineWidthTex"),
    ToonRow::f32(&Toon::opacity, 1, 1).shownAs("opacity", 9).alsoAs("opacity"),
    ToonRow::f32(&Toon::opacityTexMult, 1, 1).shownAs("opacity_tex_mult", 10).alsoAs("opacityTexMult"),
    RecordRow<Toon>(&Toon::opacityTex, "opacity_tex", 3).alsoAs("opacityTex"),
    ToonRow::f32(&Toon::distort, 0, 1).shownAs("distort", 7).alsoAs("distort"),
    ToonRow::f32(&Toon::distortTexMult, 1, 1).shownAs("distort_tex_mult", 8).alsoAs("distortTexMult"),
    RecordRow<Toon>(&Toon::distortTex, "distort_tex", 2).alsoAs("distortTex"),
    ToonRow::color(&Toon::lineColor, Color(0, 0, 0), 1).shownAs("color", 5).alsoAs("lineColor"),
    ToonRow::f32(&Toon::lineColorTexMult, 1, 1).shownAs("color_tex_mult", 6).alsoAs("lineColorTexMult"),
    RecordRow<Toon>(&Toon::lineColorTex, "color_tex", 1).alsoAs("lineColorTex"),
    ToonRow::f32(&Toon::zThreshold, 0.95, 1).shownAs("z_threshold", 13).alsoAs("zThreshold"),
    ToonRow::f32(&Toon::traceBias, 0.02, 1).shownAs("trace_bias", 14).alsoAs("traceBias"),
    ToonRow::f32(&Toon::normalThreshold, 0.7, 1).shownAs("normal_threshold", 15).alsoAs("normalThreshold"),
    ToonRow::f32(&Toon::lineUnits, 1, 1).shownAs("line_units", 16),
    ToonRow::b8(&Toon::doSecondary, true, 1).shownAs("do_secondary", 18).alsoAs("doSecondary"),
    ToonRow::b8(&Toon::divideByDist, false, 1).shownAs("divide_by_distance", 19).alsoAs("divideByDist"),
    kBaseRecord,
    ToonRow::b8(&Toon::doSilhouetteMult, false, 2).shownAs("do_silhouette_mult", 20).alsoAs("doSilhouetteMult"),
    ToonRow::f32(&Toon::silhouetteMult, 1.5, 2).shownAs("silhouette_mult", 17).alsoAs("silhouetteMult"),
};

MaterialToon::MaterialToon() { MaterialToon::reset(); }

RowSpan<RecordRow<MaterialToon>> MaterialToon::record() { return rowSpan(kToonRecord); }

void MaterialToon::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, true);
    for (const RecordRow<Toon>& row : kToonRecord) {
        if (row.field.kind() != FieldRef<Toon>::Kind::Texture) continue;
        TexturePtr& texture = row.field.get<TexturePtr>(*this);
        texture = cloneChild(texture);
    }
}

void MaterialToon::writeTextureAssets(AssetXmlWriter& writer, const std::u16string& url) const {
    writeTextureRowAssets(writer, *this, kToonRecord, url);
}

void MaterialToon::writeLineParameters(AssetXmlWriter& writer, const std::u16string& url,
                                       Words words) const {
    forEachShown<Toon>(kToonRecord, [&](const RecordRow<Toon>& row) {
        const char* name = words == Words::Own ? row.xml.name : row.xml.otherName;
        if (!name) return;
        if (row.field.kind() == FieldRef<Toon>::Kind::Texture) {
            writeTextureRef(writer, name, row.field.get<TexturePtr>(*this), slotUrlOf(url, row));
        } else {
            ParamRow<Toon> param = shownParam(row);
            param.name = name;
            writeParam(writer, param, *this);
        }
    });
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
