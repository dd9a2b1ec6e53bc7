#pragma once
// Builders and comparisons shared by the tests of the wrapping, reference and
// toon materials.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "xml/AssetXmlWriter.h"

namespace wraptest {

using namespace OrvaneLumoCore;

// A layered material `name` with one default diffuse layer `layerName`.
inline boost::shared_ptr<MaterialLayeredBRDF> layered(const std::u16string& name,
                                                      const std::u16string& layerName = u"Base") {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = name;
    BrdfPtr layer(new Diffuse_BRDF);
    layer->name = layerName;
    m->brdfs.push_back(layer);
    return m;
}

// A constant texture of the given colour.
inline TexturePtr acolor(float r, float g, float b, float a = 1) {
    boost::shared_ptr<AColorTexture> t(new AColorTexture);
    t->color = AColor(r, g, b, a);
    return t;
}

// The bytes that a save wrote, and a new archive over them for loading.
template <class T>
QuickArchive savedArchive(const T& object, bool expectOk = true) {
    QuickArchive ar(1);
    EXPECT_EQ(object.save(ar), expectOk);
    std::vector<char> bytes(static_cast<std::size_t>(ar.getWritePosition()));
    if (!bytes.empty()) ar.getRaw(bytes.data(), bytes.size());
    return QuickArchive(bytes.data(), bytes.size());
}

// Saves `object` and loads the bytes into a fresh object of the same class.
template <class T>
boost::shared_ptr<T> roundTrip(const T& object) {
    QuickArchive ar = savedArchive(object);
    boost::shared_ptr<T> copy(new T);
    EXPECT_TRUE(copy->load(ar));
    EXPECT_EQ(ar.getReadPosition(), ar.getWritePosition()) << "the record was read to its end";
    return copy;
}

// The XML of an object's own writeXml, as UTF-8.
template <class T>
std::string ownXml(T& object, const std::u16string& url = u"") {
    std::u16string out;
    AssetXmlWriter writer(out);
    object.writeXml(writer, url);
    return wideToUtf8(out);
}

// Compares two texts line by line, naming the first line that differs.
inline void expectSameLines(const std::string& expected, const std::string& actual) {
    std::istringstream e(expected), a(actual);
    std::string el, al;
    int line = 1;
    for (;; ++line) {
        const bool moreE = static_cast<bool>(std::getline(e, el));
        const bool moreA = static_cast<bool>(std::getline(a, al));
        if (!moreE && !moreA) break;
        if (!moreE || !moreA || el != al) {
            ADD_FAILURE() << "line " << line << "\n expected: " << (moreE ? el : "<end>")
                          << "\n actual:   " << (moreA ? al : "<end>");
            return;
        }
    }
    EXPECT_EQ(expected, actual);  // also catches a difference in the last line break
}

// Number of times `needle` occurs in `text`.
inline int countOf(const std::string& text, const std::string& needle) {
    int n = 0;
    for (std::size_t p = text.find(needle); p != std::string::npos; p = text.find(needle, p + 1)) ++n;
    return n;
}

}  // namespace wraptest
