#pragma once
// The toon material: outlines over a base material. The line has a colour, a
// width, an opacity and a distortion, each of which may be driven by a
// texture, and thresholds that decide where a line falls.
//
// It has two XML forms with different words: its own writeXml uses the
// lower-case words ("color", "width", "divide_by_distance", ...), the
// conversion of a top-level toon material the field names ("lineColor",
// "lineWidth", "divideByDist", ...) and leaves out lineUnits.
#include <cstdint>
#include <string>

#include "materials/MaterialRows.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class MaterialToon : public TableMaterialOf<MaterialToon, kMaterialToon> {
public:
    // Which words the line parameters go out under.
    enum class Words { Own, Conversion };

    static constexpr int kRecordVersion = 2;
    static RowSpan<RecordRow<MaterialToon>> record();

    MaterialToon();

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlToon"; }

    // The pieces both XML forms share. `url` is the material's own url; each
    // texture goes under `url`, "/" and its slot word.
    // The textures' Assets, in slot order:
    void writeTextureAssets(AssetXmlWriter& writer, const std::u16string& url) const;
    // The texture references, the colour, the numbers and the switches:
    void writeLineParameters(AssetXmlWriter& writer, const std::u16string& url, Words words) const;

    MaterialPtr base_mtl;
    Color lineColor;
    TexturePtr lineColorTex;
    float lineColorTexMult;
    float distort;
    TexturePtr distortTex;
    float distortTexMult;
    float opacity;
    TexturePtr opacityTex;
    float opacityTexMult;
    float lineWidth;
    TexturePtr lineWidthTex;
    float lineWidthTexMult;
    float zThreshold;
    float traceBias;
    float normalThreshold;
    float lineUnits;
    float silhouetteMult;
    bool doSecondary;
    bool divideByDist;
    bool doSilhouetteMult;

    // duplicate(): base_mtl by its duplicate(), the textures by their clone(),
    // new name. clone(): the textures by their clone() and the same name;
    // base_mtl, too, by its duplicate(), so that the base material of a clone
    // gets a new name.
    void copyChildren(bool newName);
};

}  // namespace OrvaneLumoCore
