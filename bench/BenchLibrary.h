#pragma once
// The library the benchmarks convert: 10,000 layered materials, each with
// three layers and textures in some of their slots, and names that hold a
// character beyond U+FFFF (a surrogate pair in the library's text).
#include <string>
#include <vector>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

namespace bench {

const int kMaterialCount = 10000;

inline std::u16string numbered(const char16_t* stem, int i) {
    std::u16string s(stem);
    for (char c : std::to_string(i)) s += static_cast<char16_t>(c);
    return s;
}

inline std::vector<OrvaneLumoCore::MaterialPtr> generateLibrary() {
    using namespace OrvaneLumoCore;
    std::vector<MaterialPtr> library;
    library.reserve(kMaterialCount);
    for (int i = 0; i < kMaterialCount; ++i) {
        boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
        m->name = numbered(u"Material_\U0001F600_", i);

        boost::shared_ptr<Diffuse_BRDF> base(new Diffuse_BRDF);
        base->name = u"Base";
        base->color = Color(0.001f * (i % 1000), 0.5f, 0.25f);
        base->color_tex = makeBitmapTextureFromPath(numbered(u"textures/diffuse_\U0001F3A8_", i) + u".png");
        m->brdfs.push_back(base);

        boost::shared_ptr<Phong_BRDF> coat(new Phong_BRDF);  // default Fresnel texture
        coat->name = u"Coat";
        coat->reflection = Color(0.3f, 0.3f, 0.3f);
        m->brdfs.push_back(coat);

        boost::shared_ptr<Glass_BRDF> glass(new Glass_BRDF);
        glass->name = u"Glass";
        boost::shared_ptr<AColorTexture> tint(new AColorTexture);
        tint->color = AColor(0.9f, 1, 0.9f, 1);
        glass->color_tex = tint;
        m->brdfs.push_back(glass);

        library.push_back(m);
    }
    return library;
}

}  // namespace bench
