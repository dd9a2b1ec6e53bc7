// Material libraries: current records through the library's own save, and
// old container and record versions laid by hand, as older writers left them.
#include <cstdint>
#include <fstream>
#include <vector>

#include "Samples.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "module/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

bool saveLibrary(const std::vector<MaterialPtr>& materials, const std::string& path) {
    OrvMatFile file;
    file.materials = materials;
    return file.save(utf8ToWide(path));
}

template <class L>
boost::shared_ptr<L> namedLayer(const char16_t* name) {
    boost::shared_ptr<L> layer(new L);
    layer->name = name;
    return layer;
}

TexturePtr constantColor(float r, float g, float b) {
    boost::shared_ptr<AColorTexture> t(new AColorTexture);
    t->color = AColor(r, g, b, 1);
    return t;
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
std::vector<char> oldRecordStream() {
    QuickArchive ar;
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
    ar.writeFloat(0.8f);
    ar.writeFloat(0.9f);
    ar.writeFloat(1.6f);
    ar.writeFloat(0.01f);
    ar.writeInt(8);
    ar.writeInt(1);
    ar.writeInt(0);
    ar.writeInt(5);

    // Glass_BRDF version 2: rows 1 to 3 (colours, five floats, four
    // integers); three multipliers; paths of transparency_tex,
    // glossiness_tex, ior_tex.
    ar.writeInt(kGlassBrdf);
    ar.writeUInt(0x20000);
    ar.writeColor(Color(1, 1, 1));
    ar.writeColor(Color(0.9f, 1, 0.9f));
    ar.writeFloat(1.5f);
    ar.writeFloat(1.5f);
    ar.writeFloat(0.001f);
    ar.writeFloat(1);
    ar.writeFloat(1);
    ar.writeInt(5);
    ar.writeInt(8);
    ar.writeInt(1);
    ar.writeInt(0);
    ar.writeFloat(1);
    ar.writeFloat(0.5f);
    ar.writeFloat(1);
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
    ar.writeFloat(1);
    ar.writeFloat(1.55f);
    ar.writeFloat(0.01f);
    ar.writeInt(0);
    ar.writeInt(1);
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
    ar.writeInt(0);
    ar.writeInt(0);
    ar.writeWString(u"OldSingle");
    ar.writeInt(kDiffuseBrdf);
    ar.writeUInt(0x10000);
    ar.writeColor(Color(0.5f, 0.4f, 0.3f));
    ar.writeColor(Color(0, 0, 0));
    ar.writeFloat(1);
    ar.writeFloat(1);
    ar.writeWString(u"textures/stone.png");
    ar.writeWString(u"");

    std::vector<char> bytes(static_cast<std::size_t>(ar.getWritePosition()));
    ar.getRaw(bytes.data(), bytes.size());
    return bytes;
}

// A container of version 1 or 2: the header, then the material stream
// directly behind it (version 1 files were written in text mode).
bool writeOldContainer(const std::string& path, std::uint32_t version, std::uint32_t count,
                       const std::vector<char>& stream) {
    std::ofstream out(path.c_str(), std::ios::out | std::ios::binary | std::ios::trunc);
    if (!out) return false;
    const std::uint32_t header[2] = {version << 16, count};
    out.write(reinterpret_cast<const char*>(header), sizeof header);
    out.write(stream.data(), static_cast<std::streamsize>(stream.size()));
    return static_cast<bool>(out);
}

bool writeOldRecordsV2(const std::string& path) {
    return writeOldContainer(path, 2, 2, oldRecordStream());
}

bool writeOldRecordsV1(const std::string& path) {
    // Text mode turned each line feed into a carriage return and a line
    // feed; the reader undoes that.
    std::vector<char> crlf;
    for (char c : oldRecordStream()) {
        if (c == '\n') crlf.push_back('\r');
        crlf.push_back(c);
    }
    return writeOldContainer(path, 1, 2, crlf);
}

}  // namespace

void addMaterialSamples(std::vector<Sample>& list) {
    list.push_back({"materials_all_layers.orvmat", &writeAllLayers});
    list.push_back({"materials_top_level_kinds.orvmat", &writeTopLevelKinds});
    list.push_back({"materials_old_records_v2.orvmat", &writeOldRecordsV2});
    list.push_back({"materials_old_records_v1.lumat", &writeOldRecordsV1});
}

}  // namespace samples
