#pragma once
// Helpers of the light and sky tests: record bytes laid by hand, the text a
// writer produces, and golden documents kept beside the tests.
#include <cstdint>
#include <fstream>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "animation/RecordBytes.h"
#include "persistence/QuickArchive.h"
#include "persistence/Types.h"
#include "xml/AssetXmlWriter.h"

namespace lighttest {

using animtest::RecordBytes;
using animtest::savedBytes;

// wstring: u32 byte length of the UTF-8 form, then the bytes.
inline RecordBytes& wstr(RecordBytes& b, const std::string& utf8) {
    b.u32(static_cast<std::uint32_t>(utf8.size()));
    for (char c : utf8) b.u8(static_cast<std::uint8_t>(c));
    return b;
}

inline RecordBytes& color(RecordBytes& b, float r, float g, float bl) { return b.vec(r, g, bl); }

// AnimatedTransform record: tag 0x10000, key count, time width 8, then each
// key as f64 time and transform.
inline RecordBytes& animatedTransform(
    RecordBytes& b, const std::vector<std::pair<double, OrvaneLumoCore::Transform>>& keys) {
    b.u32(0x10000).u32(static_cast<std::uint32_t>(keys.size())).u32(8);
    for (const auto& k : keys) b.f64(k.first).transform(k.second);
    return b;
}

// A transform whose twelve numbers are base, base + 1, ... base + 11.
inline OrvaneLumoCore::Transform countingTransform(float base) {
    using OrvaneLumoCore::Vector;
    return OrvaneLumoCore::Transform(
        OrvaneLumoCore::Matrix(Vector(base, base + 1, base + 2), Vector(base + 3, base + 4, base + 5),
                               Vector(base + 6, base + 7, base + 8)),
        Vector(base + 9, base + 10, base + 11));
}

// The text that `write(writer)` gives, at the indentation of an Asset inside
// an Assets element.
template <class Write>
std::string xmlOf(Write write) {
    std::u16string out;
    AssetXmlWriter writer(out);
    writer.openAssets();
    out.clear();
    write(writer);
    return OrvaneLumoCore::wideToUtf8(out);
}

inline std::string readGolden(const std::string& relativePath) {
    std::ifstream in(std::string(ORVXML_SOURCE_DIR) + "/tests/" + relativePath, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

}  // namespace lighttest
