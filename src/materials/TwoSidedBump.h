#pragma once
// Two-sided materials (a front and a back material) and the bump material (a
// bump texture over one base material). At the top of a material file the
// two-sided classes keep a plugin of their own, while the bump is folded into
// the main Asset; their own writeXml is the form used from the scene table or
// from a parent's writeXml.
#include <string>

#include "materials/MaterialOf.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class Material2Sided : public MaterialOf<Material2Sided, kMaterial2Sided> {
public:
    Material2Sided();

    bool save(QuickArchive& ar) const override;
    // Does not reset first. Versions 1 and 2 leave the name as it was.
    bool load(QuickArchive& ar) override;
    // The defaults of the fields below; name and uuid stay.
    void reset() override;
    bool sameContent(const Material2Sided& o) const;

    // The children's Assets, the textures', then the material's own.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"Mtl2Sided"; }

    MaterialPtr front;
    MaterialPtr back;
    TexturePtr translucency_tex;
    TexturePtr transparency_tex;
    Color translucency;
    Color transparency;
    float translucency_tex_mult;
    float transparency_tex_mult;
    bool force_1sided;

    // front and back by their own duplicate()/clone(); the textures are shared.
    void copyChildren(bool newName);
};

class MaterialSkp2Sided : public MaterialOf<MaterialSkp2Sided, kMaterialSkp2Sided> {
public:
    MaterialSkp2Sided();

    // The base record stands first in this record.
    bool save(QuickArchive& ar) const override;
    // Does not reset first.
    bool load(QuickArchive& ar) override;
    // The defaults of the fields below; name and uuid stay.
    void reset() override;
    bool sameContent(const MaterialSkp2Sided& o) const;

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlSkp2Sided"; }

    MaterialPtr front;
    MaterialPtr back;
    bool force_1sided;

    // On a fresh copy: the children that are not to be shared.
    void copyChildren(bool newName);
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
