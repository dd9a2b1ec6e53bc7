#pragma once
// Materials that wrap one or two materials and add settings:
// - MaterialOverrideEnvironment: its own environment for GI, background,
//   reflection and refraction;
// - MaterialDisplaced: displacement;
// - MaterialObjectExclusion: a list of objects the material leaves alone;
// - MaterialAngleBlend: a blend of two materials by viewing angle;
// - MaterialAlphaContribution: the material's share of the alpha channel.
// In a material file the angle blend at the top keeps a plugin of its own and
// the other four are folded into the main Asset; their own writeXml below is
// the form used from the scene table or from a parent's writeXml.
//
// All five: reset() sets the defaults of the fields and leaves name and uuid
// alone; load() resets right behind reading the version tag.
#include <cstdint>
#include <string>
#include <vector>

#include "materials/MaterialRows.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class MaterialOverrideEnvironment
    : public TableMaterialOf<MaterialOverrideEnvironment, kMaterialOverrideEnvironment> {
public:
    static constexpr int kRecordVersion = 1;
    static RowSpan<RecordRow<MaterialOverrideEnvironment>> record();

    MaterialOverrideEnvironment();

    // No Asset of its own: base_mtl's Assets under the same url.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlOverrideEnvironment"; }

    MaterialPtr base_mtl;
    TexturePtr gi_tex, bg_tex, reflect_tex, refract_tex;
    Color gi_color, bg_color, reflect_color, refract_color;
    float bg_tex_mult, gi_tex_mult, reflect_tex_mult, refract_tex_mult;
    bool override_bg, override_gi, override_reflect, override_refract;
};

class MaterialDisplaced : public TableMaterialOf<MaterialDisplaced, kMaterialDisplaced> {
public:
    static constexpr int kRecordVersion = 2;
    static RowSpan<RecordRow<MaterialDisplaced>> record();

    MaterialDisplaced();

    // No Asset of its own: base_mtl's Assets one step (the name) below.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlDisplaced"; }

    MaterialPtr base_mtl;
    TexturePtr displace_tex;
    float displace_tex_mult;
    float displace_shift;
    float displace_edge_length;
    std::int32_t displace_max_subdivs;
    std::int32_t displace_continuity;
    std::int32_t displace_view_dependent;
    std::int32_t displace_use_globals;
};

class MaterialObjectExclusion : public MaterialOf<MaterialObjectExclusion, kMaterialObjectExclusion> {
public:
    MaterialObjectExclusion();

    bool save(QuickArchive& ar) const override;
    // Version 1 has no base record and keeps the name it had.
    bool load(QuickArchive& ar) override;
    void reset() override;
    // `objects` agree entry by entry, ignoring case.
    bool sameContent(const MaterialObjectExclusion& o) const;

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlObjectExclusion"; }

    MaterialPtr base_mtl;
    std::int32_t mode;
    std::vector<std::u16string> objects;
    bool short_circuit;

    // On a fresh copy: the children that are not to be shared.
    void copyChildren(bool newName);
};

class MaterialAngleBlend : public TableMaterialOf<MaterialAngleBlend, kMaterialAngleBlend> {
public:
    static constexpr int kRecordVersion = 1;
    static RowSpan<RecordRow<MaterialAngleBlend>> record();

    MaterialAngleBlend();

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlAngleBlend"; }

    MaterialPtr mtl_one;
    MaterialPtr mtl_two;
    float start_angle;
    float stop_angle;
};

class MaterialAlphaContribution : public TableMaterialOf<MaterialAlphaContribution, kMaterialAlphaContribution> {
public:
    static constexpr int kRecordVersion = 1;
    static RowSpan<RecordRow<MaterialAlphaContribution>> record();

    MaterialAlphaContribution();

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MtlAlphaContribution"; }

    MaterialPtr base_mtl;
    TexturePtr alpha_tex;
    float alpha_tex_mult;
    float alpha;
};

}  // namespace OrvaneLumoCore
