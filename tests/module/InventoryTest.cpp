// Listing a file without converting it, the files it refers to, and finding
// those files on disk.
#include <gtest/gtest.h>

#include <boost/make_shared.hpp>
#include <algorithm>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "lights/SunIesDome.h"
#include "materials/MaterialTestUtil.h"
#include "module/Inventory.h"
#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
#include "persistence/Record.h"
#include "support/TempFiles.h"
#include "textures/ProceduralTextures.h"
#include "textures/SkyTexture.h"

using namespace OrvaneLumoCore;
using namespace mattest;
using tempfiles::TempDir;
using tempfiles::wide;

namespace {

template <class T>
boost::shared_ptr<T> named(const std::u16string& name, const std::u16string& uuid) {
    boost::shared_ptr<T> m(new T);
    m->name = name, m->uuid = uuid;
    return m;
}

boost::shared_ptr<MaterialLayeredBRDF> layers(const std::u16string& name, std::vector<BrdfPtr> brdfs) {
    boost::shared_ptr<MaterialLayeredBRDF> m = named<MaterialLayeredBRDF>(name, u"");
    m->brdfs = brdfs;
    return m;
}

BrdfPtr diffuseWith(const TexturePtr& color) {
    boost::shared_ptr<Diffuse_BRDF> d(new Diffuse_BRDF);
    d->color_tex = color;
    return d;
}

TexturePtr blendOf(const TexturePtr& a, const TexturePtr& b) {
    boost::shared_ptr<BlendTexture> t(new BlendTexture);
    t->color_a = a, t->color_b = b;
    return t;
}

TexturePtr fresnelOver(const TexturePtr& reflection) {
    boost::shared_ptr<FresnelTexture> t(new FresnelTexture);
    t->reflection_tex = reflection;
    return t;
}

// A library with bitmaps in many places: layer slots, a bump, an
// environment override (beside a sky), a two-sided material's own slots,
// nested textures, the materials of a multi-material and a toon wrapper.
std::vector<MaterialPtr> richLibrary() {
    std::vector<MaterialPtr> all;

    boost::shared_ptr<MaterialBump> oak = named<MaterialBump>(u"Oak", u"11111111-aaaa-4000-8000-000000000001");
    oak->base_mtl = layers(u"Oak base", {diffuseWith(bitmap(u"maps/oak.png")), BrdfPtr(new Phong_BRDF)});
    oak->bump_tex = bitmap(u"C:\\maps\\oak_bump.png");
    all.push_back(oak);

    boost::shared_ptr<MaterialOverrideEnvironment> env =
        named<MaterialOverrideEnvironment>(u"Chrome \"env\"", u"22222222-bbbb-4000-8000-000000000002");
    env->base_mtl = layers(u"Chrome", {BrdfPtr(new Mirror_BRDF)});
    env->bg_tex = TexturePtr(new SkyTexture);
    env->gi_tex = bitmap(u"\\\\server\\share\\hdri\\studio.hdr");
    env->reflect_tex = blendOf(bitmap(u"refl_a.png"), fresnelOver(bitmap(u"refl_b.png")));
    all.push_back(env);

    boost::shared_ptr<Material2Sided> leaf = named<Material2Sided>(u"Leaf", u"");
    leaf->front = layers(u"Front", {diffuseWith(TexturePtr())});
    leaf->back = layers(u"Back", {BrdfPtr(new Glass_BRDF)});
    leaf->translucency_tex = bitmap(u"leaf_translucency.png");
    all.push_back(leaf);

    boost::shared_ptr<MaterialMulti> multi = named<MaterialMulti>(u"Multi", u"");
    boost::shared_ptr<MaterialSingleBRDF> single = named<MaterialSingleBRDF>(u"Single", u"");
    single->brdf = diffuseWith(bitmap(u"/abs/single.png"));
    boost::shared_ptr<MaterialToon> toon = named<MaterialToon>(u"Toon", u"");
    toon->base_mtl = layers(u"Toon base", {});
    toon->lineColorTex = bitmap(u"toon_line.png");
    multi->materials = {single, toon};
    all.push_back(multi);
    return all;
}

std::string saveLibrary(const TempDir& dir, const std::string& name, const std::vector<MaterialPtr>& materials) {
    OrvMatFile file;
    file.materials = materials;
    const std::string path = dir.file(name);
    EXPECT_TRUE(file.save(wide(path)));
    return path;
}

std::string wholeListing(const FileListing& listing) {
    std::string out;
    for (const MaterialSummary& m : listing.materials) out += listingLine(m) + "\n" + listingJson(m) + "\n";
    return out;
}

std::string wholeReferences(const FileReferences& refs) {
    std::string out;
    for (const FileReference& r : refs.references)
        out += referenceLine(r, refs.kind) + "\n" + referenceJson(r) + "\n";
    return out;
}

// The rich library, written by our own code.
class InventoryRichLibrary : public ::testing::Test {
protected:
    TempDir dir;
    const std::u16string path = wide(saveLibrary(dir, "rich.orvmat", richLibrary()));
};

TEST_F(InventoryRichLibrary, ListingGivesEveryMaterialWithItsShape) {
    const FileListing listing = listFile(path, FileKind::Materials);
    ASSERT_EQ(listing.status, FileStatus::Document) << listing.reason;
    EXPECT_TRUE(listing.reason.empty());
    ASSERT_EQ(listing.materials.size(), 4u);

    const MaterialSummary& oak = listing.materials[0];
    EXPECT_TRUE(oak.name == u"Oak");
    EXPECT_EQ(oak.className, "MaterialBump");
    EXPECT_TRUE(oak.uuid == u"11111111-aaaa-4000-8000-000000000001");
    EXPECT_EQ(oak.shape, "MaterialBump[MaterialLayeredBRDF[Diffuse_BRDF, Phong_BRDF]]");
    // A new glossy or mirror layer holds a Fresnel texture of its own.
    EXPECT_EQ(oak.textures, 3u);

    // The sky, the blend with its two bitmaps and Fresnel, and the mirror's
    // Fresnel count too.
    EXPECT_EQ(listing.materials[1].shape, "MaterialOverrideEnvironment[MaterialLayeredBRDF[Mirror_BRDF]]");
    EXPECT_EQ(listing.materials[1].textures, 7u);
    EXPECT_EQ(listing.materials[2].shape,
              "Material2Sided[MaterialLayeredBRDF[Diffuse_BRDF], MaterialLayeredBRDF[Glass_BRDF]]");
    EXPECT_EQ(listing.materials[2].textures, 1u);
    EXPECT_EQ(listing.materials[3].shape,
              "MaterialMulti[MaterialSingleBRDF[Diffuse_BRDF], MaterialToon[MaterialLayeredBRDF]]");
    EXPECT_EQ(listing.materials[3].textures, 2u);

    testsupport::expectGolden("module/golden/listing.txt", wholeListing(listing));
}

// Every bundled example loads for a listing as it does for a conversion:
// the same status, the same number of materials, the same reason.
TEST(InventoryListing, ExamplesListAsTheyConvert) {
    std::size_t files = 0;
    for (const auto& entry : std::filesystem::directory_iterator(tempfiles::examplePath(""))) {
        const std::u16string path = wide(entry.path().generic_string());
        FileKind kind;
        if (!kindOfPath(path, kind)) continue;
        ++files;
        SCOPED_TRACE(entry.path().filename().string());
        const ConversionOutcome outcome = convertFile(path, kind);
        const FileListing listing = listFile(path, kind);
        EXPECT_EQ(listing.status, outcome.status);
        if (outcome.status == FileStatus::Document) {
            EXPECT_TRUE(listing.reason.empty());
            if (kind == FileKind::Materials) {
                EXPECT_EQ(listing.materials.size(), outcome.items);
            }
        } else {
            const std::string line = explainOutcome(outcome, kind);
            EXPECT_EQ(line.substr(line.find(": ") + 2), listing.reason);
        }
        EXPECT_EQ(listFileReferences(path, kind).status, outcome.status);
    }
    EXPECT_EQ(files, 17u);
}

TEST(InventoryListing, OptionsGiveTheirRecordVersionAndCamera) {
    TempDir dir;
    AllOptions options;
    options.params.camera_type = 3;
    options.physicalCameraOn = 1;
    options.physicalCamera.type = 2;
    const std::string path = dir.file("scene.orvopt");
    ASSERT_TRUE(OrvOptFile().save(options, wide(path)));

    const FileListing listing = listFile(wide(path), FileKind::Options);
    ASSERT_EQ(listing.status, FileStatus::Document) << listing.reason;
    EXPECT_EQ(listing.options.recordVersion, AllOptions::kVersion);
    EXPECT_EQ(listing.options.cameraType, 3);
    EXPECT_TRUE(listing.options.physicalCameraOn);
    EXPECT_EQ(listing.options.physicalCameraType, 2);
    EXPECT_EQ(listingLine(listing.options), "version 23\tcamera type 3\tphysical camera on, type 2");
    EXPECT_EQ(listingJson(listing.options),
              "{\"version\": 23, \"camera_type\": 3, \"physical_camera\": true, \"physical_camera_type\": 2}");

    // An old record keeps its own version.
    const FileListing old = listFile(wide(tempfiles::examplePath("old_settings_v4.luopt")), FileKind::Options);
    ASSERT_EQ(old.status, FileStatus::Document) << old.reason;
    EXPECT_EQ(old.options.recordVersion, 4);
}

TEST(InventoryListing, ShapeOfTreesBuiltInMemory) {
    // An empty layer slot shows as "-"; an empty child slot is left out.
    boost::shared_ptr<Material2Sided> sided = named<Material2Sided>(u"S", u"");
    sided->back = layers(u"Back", {BrdfPtr(), BrdfPtr(new Blinn_BRDF)});
    EXPECT_EQ(summarizeMaterial(sided).shape, "Material2Sided[MaterialLayeredBRDF[-, Blinn_BRDF]]");
    // A reference shows its embedded copy.
    const MaterialPtr ref = referenceTo(u"uuid", u"Ref", wrap<MaterialDisplaced>(layered(u"Copy")));
    EXPECT_EQ(summarizeMaterial(ref).shape,
              "MaterialReference[MaterialDisplaced[MaterialLayeredBRDF[Diffuse_BRDF]]]");
    EXPECT_EQ(summarizeMaterial(MaterialPtr()).shape, "");
}

// A tree built in memory may be deeper than any file. The shape shows the
// children of every level up to the walk's limit, 4 x 256 levels, and no more.
TEST(InventoryListing, ShapeOfADeepTreeStopsAtTheWalkLimit) {
    const int limit = 4 * kMaxNestingDepth;
    MaterialPtr top = layers(u"Bottom", {});
    for (int level = 0; level <= limit + 1; ++level) top = wrap<MaterialBump>(top);
    const std::string shape = summarizeMaterial(top).shape;
    EXPECT_EQ(std::count(shape.begin(), shape.end(), '['), limit + 1);
    EXPECT_EQ(shape.substr(shape.size() - (limit + 1) - 12), "MaterialBump" + std::string(limit + 1, ']'));
}

TEST(InventoryListing, SharedAndCircularTreesInMemoryAreWalkedOnce) {
    // Forty levels of a multi-material whose two slots share one child: a
    // walk that took each slot would visit 2^40 materials.
    MaterialPtr top = layers(u"Bottom", {diffuseWith(bitmap(u"shared.png"))});
    for (int level = 0; level < 40; ++level) {
        boost::shared_ptr<MaterialMulti> multi = named<MaterialMulti>(u"Level", u"");
        multi->materials = {top, top};
        top = multi;
    }
    const MaterialSummary summary = summarizeMaterial(top);
    EXPECT_EQ(summary.textures, 1u);
    EXPECT_EQ(summary.shape.substr(0, 28), "MaterialMulti[MaterialMulti[");
    EXPECT_NE(summary.shape.find("MaterialMulti[...]"), std::string::npos);
    std::vector<FileReference> refs;
    collectMaterialReferences(top, refs);
    ASSERT_EQ(refs.size(), 1u);

    // A reference whose copy leads back to itself.
    boost::shared_ptr<MaterialReference> loop = referenceTo(u"uuid", u"Loop");
    loop->target = wrap<MaterialBump>(loop);
    EXPECT_EQ(summarizeMaterial(loop).shape, "MaterialReference[MaterialBump[MaterialReference[...]]]");
    loop->target.reset();  // the two own each other
}

TEST(InventoryListing, TextLinesStayOneLineAndJsonIsEscaped) {
    MaterialPtr m = layers(u"Tab\there \"quoted\" \\ caf\u00e9 ", {});
    m->name += char16_t(0xD800);  // a lone surrogate
    m->uuid = u"u\n1";
    const MaterialSummary s = summarizeMaterial(m);
    EXPECT_EQ(listingLine(s), "Tab\\x09here \"quoted\" \\ caf\xc3\xa9 \xef\xbf\xbd\tMaterialLayeredBRDF\tu\\x0a1\t"
                              "0 textures\tMaterialLayeredBRDF");
    EXPECT_EQ(listingJson(s),
              "{\"name\": \"Tab\\there \\\"quoted\\\" \\\\ caf\xc3\xa9 \xef\xbf\xbd\", \"class\": "
              "\"MaterialLayeredBRDF\", \"uuid\": \"u\\n1\", \"textures\": 0, \"shape\": \"MaterialLayeredBRDF\"}");
}

// ---- references -----------------------------------------------------------------------

std::vector<std::u16string> pathsOf(const std::vector<FileReference>& refs) {
    std::vector<std::u16string> paths;
    for (const FileReference& r : refs) paths.push_back(r.path);
    return paths;
}

TEST_F(InventoryRichLibrary, ReferencesAreEveryBitmapWithItsMaterial) {
    const FileReferences refs = listFileReferences(path, FileKind::Materials);
    ASSERT_EQ(refs.status, FileStatus::Document) << refs.reason;
    // A material's own slots come before those of the materials inside it.
    const std::vector<std::u16string> expected = {
        u"C:\\maps\\oak_bump.png", u"maps/oak.png", u"\\\\server\\share\\hdri\\studio.hdr", u"refl_a.png",
        u"refl_b.png", u"leaf_translucency.png", u"/abs/single.png", u"toon_line.png"};
    EXPECT_TRUE(pathsOf(refs.references) == expected);
    const std::u16string owners[] = {u"Oak", u"Oak", u"Chrome \"env\"", u"Chrome \"env\"", u"Chrome \"env\"",
                                     u"Leaf", u"Multi", u"Multi"};
    for (std::size_t i = 0; i < refs.references.size() && i < 8; ++i) {
        EXPECT_TRUE(refs.references[i].material == owners[i]) << i;
        EXPECT_EQ(refs.references[i].use, PathUse::Read) << i;
    }
    testsupport::expectGolden("module/golden/references.txt", wholeReferences(refs));
}

// A tree with one texture in one slot.
struct Slot {
    std::string holder;  // the class whose slot it is
    std::function<MaterialPtr(const TexturePtr&)> make;
};

// Each slot of a layer class in a layered material; the other slots are
// emptied (glossy and mirror layers come with a Fresnel texture).
template <class L>
void layerSlots(std::vector<Slot>& out, const char* holder, BrdfPtr (*make)(),
                std::initializer_list<TexturePtr L::*> all) {
    const std::vector<TexturePtr L::*> slots(all);
    for (TexturePtr L::*slot : slots)
        out.push_back({holder, [=](const TexturePtr& t) {
                           BrdfPtr l = make();
                           L& layer = dynamic_cast<L&>(*l);
                           for (TexturePtr L::*other : slots) (layer.*other).reset();
                           layer.*slot = t;
                           return MaterialPtr(layers(u"M", {l}));
                       }});
}

// Each slot of a material class.
template <class M>
void materialSlots(std::vector<Slot>& out, const char* holder, std::initializer_list<TexturePtr M::*> all) {
    for (TexturePtr M::*slot : all)
        out.push_back({holder, [=](const TexturePtr& t) {
                           boost::shared_ptr<M> m = named<M>(u"M", u"");
                           (*m).*slot = t;
                           return MaterialPtr(m);
                       }});
}

// Each slot of a texture class, in a single material's diffuse layer.
template <class T>
void textureSlots(std::vector<Slot>& out, const char* holder, std::initializer_list<TexturePtr T::*> all) {
    for (TexturePtr T::*slot : all)
        out.push_back({holder, [=](const TexturePtr& t) {
                           boost::shared_ptr<T> texture(new T);
                           (*texture).*slot = t;
                           boost::shared_ptr<MaterialSingleBRDF> m = named<MaterialSingleBRDF>(u"M", u"");
                           m->brdf = diffuseWith(texture);
                           return MaterialPtr(m);
                       }});
}

template <class L>
BrdfPtr newLayer() {
    return BrdfPtr(new L);
}

// Every texture slot of every class that holds one, with a bitmap in it and
// nothing else: the walk must find exactly that bitmap, below that class.
TEST(InventoryReferences, EveryTextureSlotIsWalked) {
    typedef Glass_BRDF G;
    typedef BaseGlossy_BRDF P;
    typedef MaterialOverrideEnvironment E;
    typedef MaterialToon T;
    std::vector<Slot> slots;
    layerSlots<G>(slots, "Glass_BRDF", newLayer<G>,
                  {&G::color_tex, &G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex});
    layerSlots<P>(slots, "Blinn_BRDF", newLayer<Blinn_BRDF>,
                  {&P::color_tex, &P::transparency_tex, &P::hilightGlossiness_tex, &P::reflectionGlossiness_tex});
    layerSlots<Mirror_BRDF>(slots, "Mirror_BRDF", newLayer<Mirror_BRDF>,
                            {&Mirror_BRDF::color_tex, &Mirror_BRDF::transparency_tex});
    layerSlots<Light_BRDF>(slots, "Light_BRDF", newLayer<Light_BRDF>,
                           {&Light_BRDF::color_tex, &Light_BRDF::transparency_tex});
    layerSlots<Diffuse_BRDF>(slots, "Diffuse_BRDF", newLayer<Diffuse_BRDF>,
                             {&Diffuse_BRDF::color_tex, &Diffuse_BRDF::transparency_tex});
    materialSlots<Material2Sided>(slots, "Material2Sided",
                                  {&Material2Sided::translucency_tex, &Material2Sided::transparency_tex});
    materialSlots<MaterialBump>(slots, "MaterialBump", {&MaterialBump::bump_tex});
    materialSlots<MaterialDisplaced>(slots, "MaterialDisplaced", {&MaterialDisplaced::displace_tex});
    materialSlots<MaterialAlphaContribution>(slots, "MaterialAlphaContribution",
                                             {&MaterialAlphaContribution::alpha_tex});
    materialSlots<E>(slots, "MaterialOverrideEnvironment", {&E::bg_tex, &E::gi_tex, &E::reflect_tex, &E::refract_tex});
    materialSlots<T>(slots, "MaterialToon", {&T::lineColorTex, &T::lineWidthTex, &T::opacityTex, &T::distortTex});
    textureSlots<FresnelTexture>(slots, "FresnelTexture",
                                 {&FresnelTexture::reflection_tex, &FresnelTexture::refraction_tex,
                                  &FresnelTexture::fresnel_ior_tex, &FresnelTexture::refract_ior_tex});
    textureSlots<BlendTexture>(slots, "BlendTexture", {&BlendTexture::color_a, &BlendTexture::color_b});
    textureSlots<InvertTexture>(slots, "InvertTexture", {&InvertTexture::texture});
    textureSlots<RampTexture>(slots, "RampTexture", {&RampTexture::colors});
    textureSlots<GridTexture>(slots, "GridTexture", {&GridTexture::line_color, &GridTexture::fill_color});
    textureSlots<NoiseTexture>(slots, "NoiseTexture", {&NoiseTexture::color1_tex, &NoiseTexture::color2_tex});
    textureSlots<CheckerTexture>(slots, "CheckerTexture",
                                 {&CheckerTexture::white_color, &CheckerTexture::black_color});

    for (const Slot& slot : slots) {
        SCOPED_TRACE(slot.holder + " slot " + std::to_string(&slot - &slots[0]));
        std::vector<FileReference> refs;
        collectMaterialReferences(slot.make(bitmap(u"x.png")), refs);
        ASSERT_EQ(refs.size(), 1u);
        EXPECT_TRUE(refs[0].path == u"x.png");
        const std::string tail = slot.holder + " > BitmapTexture > BitmapBuffer";
        EXPECT_EQ(refs[0].where.substr(refs[0].where.size() - std::min(tail.size(), refs[0].where.size())), tail);
    }
    EXPECT_EQ(slots.size(), 42u);
}

TEST(InventoryReferences, OldRecordThatStoredABarePathBecomesABitmapReference) {
    // A version 2 library of one bump material of version 1: name, the path
    // of its bump bitmap, bump_tex_mult, base material as tag and record.
    testsupport::RecordBytes bytes;
    bytes.version(2).u32(1).u32(kMaterialBump).version(1).wstr("Old bump").wstr("D:\\old\\bump.jpg").f32(0.5f).multi(
        "Base");
    TempDir dir;
    const std::string path = dir.file("old.lumat");
    ASSERT_TRUE(tempfiles::writeFile(path, std::string(bytes.data.begin(), bytes.data.end())));

    const FileReferences refs = listFileReferences(wide(path), FileKind::Materials);
    ASSERT_EQ(refs.status, FileStatus::Document) << refs.reason;
    ASSERT_EQ(refs.references.size(), 1u);
    EXPECT_TRUE(refs.references[0].material == u"Old bump");
    EXPECT_TRUE(refs.references[0].path == u"D:\\old\\bump.jpg");
    EXPECT_EQ(refs.references[0].where, "MaterialBump > BitmapTexture > BitmapBuffer");

    const FileListing listing = listFile(wide(path), FileKind::Materials);
    ASSERT_EQ(listing.materials.size(), 1u);
    EXPECT_EQ(listing.materials[0].shape, "MaterialBump[MaterialMulti]");
    EXPECT_EQ(listing.materials[0].textures, 1u);
}

TEST(InventoryReferences, LightsInTheTreeGiveTheirProfiles) {
    // A library's sky always holds a sun; a tree built here may hold any
    // light, and the walk takes the light's path fields from its table.
    boost::shared_ptr<IESLight> ies(new IESLight);
    ies->ies_file = u"profiles\\downlight.ies";
    boost::shared_ptr<SkyTexture> sky(new SkyTexture);
    sky->sun = ies;
    boost::shared_ptr<MaterialOverrideEnvironment> env = named<MaterialOverrideEnvironment>(u"Lit", u"");
    env->bg_tex = sky;
    std::vector<FileReference> refs;
    collectMaterialReferences(env, refs);
    ASSERT_EQ(refs.size(), 1u);
    EXPECT_TRUE(refs[0].path == u"profiles\\downlight.ies");
    EXPECT_EQ(refs[0].where, "MaterialOverrideEnvironment > SkyTexture > IESLight");

    // The document sun holds no path; an empty path is no reference.
    sky->sun = documentSun();
    ies->ies_file.clear();
    refs.clear();
    collectMaterialReferences(env, refs);
    EXPECT_TRUE(refs.empty());
}

TEST(InventoryReferences, OptionsGiveEverySettingsPathAndTheirEnvironmentBitmaps) {
    AllOptions options;
    options.output_img_file = u"C:\\renders\\out.png";
    options.output_luimg_file = u"out.luimg";
    options.irradianceMap_file = u"cache\\scene.vrmap";
    options.irradianceMap_auto_save_file = u"cache\\saved.vrmap";
    options.lightCache_auto_save_file = u"lc.vrlmap";
    options.caustics_file = u"caustics.vrpmap";
    options.dr_folder = u"\\\\farm\\assets";
    options.giTexture = bitmap(u"hdri/sky.hdr");
    options.reflectTexture = blendOf(bitmap(u"refl.png"), TexturePtr());
    TempDir dir;
    const std::string path = dir.file("paths.orvopt");
    ASSERT_TRUE(OrvOptFile().save(options, wide(path)));

    FileReferences refs = listFileReferences(wide(path), FileKind::Options);
    ASSERT_EQ(refs.status, FileStatus::Document) << refs.reason;
    struct Expected {
        const char* where;
        std::u16string path;
        PathUse use;
    };
    const Expected expected[] = {
        {"SettingsIrradianceMap.file", u"cache\\scene.vrmap", PathUse::Read},
        {"SettingsIrradianceMap.auto_save_file", u"cache\\saved.vrmap", PathUse::Written},
        {"SettingsLightCache.auto_save_file", u"lc.vrlmap", PathUse::Written},
        {"SettingsCaustics.file", u"caustics.vrpmap", PathUse::Read},
        {"SettingsEnvironment.gi_tex > BitmapTexture > BitmapBuffer", u"hdri/sky.hdr", PathUse::Read},
        {"SettingsEnvironment.reflect_tex > BlendTexture > BitmapTexture > BitmapBuffer", u"refl.png", PathUse::Read},
        {"SettingsOutput.img_file", u"C:\\renders\\out.png", PathUse::Written},
        {"SettingsOutput.luimg_file", u"out.luimg", PathUse::Written},
        {"SettingsDR.folder", u"\\\\farm\\assets", PathUse::Folder},
    };
    ASSERT_EQ(refs.references.size(), sizeof expected / sizeof expected[0]);
    for (std::size_t i = 0; i < refs.references.size(); ++i) {
        SCOPED_TRACE(expected[i].where);
        EXPECT_EQ(refs.references[i].where, expected[i].where);
        EXPECT_TRUE(refs.references[i].path == expected[i].path);
        EXPECT_EQ(refs.references[i].use, expected[i].use);
        EXPECT_TRUE(refs.references[i].material.empty());
    }

    // Only what the renderer reads or needs counts as missing.
    ASSERT_TRUE(tempfiles::writeFile(dir.file("caustics.vrpmap"), "x"));
    EXPECT_EQ(checkReferences(refs.references, dir.file(""), {}), 4u);
    EXPECT_TRUE(refs.references[3].found);
    EXPECT_EQ(referenceLine(refs.references[0], FileKind::Options),
              "SettingsIrradianceMap.file\tcache\\scene.vrmap\tmissing");
    EXPECT_EQ(referenceLine(refs.references[1], FileKind::Options),
              "SettingsIrradianceMap.auto_save_file\tcache\\saved.vrmap\twritten by the renderer");
    EXPECT_EQ(referenceLine(refs.references[3], FileKind::Options),
              "SettingsCaustics.file\tcaustics.vrpmap\t" + refs.references[3].foundPath);
    EXPECT_EQ(referenceJson(refs.references[8]),
              "{\"material\": null, \"where\": \"SettingsDR.folder\", \"path\": \"\\\\\\\\farm\\\\assets\", "
              "\"use\": \"folder\", \"status\": \"missing\", \"found\": null}");
}

TEST(InventoryReferences, DefaultOptionsReferToNothing) {
    std::vector<FileReference> refs;
    collectOptionsReferences(AllOptions(), refs);
    EXPECT_TRUE(refs.empty());
}

// ---- damaged and unreadable files -------------------------------------------------------

TEST(InventoryFailures, FilesThatDontLoadAreReportedNotThrown) {
    TempDir dir;
    const std::string good = saveLibrary(dir, "good.orvmat", richLibrary());
    const std::string bytes = tempfiles::readFile(good);
    struct Case {
        const char* name;
        std::string content;
        FileKind kind;
        FileStatus status;
        const char* reason;  // the start of the reason
    };
    const Case cases[] = {
        {"cut.orvmat", bytes.substr(0, bytes.size() / 3), FileKind::Materials, FileStatus::Text, "data ends early"},
        {"count.orvmat", bytes.substr(0, 4) + tempfiles::le32(0xFFFFFFFFu) + bytes.substr(8), FileKind::Materials,
         FileStatus::Text, "count larger than the bytes left"},
        {"header.orvmat", "\3\0", FileKind::Materials, FileStatus::Text, "bad header"},
        {"text.orvmat", "<orvmat>just text</orvmat>", FileKind::Materials, FileStatus::Text, "bad header"},
        {"empty.orvopt", "", FileKind::Options, FileStatus::Text, "data ends early"},
        {"text.luopt", "Render settings", FileKind::Options, FileStatus::Text, "record version not read"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        ASSERT_TRUE(tempfiles::writeFile(dir.file(c.name), c.content));
        const FileListing listing = listFile(wide(dir.file(c.name)), c.kind);
        EXPECT_EQ(listing.status, c.status);
        EXPECT_EQ(listing.reason.compare(0, std::strlen(c.reason), c.reason), 0) << listing.reason;
        EXPECT_FALSE(listing.reason.empty());
        EXPECT_TRUE(listing.materials.empty());
        const FileReferences refs = listFileReferences(wide(dir.file(c.name)), c.kind);
        EXPECT_EQ(refs.status, c.status);
        EXPECT_EQ(refs.reason, listing.reason);
        EXPECT_TRUE(refs.references.empty());
    }

    // Damage anywhere in a rich library: every byte set to a few values.
    for (std::size_t at = 0; at < bytes.size(); at += 13) {
        std::string damaged = bytes;
        damaged[at] = static_cast<char>(damaged[at] ^ 0xFF);
        ASSERT_TRUE(tempfiles::writeFile(dir.file("damaged.orvmat"), damaged));
        const FileReferences refs = listFileReferences(wide(dir.file("damaged.orvmat")), FileKind::Materials);
        EXPECT_TRUE(refs.status == FileStatus::Document || !refs.reason.empty()) << at;
    }
}

TEST(InventoryFailures, PathsThatArentRegularFilesAreUnreadable) {
    TempDir dir;
    const FileListing missing = listFile(wide(dir.file("none.orvmat")), FileKind::Materials);
    EXPECT_EQ(missing.status, FileStatus::Unreadable);
    EXPECT_EQ(missing.reason.rfind("can't be opened", 0), 0u) << missing.reason;
    std::filesystem::create_directory(dir.file("folder.orvopt"));
    const FileReferences folder = listFileReferences(wide(dir.file("folder.orvopt")), FileKind::Options);
    EXPECT_EQ(folder.status, FileStatus::Unreadable);
    EXPECT_EQ(folder.reason, "not a regular file");
}

TEST(InventoryFailures, ListingLeavesTheDocumentSunAsItWas) {
    // A version 3 sky record replaces the document sun while it loads.
    resetDocumentSun();
    const SunLight before = *documentSun();
    const std::u16string sky = wide(tempfiles::examplePath("textures_sky_document_sun_1.orvmat"));
    ASSERT_EQ(listFile(sky, FileKind::Materials).status, FileStatus::Document);
    ASSERT_EQ(listFileReferences(sky, FileKind::Materials).status, FileStatus::Document);
    EXPECT_TRUE(documentSun()->isEqual(boost::make_shared<SunLight>(before)));
    // Loaded as a conversion loads it, the same file does change it.
    OrvMatFile().load(sky);
    EXPECT_FALSE(documentSun()->isEqual(boost::make_shared<SunLight>(before)));
    resetDocumentSun();
}

// ---- finding the files ------------------------------------------------------------------

class InventoryResolve : public ::testing::Test {
protected:
    void SetUp() override {
        for (const char* folder : {"lib", "lib/maps", "search1", "search2", "search2/maps", "lib/folder.png"})
            std::filesystem::create_directory(dir.file(folder));
        for (const char* file : {"lib/maps/wood.png", "search1/stone.png", "search2/maps/stone.png",
                                 "search2/wood.png", "search2/far.png", "abs.png"})
            ASSERT_TRUE(tempfiles::writeFile(dir.file(file), "x"));
    }

    // The path found, or "" when none is.
    std::string find(const std::u16string& stored, PathUse use = PathUse::Read) {
        std::string found = "left over";
        const bool ok = resolveReference(stored, use, lib(), {dir.file("search1"), dir.file("search2")}, found);
        EXPECT_EQ(ok, !found.empty());
        return found;
    }
    std::string lib() const { return dir.file("lib"); }

    TempDir dir;
};

TEST_F(InventoryResolve, RelativePathsBesideTheLibraryThenInEachSearchFolder) {
    EXPECT_EQ(find(u"maps/wood.png"), lib() + "/maps/wood.png");
    // The library's folder comes first, then the search folders in order.
    EXPECT_EQ(find(u"wood.png"), dir.file("search2") + "/wood.png");
    EXPECT_EQ(find(u"stone.png"), dir.file("search1") + "/stone.png");
    EXPECT_EQ(find(u"maps/stone.png"), dir.file("search2") + "/maps/stone.png");
    // "\" separates folders whatever the system.
    EXPECT_EQ(find(u"maps\\wood.png"), lib() + "/maps/wood.png");
    // A relative path is not looked for by its file name alone.
    EXPECT_EQ(find(u"other/far.png"), "");
    EXPECT_EQ(find(u"nowhere.png"), "");
    EXPECT_EQ(find(u""), "");
}

TEST_F(InventoryResolve, WindowsPathsByTheirFileName) {
    for (const char16_t* stored : {u"C:\\maps\\far.png", u"c:/maps/far.png", u"\\\\server\\share\\tex\\far.png",
                                   u"\\maps\\far.png", u"C:far.png"}) {
        SCOPED_TRACE(std::string(stored, stored + std::char_traits<char16_t>::length(stored)));
        EXPECT_EQ(find(stored), dir.file("search2") + "/far.png");
    }
    EXPECT_EQ(find(u"C:\\maps\\wood.png"), dir.file("search2") + "/wood.png");
    EXPECT_EQ(find(u"C:\\maps\\"), "");
    EXPECT_EQ(find(u"\\\\server\\share\\missing.png"), "");
}

TEST_F(InventoryResolve, AbsolutePathsAsTheyAreThenByFileName) {
    const std::string absolute = std::filesystem::absolute(dir.file("abs.png")).generic_string();
    EXPECT_EQ(find(wide(absolute)), absolute);
    // Moved from another machine: found by its name.
    EXPECT_EQ(find(u"/home/someone/textures/far.png"), dir.file("search2") + "/far.png");
}

TEST_F(InventoryResolve, AFolderIsFoundOnlyWhereAFolderIsWanted) {
    EXPECT_EQ(find(u"folder.png"), "");
    EXPECT_EQ(find(u"folder.png", PathUse::Folder), lib() + "/folder.png");
    EXPECT_EQ(find(u"maps", PathUse::Folder), lib() + "/maps");
    EXPECT_EQ(find(u"maps/wood.png", PathUse::Folder), "");
}

TEST_F(InventoryResolve, CheckedReferencesShowWhereTheyWereFound) {
    std::vector<FileReference> refs(3);
    refs[0].material = u"Wood", refs[0].path = u"C:\\maps\\wood.png", refs[0].where = "MaterialLayeredBRDF";
    refs[1].material = u"Wood", refs[1].path = u"gone.png", refs[1].where = "MaterialLayeredBRDF";
    refs[2].path = u"out.png", refs[2].use = PathUse::Written, refs[2].where = "SettingsOutput.img_file";
    EXPECT_EQ(checkReferences(refs, lib(), {dir.file("search2")}), 1u);
    EXPECT_TRUE(refs[0].found);
    EXPECT_EQ(refs[0].foundPath, dir.file("search2") + "/wood.png");
    EXPECT_FALSE(refs[1].found);
    EXPECT_FALSE(refs[2].found);
    EXPECT_EQ(referenceLine(refs[0], FileKind::Materials),
              "Wood\tC:\\maps\\wood.png\t" + dir.file("search2") + "/wood.png\tMaterialLayeredBRDF");
    EXPECT_EQ(referenceLine(refs[1], FileKind::Materials), "Wood\tgone.png\tmissing\tMaterialLayeredBRDF");
    EXPECT_EQ(referenceJson(refs[1]),
              "{\"material\": \"Wood\", \"where\": \"MaterialLayeredBRDF\", \"path\": \"gone.png\", \"use\": "
              "\"read\", \"status\": \"missing\", \"found\": null}");
    EXPECT_NE(referenceJson(refs[2]).find("\"use\": \"written\", \"status\": \"written\""), std::string::npos);
}

}  // namespace
