// Texture samples: a library with every procedural texture, old procedural
// records, skies of each record version, and a pair of libraries that shows
// the document sun carried from one conversion to the next.
//
// Each texture sits in the colour slot of a diffuse layer of its own. Old
// record versions are laid by hand by small subclasses whose save writes the
// old layout under the class's own type tag, as older writers left it.
#include <cstdint>
#include <string>
#include <vector>

#include "SampleParts.h"
#include "Samples.h"
#include "lights/SunIesDome.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/ProceduralTextures.h"
#include "textures/SkyTexture.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

// A layered material with one diffuse layer per texture, named after it.
MaterialPtr materialOf(const char16_t* name,
                       const std::vector<std::pair<const char16_t*, TexturePtr>>& layers) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = name;
    for (const auto& layer : layers) {
        boost::shared_ptr<Diffuse_BRDF> diffuse(new Diffuse_BRDF);
        diffuse->name = layer.first;
        diffuse->color_tex = layer.second;
        m->brdfs.push_back(diffuse);
    }
    return m;
}

UVWPtr channelGenerator(int channel, float rotation) {
    boost::shared_ptr<GenChannelUVW> g(new GenChannelUVW);
    g->uvw_channel = channel;
    g->uvwComponents.rotation = Vector(0, 0, rotation);
    g->uvwComponents.scale = Vector(2, 2, 1);
    return g;
}

// ---- current records of every procedural texture ----

bool writeProcedural(const std::string& path) {
    boost::shared_ptr<RampTexture> ramp(new RampTexture);
    ramp->uvw = channelGenerator(1, 0);
    ramp->colors = constantColor(1, 0.5f, 0);
    ramp->positions = 0.25f;
    ramp->type = 2;

    boost::shared_ptr<BulgeTexture> bulge(new BulgeTexture);
    bulge->uvw = createUVW(1);
    bulge->u_width = 0.2f;

    boost::shared_ptr<GridTexture> grid(new GridTexture);
    grid->uvw = channelGenerator(2, 45);
    grid->line_color = constantColor(0.1f, 0.1f, 0.1f);
    grid->fill_color = constantColor(0.9f, 0.9f, 0.8f);
    grid->lineColorMult = 0.5f;
    grid->u_width = 0.02f;

    boost::shared_ptr<ClothTexture> cloth(new ClothTexture);
    cloth->uvw = createUVW(0);
    cloth->u_color = AColor(0.6f, 0.1f, 0.1f, 1);
    cloth->tile = false;

    // Noise with one colour texture: the other slot stays empty.
    boost::shared_ptr<NoiseTexture> noise(new NoiseTexture);
    noise->uvw = createUVW(3);
    noise->color1_tex = grid;
    noise->octaves = 5;
    noise->size = 0.25f;

    // The checker's generator and colours are those its reset builds.
    boost::shared_ptr<CheckerTexture> checker(new CheckerTexture);
    checker->tile_v = false;

    return saveLibrary({materialOf(u"Procedural", {{u"Ramp", ramp},
                                                   {u"Bulge", bulge},
                                                   {u"Grid", grid},
                                                   {u"Cloth", cloth},
                                                   {u"Noise", noise},
                                                   {u"Checker", checker}})},
                       path);
}

// ---- old procedural records ----

// The children, each as tag and record; false if one is missing.
template <class... Child>
bool saveChildren(QuickArchive& ar, const Child&... children) {
    return (saveRequiredMember(ar, children) && ...);
}

// GridTexture version 1: uvw, line_color, fill_color, u_width, v_width.
bool layVersion1(QuickArchive& ar, const GridTexture& t) {
    if (!saveChildren(ar, t.uvw, t.line_color, t.fill_color)) return false;
    writeFloats(ar, {t.u_width, t.v_width});
    return true;
}

// ClothTexture version 1: uvw, gap_color, u_color, v_color, u_width,
// v_width. Without `tile`, a reader tiles in both directions.
bool layVersion1(QuickArchive& ar, const ClothTexture& t) {
    if (!saveChildren(ar, t.uvw)) return false;
    for (const AColor& c : {t.gap_color, t.u_color, t.v_color}) ar.writeAColor(c);
    writeFloats(ar, {t.u_width, t.v_width});
    return true;
}

// CheckerTexture version 1: uvw, white_color, black_color, tile_u, tile_v.
bool layVersion1(QuickArchive& ar, const CheckerTexture& t) {
    if (!saveChildren(ar, t.uvw, t.white_color, t.black_color)) return false;
    ar.writeByte(t.tile_u);
    ar.writeByte(t.tile_v);
    return true;
}

// A texture whose save writes the version 1 record under its class's tag:
// the version, then what layVersion1 lays for its class.
template <class T>
class Version1 : public T {
public:
    bool save(QuickArchive& ar) const override {
        writeVersion(ar, 1);
        return layVersion1(ar, *this);
    }
};

bool writeProceduralOld(const std::string& path) {
    boost::shared_ptr<Version1<GridTexture>> grid(new Version1<GridTexture>);
    grid->uvw = createUVW(4);
    grid->line_color = constantColor(0, 0, 0);
    grid->fill_color = constantColor(1, 1, 1);
    grid->u_width = 0.05f;

    boost::shared_ptr<Version1<ClothTexture>> cloth(new Version1<ClothTexture>);
    cloth->uvw = createUVW(4);
    cloth->tile = false;  // not in a version 1 record: it reads as true

    boost::shared_ptr<Version1<CheckerTexture>> checker(new Version1<CheckerTexture>);
    checker->uvw = channelGenerator(3, 30);
    checker->white_color = constantColor(1, 1, 0);
    checker->tile_u = false;

    return saveLibrary({materialOf(u"OldProcedural",
                                   {{u"Grid", grid}, {u"Cloth", cloth}, {u"Checker", checker}})},
                       path);
}

