// Material libraries: current records through the library's own save, and
// old container and record versions laid by hand, as older writers left them.
#include <cstdint>
#include <vector>

#include "SampleParts.h"
#include "Samples.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

template <class L>
boost::shared_ptr<L> namedLayer(const char16_t* name) {
    boost::shared_ptr<L> layer(new L);
    layer->name = name;
    return layer;
}

// One layered material with each of the six layers, textures in some slots.
bool writeAllLayers(const std::string& path) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = u"AllLayers";

    boost::shared_ptr<Glass_BRDF> glass = namedLayer<Glass_BRDF>(u"Glass");
    glass->color_tex = constantColor(0.6f, 0.8f, 1);
    glass->ior = 1.33f;
    m->brdfs.push_back(glass);

    boost::shared_ptr<Diffuse_BRDF> base = namedLayer<Diffuse_BRDF>(u"Base");
    base->color_tex = makeBitmapTextureFromPath(u"textures/wood.png");
    boost::shared_ptr<InvertTexture> invert(new InvertTexture);
    invert->texture = constantColor(0.2f, 0.2f, 0.2f);
    base->transparency_tex = invert;
    m->brdfs.push_back(base);

    m->brdfs.push_back(namedLayer<Blinn_BRDF>(u"Coat"));
    boost::shared_ptr<Phong_BRDF> sheen = namedLayer<Phong_BRDF>(u"Sheen");
    sheen->transparency_tex.reset();
    sheen->reflection = Color(0.2f, 0.2f, 0.2f);
    m->brdfs.push_back(sheen);
    m->brdfs.push_back(namedLayer<Mirror_BRDF>(u"Chrome"));
    boost::shared_ptr<Light_BRDF> glow = namedLayer<Light_BRDF>(u"Glow");
    glow->intensity = 2.5f;
    m->brdfs.push_back(glow);
    return saveLibrary({m}, path);
}

// A multi and a single material at the top: both convert to empty groups.
bool writeTopLevelKinds(const std::string& path) {
    boost::shared_ptr<MaterialLayeredBRDF> inside(new MaterialLayeredBRDF);
    inside->name = u"Inside";
    inside->brdfs.push_back(namedLayer<Diffuse_BRDF>(u"Base"));
    boost::shared_ptr<MaterialMulti> multi(new MaterialMulti);
    multi->name = u"Group";
    multi->materials.push_back(inside);
    boost::shared_ptr<MaterialSingleBRDF> single(new MaterialSingleBRDF);
    single->name = u"Single";
    single->brdf = namedLayer<Diffuse_BRDF>(u"Only");
    return saveLibrary({inside, multi, single}, path);
}

// The material stream of two materials in old record versions.
void writeOldRecordStream(QuickArchive& ar) {
    // MaterialLayeredBRDF version 1: layers, double_sided, layered_value_a,
    // inline name.
    ar.writeInt(kMaterialLayeredBRDF);
    ar.writeUInt(0x10000);
    ar.writeLength(3);

    // Phong_BRDF version 1: color, reflection; hilightGlossiness,
    // reflectionGlossiness; Fresnel ior; cutoff; subdivs; Fresnel switch;
    // back_side, depth_value. The switch is on: a Fresnel texture of ior 1.6.
    ar.writeInt(kPhongBrdf);
    ar.writeUInt(0x10000);
    ar.writeColor(Color(0.8f, 0.1f, 0.1f));
    ar.writeColor(Color(0.3f, 0.3f, 0.3f));
    writeFloats(ar, {0.8f, 0.9f, 1.6f, 0.01f});
    writeInts(ar, {8, 1, 0, 5});

    // Glass_BRDF version 2: rows 1 to 3 (colours, five floats, four
    // integers); three multipliers; paths of transparency_tex,
    // glossiness_tex, ior_tex.
    ar.writeInt(kGlassBrdf);
    ar.writeUInt(0x20000);
    ar.writeColor(Color(1, 1, 1));
    ar.writeColor(Color(0.9f, 1, 0.9f));
    writeFloats(ar, {1.5f, 1.5f, 0.001f, 1, 1});
    writeInts(ar, {5, 8, 1, 0});
    writeFloats(ar, {1, 0.5f, 1});
    ar.writeWString(u"textures/glass_tint.png");
    ar.writeWString(u"");
    ar.writeWString(u"");

    // Mirror_BRDF version 2: color, reflection; transparency_tex_mult;
    // Fresnel ior; cutoff; Fresnel switch (off); mirror_value; a path of
    // transparency_tex; color_tex_mult; a path of color_tex.
    ar.writeInt(kMirrorBrdf);
    ar.writeUInt(0x20000);
    ar.writeColor(Color(1, 1, 1));
    ar.writeColor(Color(0.5f, 0.5f, 0.5f));
    writeFloats(ar, {1, 1.55f, 0.01f});
    writeInts(ar, {0, 1});
    ar.writeWString(u"textures/mirror_mask.png");
    ar.writeFloat(1);
    ar.writeWString(u"");

    ar.writeInt(1);  // double_sided
    ar.writeInt(0);  // layered_value_a
    ar.writeWString(u"OldLayered");

    // MaterialSingleBRDF version 1: single_value_a, single_value_b, inline
    // name, then a Diffuse_BRDF version 1 (colours, multipliers, two paths).
    ar.writeInt(kMaterialSingleBRDF);
    ar.writeUInt(0x10000);
    writeInts(ar, {0, 0});
    ar.writeWString(u"OldSingle");
    ar.writeInt(kDiffuseBrdf);
    ar.writeUInt(0x10000);
    ar.writeColor(Color(0.5f, 0.4f, 0.3f));
    ar.writeColor(Color(0, 0, 0));
    writeFloats(ar, {1, 1});
    ar.writeWString(u"textures/stone.png");
    ar.writeWString(u"");
}

// Containers of version 2 and 1 around the same material stream.
bool writeOldRecordsV2(const std::string& path) {
    QuickArchive ar;
    writeOldRecordStream(ar);
    return writeOldContainer(path, 2, 2, ar);
}

bool writeOldRecordsV1(const std::string& path) {
    QuickArchive ar;
    writeOldRecordStream(ar);
    return writeOldContainer(path, 1, 2, ar);
}

}  // namespace

void addMaterialSamples(std::vector<Sample>& list) {
    list.push_back({"materials_all_layers.orvmat", &writeAllLayers});
    list.push_back({"materials_top_level_kinds.orvmat", &writeTopLevelKinds});
    list.push_back({"materials_old_records_v2.orvmat", &writeOldRecordsV2});
    list.push_back({"materials_old_records_v1.lumat", &writeOldRecordsV1});
}

}  // namespace samples
