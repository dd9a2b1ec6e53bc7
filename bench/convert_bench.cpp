// Conversion speed of a large material library: 10,000 layered materials,
// each with three layers and textures in some of their slots.
#include <benchmark/benchmark.h>

#include <sstream>
#include <string>
#include <vector>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/MaterialAssets.h"
#include "persistence/OrvMatFile.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

const int kMaterialCount = 10000;

std::u16string numbered(const char16_t* stem, int i) {
    std::u16string s(stem);
    for (char c : std::to_string(i)) s += static_cast<char16_t>(c);
    return s;
}

std::vector<MaterialPtr> generateLibrary() {
    std::vector<MaterialPtr> library;
    library.reserve(kMaterialCount);
    for (int i = 0; i < kMaterialCount; ++i) {
        boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
        m->name = numbered(u"Material_", i);

        boost::shared_ptr<Diffuse_BRDF> base(new Diffuse_BRDF);
        base->name = u"Base";
        base->color = Color(0.001f * (i % 1000), 0.5f, 0.25f);
        base->color_tex = makeBitmapTextureFromPath(numbered(u"textures/diffuse_", i) + u".png");
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

std::u16string convert(const std::vector<MaterialPtr>& library) {
    std::u16string xml;
    xml.reserve(64u << 20);
    AssetXmlWriter writer(xml);
    writer.openRoot("orvmat");
    for (const MaterialPtr& m : library) writeMaterialAssets(writer, m);
    writer.closeRoot();
    return xml;
}

void report(benchmark::State& state, std::size_t xmlUnits) {
    // Bytes of XML text as UTF-16 in memory.
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(xmlUnits * sizeof(char16_t)));
    state.counters["xml_MB"] = static_cast<double>(xmlUnits * sizeof(char16_t)) / 1e6;
    state.counters["materials"] = kMaterialCount;
}

// Writing the XML of objects already in memory.
void BM_ConvertLibraryObjects(benchmark::State& state) {
    const std::vector<MaterialPtr> library = generateLibrary();
    std::size_t units = 0;
    for (auto _ : state) {
        const std::u16string xml = convert(library);
        units = xml.size();
        benchmark::DoNotOptimize(xml.data());
    }
    report(state, units);
}
BENCHMARK(BM_ConvertLibraryObjects)->Unit(benchmark::kMillisecond);

// The whole road of a file held in memory: container, records, XML.
void BM_LoadAndConvertLibrary(benchmark::State& state) {
    OrvMatFile source;
    source.materials = generateLibrary();
    std::stringstream saved;
    if (!source.save(saved)) {
        state.SkipWithError("saving the generated library failed");
        return;
    }
    const std::string bytes = saved.str();
    std::size_t units = 0;
    for (auto _ : state) {
        std::istringstream in(bytes);
        OrvMatFile file;
        if (!file.load(in)) {
            state.SkipWithError("loading the generated library failed");
            return;
        }
        const std::u16string xml = convert(file.materials);
        units = xml.size();
        benchmark::DoNotOptimize(xml.data());
    }
    report(state, units);
    state.counters["file_MB"] = static_cast<double>(bytes.size()) / 1e6;
}
BENCHMARK(BM_LoadAndConvertLibrary)->Unit(benchmark::kMillisecond);

}  // namespace