// ---- skies ----

// A sun with its own id and name, and a few settings apart from the defaults.
boost::shared_ptr<SunLight> sunNamed(const char16_t* name, const char16_t* id, float turbidity) {
    boost::shared_ptr<SunLight> sun(new SunLight(name, id));
    sun->turbidity = turbidity;
    sun->intensity_multiplier = 0.8f;
    Transform t;
    t.offs = Vector(0, 0, 100);
    sun->transform.setValue(t, 0.0);
    return sun;
}

// A sky record of `version` (1 to 3). Version 1: own sun flag, the sun's
// record if set. Version 2 adds a plain transform, the settings (up_vector,
// eight reals, three ints, shadows), skyFlag and skyId. Version 3 holds the
// settings, skyFlag and skyId, the AnimatedTransform record, `docSun`'s
// record in the place of the document sun, and whether the sky's sun is it.
class SkyRecord : public SkyTexture {
public:
    int version = 3;
    boost::shared_ptr<SunLight> docSun;  // null: the process's document sun

    bool save(QuickArchive& ar) const override {
        writeVersion(ar, version);
        const SunLight* own = sunLight();
        ar.writeByte(own != nullptr);
        if (own && !own->save(ar)) return false;
        if (version == 1) return true;
        if (version == 2) ar.writeTransform(transform.getValue(0.0));
        writeSunSettings(ar, *this);
        ar.writeByte(skyFlag);
        ar.writeWString(skyId);
        if (version == 2) return true;
        if (!transform.save(ar)) return false;
        const SunLight& doc = docSun ? *docSun : *documentSun();
        if (!doc.save(ar)) return false;
        ar.writeByte(own != nullptr && own->id == doc.id);
        return true;
    }
};

// A sky of `version` with its own sun, if given. The sky's id is fixed, so
// that the sample files come out the same at every run.
boost::shared_ptr<SkyRecord> sky(int version, LightPtr sun, const char16_t* skyId) {
    boost::shared_ptr<SkyRecord> s(new SkyRecord);
    s->version = version;
    s->skyId = skyId;
    if (sun) s->sun = sun;
    s->turbidity = 2.5f;
    return s;
}

bool writeSkyVersions(const std::string& path) {
    // Version 1 without a sun of its own: the document sun.
    boost::shared_ptr<SkyRecord> v1 =
        sky(1, LightPtr(), u"{A0000000-0000-4000-8000-000000000001}");
    v1->sun.reset();  // no own sun in the record
    // Version 1 with a sun of its own.
    boost::shared_ptr<SkyRecord> v1Own =
        sky(1, sunNamed(u"Morning", u"{1E7A0C52-3B9D-4C61-9F0E-2D4B8A6C1357}", 3),
            u"{A0000000-0000-4000-8000-000000000002}");
    // Version 2 with its own sun and a sky transform.
    boost::shared_ptr<SkyRecord> v2 =
        sky(2, sunNamed(u"Noon", u"{2F8B1D63-4CAE-4D72-A01F-3E5C9B7D2468}", 4),
            u"{A0000000-0000-4000-8000-000000000003}");
    // Version 3 whose sun is the document sun (which it carries unchanged).
    boost::shared_ptr<SkyRecord> v3 =
        sky(3, documentSun(), u"{A0000000-0000-4000-8000-000000000004}");
    // Version 3 with its own sun, and the document sun unchanged.
    boost::shared_ptr<SkyRecord> v3Own =
        sky(3, sunNamed(u"Dusk", u"{3A9C2E74-5DBF-4E83-B12A-4F6DAC8E3579}", 6),
            u"{A0000000-0000-4000-8000-000000000005}");
    return saveLibrary({materialOf(u"Skies", {{u"SkyV1", v1},
                                              {u"SkyV1OwnSun", v1Own},
                                              {u"SkyV2", v2},
                                              {u"SkyV3DocumentSun", v3},
                                              {u"SkyV3OwnSun", v3Own}})},
                       path);
}

// The first of the pair: a version 3 sky whose document sun is another one,
// with the id {4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}. Reading it replaces the
// document sun of the process.
bool writeDocumentSunFirst(const std::string& path) {
    boost::shared_ptr<SkyRecord> s =
        sky(3, LightPtr(), u"{A0000000-0000-4000-8000-000000000006}");
    s->docSun = sunNamed(u"Studio", u"{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}", 7);
    s->sun = s->docSun;  // the sky's sun is that document sun
    return saveLibrary({materialOf(u"SetsTheSun", {{u"Sky", s}})}, path);
}

// The second: a version 1 sky without a sun of its own. Converted alone, it
// refers to "/Rhino Document Sun"; converted after the first one, to the
// sun that the first one brought, "/{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}".
bool writeDocumentSunSecond(const std::string& path) {
    boost::shared_ptr<SkyRecord> s =
        sky(1, LightPtr(), u"{A0000000-0000-4000-8000-000000000007}");
    s->sun.reset();
    return saveLibrary({materialOf(u"UsesTheSun", {{u"Sky", s}})}, path);
}

}  // namespace

void addTextureSamples(std::vector<Sample>& list) {
    list.push_back({"textures_procedural.orvmat", &writeProcedural});
    list.push_back({"textures_procedural_old.orvmat", &writeProceduralOld});
    list.push_back({"textures_sky_versions.orvmat", &writeSkyVersions});
    list.push_back({"textures_sky_document_sun_1.orvmat", &writeDocumentSunFirst});
    list.push_back({"textures_sky_document_sun_2.orvmat", &writeDocumentSunSecond});
}

}  // namespace samples
