// Conversion speed of the C++ library: a large material library written into
// a reused buffer, the whole road from the file's bytes, the two small
// documents through the drivers, and the number formatter alone. The
// counter chars_per_second counts UTF-16 units of XML.
#include <benchmark/benchmark.h>

#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "BenchLibrary.h"
#include "materials/MaterialAssets.h"
#include "module/Extension.h"
#include "module/OrvMatFile.h"
#include "platform/NumberFormat.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

namespace {

// Takes the text and keeps nothing: the cost of making it alone.
class DiscardSink : public XmlSink {
public:
    void flush(const char16_t* text, std::size_t size) override {
        benchmark::DoNotOptimize(text);
        units += size;
    }
    std::size_t units = 0;
};

void writeLibrary(XmlSink& sink, const std::vector<MaterialPtr>& library) {
    AssetXmlWriter writer(sink);
    writer.openRoot("orvmat");
    for (const MaterialPtr& m : library) writeMaterialAssets(writer, m);
    writer.closeRoot();
}

void report(benchmark::State& state, std::size_t units) {
    state.counters["chars_per_second"] = benchmark::Counter(
        static_cast<double>(units) * static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
    state.counters["chars"] = static_cast<double>(units);
}

// Objects already in memory into a string that is reused from call to call.
void BM_LibraryToReusedString(benchmark::State& state) {
    const std::vector<MaterialPtr> library = bench::generateLibrary();
    std::u16string xml;
    StringSink warmUp(xml);  // the string's pages, made once
    writeLibrary(warmUp, library);
    for (auto _ : state) {
        xml.clear();
        StringSink sink(xml);
        writeLibrary(sink, library);
        benchmark::DoNotOptimize(xml.data());
    }
    report(state, xml.size());
}
BENCHMARK(BM_LibraryToReusedString)->Unit(benchmark::kMillisecond)->MinTime(2);

// The same with a sink that keeps nothing: the writer and the model alone.
void BM_LibraryToDiscardingSink(benchmark::State& state) {
    const std::vector<MaterialPtr> library = bench::generateLibrary();
    std::size_t units = 0;
    for (auto _ : state) {
        DiscardSink sink;
        writeLibrary(sink, library);
        units = sink.units;
    }
    report(state, units);
}
BENCHMARK(BM_LibraryToDiscardingSink)->Unit(benchmark::kMillisecond);

// Into a fresh string each time: what a caller pays who keeps the result.
void BM_LibraryToFreshString(benchmark::State& state) {
    const std::vector<MaterialPtr> library = bench::generateLibrary();
    std::size_t units = 0;
    for (auto _ : state) {
        std::u16string xml;
        StringSink sink(xml);
        writeLibrary(sink, library);
        units = xml.size();
        benchmark::DoNotOptimize(xml.data());
    }
    report(state, units);
}
BENCHMARK(BM_LibraryToFreshString)->Unit(benchmark::kMillisecond);

// The whole road of a file held in memory: container, records, XML.
void BM_LoadAndConvertLibrary(benchmark::State& state) {
    OrvMatFile source;
    source.materials = bench::generateLibrary();
    std::stringstream saved;
    if (!source.save(saved)) {
        state.SkipWithError("saving the generated library failed");
        return;
    }
    const std::string bytes = saved.str();
    std::u16string xml;
    StringSink warmUp(xml);
    writeLibrary(warmUp, source.materials);
    for (auto _ : state) {
        std::istringstream in(bytes);
        OrvMatFile file;
        if (!file.load(in)) {
            state.SkipWithError("loading the generated library failed");
            return;
        }
        xml.clear();
        StringSink sink(xml);
        writeLibrary(sink, file.materials);
        benchmark::DoNotOptimize(xml.data());
    }
    report(state, xml.size());
    state.counters["file_MB"] = static_cast<double>(bytes.size()) / 1e6;
}
BENCHMARK(BM_LoadAndConvertLibrary)->Unit(benchmark::kMillisecond);

// The two small documents through the drivers, file reading included.
void convertFile(benchmark::State& state, const char* name, bool material) {
    const std::string narrowPath = std::string(ORVXML_SOURCE_DIR "/examples/") + name;
    const std::u16string path(narrowPath.begin(), narrowPath.end());
    std::u16string xml;
    for (auto _ : state) {
        xml.clear();
        StringSink sink(xml);
        const bool ok = material ? convertMaterialPath(path, sink) : convertOptionsPath(path, sink);
        if (!ok || xml.empty()) {
            state.SkipWithError("the example did not convert");
            return;
        }
    }
    report(state, xml.size());
}
void BM_SmallLibraryFile(benchmark::State& state) { convertFile(state, "materials_all_layers.orvmat", true); }
BENCHMARK(BM_SmallLibraryFile)->Unit(benchmark::kMicrosecond);
void BM_OptionsDocumentFile(benchmark::State& state) { convertFile(state, "render_settings.orvopt", false); }
BENCHMARK(BM_OptionsDocumentFile)->Unit(benchmark::kMicrosecond);

// Number text alone, over the kinds of values a model holds.
void BM_FormatFloat(benchmark::State& state) {
    std::mt19937 rng(1);
    std::vector<float> values;
    for (int i = 0; i < 4096; ++i) {
        switch (i % 4) {
            case 0: values.push_back(static_cast<float>(rng() % 1000) / 1000.0f); break;
            case 1: values.push_back(static_cast<float>(rng() % 8)); break;
            case 2: values.push_back(std::ldexp(static_cast<float>(rng() % 1000000), -int(rng() % 30))); break;
            default: values.push_back(static_cast<float>(rng() % 100000) * 37.0f); break;
        }
    }
    char16_t text[platform::kMaxFloatText];
    std::size_t i = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(platform::formatFloat(text, values[i++ & 4095]));
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()));
}
BENCHMARK(BM_FormatFloat);

}  // namespace
