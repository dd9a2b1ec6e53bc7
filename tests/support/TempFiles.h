#pragma once
// Scratch files for tests that need real paths, on every system: a private
// folder, file contents, the example files. PosixFiles.h adds sparse and
// special files and the peak memory of work done in a child.
#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>

#include "persistence/QuickArchive.h"

namespace tempfiles {

// A fresh folder, removed with everything in it at the end of the scope.
class TempDir {
public:
    TempDir() {
        std::random_device random;
        const std::filesystem::path base = std::filesystem::temp_directory_path();
        for (int attempt = 0; attempt < 100 && path_.empty(); ++attempt) {
            const std::filesystem::path p = base / ("orvxml-" + std::to_string(random()));
            std::error_code ec;
            if (std::filesystem::create_directory(p, ec)) path_ = p.generic_string();
        }
    }
    ~TempDir() {
        std::error_code ec;
        if (!path_.empty()) std::filesystem::remove_all(path_, ec);
    }
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    std::string file(const std::string& name) const { return path_ + "/" + name; }

private:
    std::string path_;
};

inline std::u16string wide(const std::string& path) { return OrvaneLumoCore::utf8ToWide(path); }

inline bool writeFile(const std::string& path, const std::string& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    return static_cast<bool>(out.flush());
}

inline std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

inline std::string examplePath(const std::string& name) { return std::string(ORVXML_SOURCE_DIR) + "/examples/" + name; }
inline std::string example(const std::string& name) { return readFile(examplePath(name)); }

// A u32 as little-endian bytes.
inline std::string le32(std::uint32_t v) {
    std::string s(4, '\0');
    for (int i = 0; i < 4; ++i) s[i] = static_cast<char>(v >> (8 * i));
    return s;
}

// A v3 library whose block count claims far more than the file holds.
inline std::string claimsMore() { return example("materials_all_layers.orvmat").replace(8, 4, le32(0xFFFFFFFFu)); }

}  // namespace tempfiles
