// Fuzzing seeds beyond the samples: a library for each class of each family
// at its defaults, inside the smallest host that stores it. A class whose
// defaults can't be stored (a texture without its generator) is left to the
// samples.
#include <cstdio>
#include <system_error>
#include <string>

#include "Samples.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "module/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "textures/Bitmaps.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

MaterialPtr layeredWith(const BrdfPtr& layer) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = u"Host";
    m->brdfs.push_back(layer);
    return m;
}

MaterialPtr hostOf(const TexturePtr& texture) {
    boost::shared_ptr<Diffuse_BRDF> layer(new Diffuse_BRDF);
    layer->color_tex = texture;
    return layeredWith(layer);
}

}  // namespace

void writeClassSeeds(const std::filesystem::path& dir) {
    auto save = [&](const std::string& family, int tag, const MaterialPtr& material) {
        const std::string path = (dir / ("class_" + family + "_" + std::to_string(tag) + ".orvmat")).string();
        OrvMatFile file;
        file.materials.push_back(material);
        if (file.save(utf8ToWide(path))) {
            std::printf("%s\n", path.c_str());
        } else {
            std::error_code ec;
            std::filesystem::remove(path, ec);
        }
    };
    // Tags are dense within a family and far below 64, except the BRDFs'
    // single bits.
    for (int tag = 0; tag < 64; ++tag) {
        if (MaterialPtr m = createMaterial(static_cast<std::uint32_t>(tag))) save("material", tag, m);
        if (TexturePtr t = createTexture(tag)) save("texture", tag, hostOf(t));
        if (UVWPtr u = createUVW(tag)) {
            boost::shared_ptr<UVWTexture> t(new UVWTexture);
            t->uvw = u;
            save("uvw", tag, hostOf(t));
        }
        if (BitmapPtr b = createBitmap(tag)) {
            boost::shared_ptr<BitmapTexture> t(new BitmapTexture);
            t->uvw = createUVW(GenChannelUVW::kType);
            t->bitmap = b;
            save("bitmap", tag, hostOf(t));
        }
    }
    for (int bit = 0; bit < 32; ++bit) {
        if (BrdfPtr b = createBrdf(1u << bit)) save("brdf", bit, layeredWith(b));
    }
}

}  // namespace samples
