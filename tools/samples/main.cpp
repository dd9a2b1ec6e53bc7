// orvxml-samples DIR: writes the sample libraries into DIR (made if missing).
// orvxml-samples --corpus DIR: writes the fuzzing seeds, the samples and one
// library per class, material libraries into DIR/orvmat and options files
// into DIR/orvopt.
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <system_error>

#include "Samples.h"

int main(int argc, char** argv) {
    const bool corpus = argc == 3 && std::strcmp(argv[1], "--corpus") == 0;
    if (argc != 2 && !corpus) {
        std::fprintf(stderr, "usage: %s [--corpus] OUTPUT_DIRECTORY\n", argv[0]);
        return 2;
    }
    const std::filesystem::path dir(argv[argc - 1]);
    std::error_code ec;
    std::filesystem::create_directories(dir, ec);
    if (corpus && !ec) std::filesystem::create_directories(dir / "orvmat", ec);
    if (corpus && !ec) std::filesystem::create_directories(dir / "orvopt", ec);
    if (ec) {
        std::fprintf(stderr, "cannot create %s: %s\n", argv[argc - 1], ec.message().c_str());
        return 1;
    }

    std::vector<samples::Sample> list;
    samples::addTextRoadSamples(list);
    samples::addMaterialSamples(list);
    samples::addWrappedMaterialSamples(list);
    samples::addTextureSamples(list);
    samples::addOptionSamples(list);

    if (corpus) samples::writeClassSeeds(dir / "orvmat");
    int failures = 0;
    for (const samples::Sample& s : list) {
        const std::string name = s.fileName;
        const bool options = name.size() > 3 && name.compare(name.size() - 3, 3, "opt") == 0;
        const std::string path = (corpus ? dir / (options ? "orvopt" : "orvmat") / name : dir / name).string();
        if (s.write(path)) {
            std::printf("%s\n", path.c_str());
        } else {
            std::fprintf(stderr, "failed: %s\n", path.c_str());
            ++failures;
        }
    }
    return failures == 0 ? 0 : 1;
}
