// Writes the benchmark library to a file, for the Python benchmark:
//   orvxml_make_library <path.orvmat>
#include <cstdio>
#include <fstream>

#include "BenchLibrary.h"
#include "module/OrvMatFile.h"

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s <path.orvmat>\n", argv[0]);
        return 2;
    }
    OrvaneLumoCore::OrvMatFile file;
    file.materials = bench::generateLibrary();
    std::ofstream out(argv[1], std::ios::binary);
    if (!file.save(out) || !out.flush()) {
        std::fprintf(stderr, "could not write %s\n", argv[1]);
        return 1;
    }
    return 0;
}
