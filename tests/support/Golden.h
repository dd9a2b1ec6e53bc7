#pragma once
// The golden documents under tests/ and the XML that objects write, as UTF-8.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>

#include "persistence/QuickArchive.h"
#include "xml/AssetXmlWriter.h"

namespace testsupport {

// The golden document tests/<path>, for a test that takes values from it.
// To compare with one, use expectGolden, which ORVXML_UPDATE_GOLDEN reaches.
inline std::string readGolden(const std::string& path) {
    std::ifstream in(std::string(ORVXML_SOURCE_DIR) + "/tests/" + path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    EXPECT_FALSE(text.str().empty()) << "no golden document " << path;
    return text.str();
}

// Compares `actual` with the golden document tests/<path>, naming the first line that differs (for long documents,
// where a full diff drowns the change). With ORVXML_UPDATE_GOLDEN set the file is written instead.
inline void expectGolden(const std::string& path, const std::string& actual) {
    if (std::getenv("ORVXML_UPDATE_GOLDEN"))
        std::ofstream(std::string(ORVXML_SOURCE_DIR) + "/tests/" + path, std::ios::binary) << actual;
    const std::string expected = readGolden(path);
    if (expected == actual) return;
    const std::size_t at = std::mismatch(expected.begin(), expected.end(), actual.begin(), actual.end()).first - expected.begin();
    auto lineAt = [at](const std::string& text) {
        const std::size_t start = at == 0 ? 0 : text.rfind('\n', at - 1) + 1;
        return at >= text.size() ? "<end>" : text.substr(start, text.find('\n', start) - start);
    };
    ADD_FAILURE() << path << " line " << std::count(expected.begin(), expected.begin() + at, '\n') + 1
                  << "\n expected: " << lineAt(expected) << "\n actual:   " << lineAt(actual);
}

// The XML of writeXml as UTF-8, on a fresh writer or inside an Assets element;
// the writer's level must come back to where it was.
template <class T>
std::string xmlOf(T& object, const std::u16string& url = u"", bool underAssets = false) {
    std::u16string out;
    AssetXmlWriter writer(out);
    if (underAssets) writer.openAssets();
    out.clear();
    const int level = writer.getIndent();
    object.writeXml(writer, url);
    EXPECT_EQ(level, writer.getIndent());
    return OrvaneLumoCore::wideToUtf8(out);
}

}  // namespace testsupport
