// The document sun between whole conversions: two libraries saved to files
// and converted one after the other by the material file driver, in one
// process.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "lights/SunIesDome.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "persistence/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "textures/SkyTexture.h"

using namespace OrvaneLumoCore;

namespace {

// A library of one material whose diffuse layer shows `sky`.
std::string saveSkyLibrary(const char* fileName, const char16_t* material, const TexturePtr& sky) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = material;
    boost::shared_ptr<Diffuse_BRDF> layer(new Diffuse_BRDF);
    layer->name = u"Sky";
    layer->color_tex = sky;
    m->brdfs.push_back(layer);
    OrvMatFile file;
    file.materials.push_back(m);
    const std::string path = ::testing::TempDir() + fileName;
    EXPECT_TRUE(file.save(utf8ToWide(path)));
    return path;
}

std::string convert(const std::string& path) {
    return wideToUtf8(OrvMatFile().getXml(utf8ToWide(path)));
}

// The sun reference of the document's one sky.
std::string sunReference(const std::string& xml) {
    const std::string head = "name=\"sun\"";
    const std::size_t at = xml.find(head);
    if (at == std::string::npos) return "(no sun parameter)";
    const std::size_t open = xml.find("<value>", at) + 7;
    return xml.substr(open, xml.find("</value>", open) - open);
}

// A sky that saves a version 1 record without a sun of its own: the tag
// 0x10000 and the flag 0. Such a sky uses whatever the document sun is.
class SkyV1 : public SkyTexture {
public:
    bool save(QuickArchive& ar) const override {
        ar.writeUInt(0x10000);
        ar.writeByte(false);
        return true;
    }
};

}  // namespace

TEST(SkyConversions, DocumentSunCarriesToTheNextConversion) {
    const std::vector<std::uint8_t> before = [] {
        QuickArchive ar;
        documentSun()->save(ar);
        std::vector<std::uint8_t> b(static_cast<std::size_t>(ar.getWritePosition()));
        ar.getRaw(b.data(), b.size());
        return b;
    }();

    const std::string plain = saveSkyLibrary("sky_plain.orvmat", u"Plain", TexturePtr(new SkyV1));

    // A sky saved while the document sun had another id: its version 3
    // record carries that sun, which replaces the document sun when the
    // record is read. The sky's sun is that document sun.
    documentSun()->id = u"{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}";
    documentSun()->name = u"Studio";
    const std::string carrier =
        saveSkyLibrary("sky_carrier.orvmat", u"Carrier", TexturePtr(new SkyTexture));
    {
        QuickArchive ar(before.data(), before.size());
        ASSERT_TRUE(documentSun()->load(ar));
    }
    ASSERT_TRUE(isDocumentSunId(documentSun()->id));

    // Alone, the plain library refers to the document sun by its fixed url,
    // and no Asset of a sun is written.
    const std::string first = convert(plain);
    EXPECT_EQ(sunReference(first), "/Rhino Document Sun");
    EXPECT_EQ(first.find("SunLight"), std::string::npos);

    // The carrier replaces the document sun of the process...
    EXPECT_EQ(sunReference(convert(carrier)), "/{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}");
    EXPECT_EQ(documentSun()->name, u"Studio");

    // ...and the plain library, converted next, refers to that sun.
    EXPECT_EQ(sunReference(convert(plain)), "/{4B0D3F85-6EC0-4F94-8C3B-5A7EBD9F468A}");

    QuickArchive ar(before.data(), before.size());
    EXPECT_TRUE(documentSun()->load(ar));
    std::remove(plain.c_str());
    std::remove(carrier.c_str());
}
