#pragma once
// The six BRDF layers. Each holds colours, numbers and up to five textures,
// saves itself as a record of its class (old versions are still read) and
// writes itself as an Asset of type "BRDF" under its material's url.
//
// A layer class is one table (Brdf.cpp): a row per field with the versions
// that hold it, its default, the XML parameter that shows it and, for a
// texture, the word of its slot; rows of old versions that held a field at
// another place or as a bare path stand beside them. LayerRecordOf walks the
// table for every operation, so a class declares only its fields.
#include <cstdint>
#include <string>

#include "materials/Base_BRDF.h"
#include "persistence/FamilyOf.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// The operations of a layer whose fields are held by T, from T's table.
template <class T>
class LayerRecordOf : public Base_BRDF {
public:
    bool save(QuickArchive& ar) const override;
    // Resets the whole layer or only its base part, as T's table says, then
    // reads the record.
    bool load(QuickArchive& ar) override;
    void finishClone();
    bool sameContent(const T& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;

protected:
    // The table's defaults, the base part reset, every texture null but the
    // Fresnel texture of a new layer where the table gives one. Constructors
    // call it; reset() makes a new object.
    void resetLayer();
};

// Refraction layer, plugin "BRDFRefraction".
class Glass_BRDF : public FamilyOf<Glass_BRDF, kGlassBrdf, LayerRecordOf<Glass_BRDF>> {
public:
    Glass_BRDF();

    std::u16string getPluginName() const override { return u"BRDFRefraction"; }

    Color color;
    Color transparency;
    Color fog_color;
    Color translucency;
    float ior;
    float ior_second;  // stored, copied and compared; no XML shows it
    float cutoff;
    float fog_color_mult;
    float glossiness;
    float color_tex_mult;
    float transparency_tex_mult;
    float glossiness_tex_mult;
    float ior_tex_mult;
    float translucency_tex_mult;
    float thickness;
    float scatter_coeff;
    float scatter_direction;
    std::int32_t subdivs;
    std::int32_t depth_value;  // stored, copied and compared; no XML shows it
    std::int32_t affect_shadows;
    std::int32_t affect_alpha;
    std::int32_t translucency_on;
    TexturePtr color_tex;
    TexturePtr transparency_tex;
    TexturePtr glossiness_tex;
    TexturePtr ior_tex;
    TexturePtr translucency_tex;
};

// The fields, record and XML that Phong_BRDF and Blinn_BRDF share; the two
// differ in tag and class only. Plugin "BRDFReflection". The XML colour
// "transparency" is derived from `reflection`.
class BaseGlossy_BRDF : public LayerRecordOf<BaseGlossy_BRDF> {
public:
    std::u16string getPluginName() const override { return u"BRDFReflection"; }

    Color color;
    Color reflection;
    float hilightGlossiness;
    float reflectionGlossiness;
    float cutoff;
    float hilightGlossiness_tex_mult;
    float reflectionGlossiness_tex_mult;
    float color_tex_mult;
    float transparency_tex_mult;
    float anisotropy;
    float anisotropy_rotation;
    std::int32_t subdivs;
    std::int32_t depth_value;  // stored, copied and compared; no XML shows it
    std::int32_t back_side;
    TexturePtr hilightGlossiness_tex;
    TexturePtr reflectionGlossiness_tex;
    TexturePtr color_tex;
    // A default Fresnel texture in a new layer; a loaded layer holds only
    // what its record gives.
    TexturePtr transparency_tex;

protected:
    BaseGlossy_BRDF() = default;
};

class Phong_BRDF : public FamilyOf<Phong_BRDF, kPhongBrdf, BaseGlossy_BRDF> {
public:
    Phong_BRDF();
};

class Blinn_BRDF : public FamilyOf<Blinn_BRDF, kBlinnBrdf, BaseGlossy_BRDF> {
public:
    Blinn_BRDF();
};

// Mirror layer, plugin "BRDFReflection".
class Mirror_BRDF : public FamilyOf<Mirror_BRDF, kMirrorBrdf, LayerRecordOf<Mirror_BRDF>> {
public:
    Mirror_BRDF();

    std::u16string getPluginName() const override { return u"BRDFReflection"; }

    Color color;
    Color reflection;
    float transparency_tex_mult;
    float color_tex_mult;
    float cutoff;
    std::int32_t mirror_value;  // stored, copied and compared; no XML shows it
    TexturePtr transparency_tex;
    TexturePtr color_tex;
};

// Diffuse layer, plugin "BRDFDiffuse".
class Diffuse_BRDF : public FamilyOf<Diffuse_BRDF, kDiffuseBrdf, LayerRecordOf<Diffuse_BRDF>> {
public:
    Diffuse_BRDF();

    std::u16string getPluginName() const override { return u"BRDFDiffuse"; }

    Color color;
    Color transparency;
    float color_tex_mult;
    float transparency_tex_mult;
    TexturePtr color_tex;
    TexturePtr transparency_tex;
    bool use_color_tex_alpha_as_transparency;
};

// Emissive layer, plugin "BRDFLight".
class Light_BRDF : public FamilyOf<Light_BRDF, kLightBrdf, LayerRecordOf<Light_BRDF>> {
public:
    Light_BRDF();

    std::u16string getPluginName() const override { return u"BRDFLight"; }

    Color color;
    Color transparency;
    float intensity;
    float light_value;  // stored, copied and compared; no XML shows it
    float transparency_tex_mult;
    float color_tex_mult;
    TexturePtr transparency_tex;
    TexturePtr color_tex;
    std::int32_t doubleSided;  // written as a boolean
};

}  // namespace OrvaneLumoCore
