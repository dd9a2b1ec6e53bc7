#pragma once
// Two-sided materials (a front and a back material) and the bump material (a
// bump texture over one base material). At the top of a material file the
// two-sided classes keep a plugin of their own, while the bump is folded into
// the main Asset; their own writeXml is the form used from the scene table or
// from a parent's writeXml.
#include <string>

#include "materials/MaterialOf.h"
#include "materials/MaterialRows.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// Version 1: front, back, translucency_tex, translucency,
//            translucency_tex_mult, force_1sided.
// Version 2: as 1, then transparency_tex, transparency, transparency_tex_mult.
// Version 3: as 2, then the base record.
class Material2Sided : public TableMaterialOf<Material2Sided, kMaterial2Sided> {
public:
    static constexpr int kRecordVersion = 3;
    // Versions 1 and 2 leave the name as it was.
    static constexpr bool kLoadResets = false;
    static RowSpan<RecordRow<Material2Sided>> record();

    Material2Sided();

    // The children's Assets, the textures', then the material's own.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override { writeTableAsset(writer, url); }
    std::u16string getPluginName() const override { return u"Mtl2Sided"; }

    MaterialPtr front;
    MaterialPtr back;
    TexturePtr translucency_tex;  // a copy shares the textures
    TexturePtr transparency_tex;
    Color translucency;
    Color transparency;
    float translucency_tex_mult;
    float transparency_tex_mult;
    bool force_1sided;
};

// The base record stands first in this record.
class MaterialSkp2Sided : public TableMaterialOf<MaterialSkp2Sided, kMaterialSkp2Sided> {
public:
    static constexpr int kRecordVersion = 1;
    static constexpr bool kLoadResets = false;
    static RowSpan<RecordRow<MaterialSkp2Sided>> record();

    MaterialSkp2Sided();

    void writeXml(AssetXmlWriter& writer, std::u16string url) override { writeTableAsset(writer, url); }
    std::u16string getPluginName() const override { return u"MtlSkp2Sided"; }

    MaterialPtr front;
    MaterialPtr back;
    bool force_1sided;
};

class MaterialBump : public MaterialOf<MaterialBump, kMaterialBump> {
public:
    MaterialBump();

    // Needs base_mtl: the record has no way to say that it is missing.
    bool save(QuickArchive& ar) const override;
    // Does not reset first.
    bool load(QuickArchive& ar) override;
    // BaseMaterial's reset (a new default name), then the defaults below.
    void reset() override;
    bool sameContent(const MaterialBump& o) const;

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlBump"; }

    MaterialPtr base_mtl;
    TexturePtr bump_tex;
    float bump_tex_mult;

    // base_mtl by its own duplicate()/clone(), bump_tex by its clone().
    void copyChildren(bool newName);
};

}  // namespace OrvaneLumoCore
