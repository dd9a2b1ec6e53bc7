// orvxml-samples DIR: writes the sample libraries into DIR (made if missing).
#include <cstdio>
#include <filesystem>
#include <system_error>

#include "Samples.h"

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s OUTPUT_DIRECTORY\n", argv[0]);
        return 2;
    }
    const std::filesystem::path dir(argv[1]);
    std::error_code ec;
    std::filesystem::create_directories(dir, ec);
    if (ec) {
        std::fprintf(stderr, "cannot create %s: %s\n", argv[1], ec.message().c_str());
        return 1;
    }

    std::vector<samples::Sample> list;
    samples::addTextRoadSamples(list);
    samples::addMaterialSamples(list);
    samples::addWrappedMaterialSamples(list);
    samples::addTextureSamples(list);
    samples::addOptionSamples(list);

    int failures = 0;
    for (const samples::Sample& s : list) {
        const std::string path = (dir / s.fileName).string();
        if (s.write(path)) {
            std::printf("%s\n", path.c_str());
        } else {
            std::fprintf(stderr, "failed: %s\n", path.c_str());
            ++failures;
        }
    }
    return failures == 0 ? 0 : 1;
}
