// The options document: the golden documents, where each row of every record
// version shows, the translated values, an old record and the file road.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <map>
#include <sstream>

#include "OptionBytes.h"
#include "module/OrvOptFile.h"
#include "support/TempFiles.h"
#include "textures/BasicTextures.h"

using namespace opttest;

namespace {

using tempfiles::TempDir;

// A path in `dir` as the drivers take it; `write` puts `content` there first.
std::u16string at(const TempDir& dir, const std::string& name) { return utf8ToWide(dir.file(name)); }
std::u16string write(const TempDir& dir, const std::string& name, const std::vector<std::uint8_t>& content) {
    EXPECT_TRUE(tempfiles::writeFile(dir.file(name), std::string(content.begin(), content.end())));
    return at(dir, name);
}

// The parameters of a document, by url and name, each as its lines from the
// value on, trimmed and joined.
std::map<std::string, std::string> parametersOf(const std::string& doc) {
    std::map<std::string, std::string> out;
    std::istringstream lines(doc);
    std::string line, url, key;
    auto value = [&line](const char* name) {
        const std::size_t at = line.find(name) + std::strlen(name);
        return line.substr(at, line.find('"', at) - at);
    };
    while (std::getline(lines, line)) {
        if (line.find("url=\"") != std::string::npos) url = value("url=\"");
        if (line.find("<parameter ") != std::string::npos) {
            key = url + " " + value(" name=\"");
            out[key];
        } else if (line.find("</parameter>") != std::string::npos) {
            key.clear();
        } else if (!key.empty()) {
            out[key] += line.substr(std::min(line.size(), line.find_first_not_of(' ')));
        }
    }
    return out;
}

// The parameters in which a document differs from that of the default options.
std::string differences(const std::u16string& doc) {
    static const std::map<std::string, std::string> byDefault =
        parametersOf(readGolden("options/golden/default_options.xml"));
    const std::map<std::string, std::string> shown = parametersOf(wideToUtf8(doc));
    std::string out;
    for (const auto& p : byDefault) {
        const auto it = shown.find(p.first);
        if (it == shown.end()) out += p.first + " (missing)\n";
        else if (it->second != p.second) out += p.first + ": " + it->second + "\n";
    }
    for (const auto& p : shown)
        if (!byDefault.count(p.first)) out += p.first + " (added): " + p.second + "\n";
    return out;
}

}  // namespace

TEST(OptionsDocument, DefaultOptionsGiveTheGoldenDocument) {
    TempDir dir;
    AllOptions defaults;
    OrvOptFile file;
    ASSERT_TRUE(file.save(defaults, at(dir, "default.orvopt")));
    expectGolden("options/golden/default_options.xml", wideToUtf8(file.getXml(at(dir, "default.orvopt"))));
}

TEST(OptionsDocument, EveryRecordVersionShowsItsRows) {
    // Each row of a hand-laid record holds a value that names its record and
    // row (OptionBytes.h); the golden list shows, version by version, which
    // parameters leave their defaults (in the order of their urls and names)
    // and which row each one shows.
    std::string out;
    auto show = [&out](const std::string& what, const RecordBytes& record) {
        AllOptions o;
        EXPECT_TRUE(loadsWhole(o, record)) << what;
        out += "== " + what + "\n" + differences(documentXml(o));
    };
    for (int version : kDocumentVersions) show("version " + std::to_string(version), documentRecord(version, {}));
    for (int paramsVersion = 1; paramsVersion <= 4; ++paramsVersion)
        show("version 23, params version " + std::to_string(paramsVersion), documentRecord(23, {}, paramsVersion));
    expectGolden("options/golden/record_versions.txt", out);
}

TEST(OptionsDocument, TranslatedValues) {
    // The filter kernels 1 and 2 change places.
    const std::pair<int, const char16_t*> kKernels[] = {{0, u"0"}, {1, u"2"}, {2, u"1"}, {3, u"3"}, {-1, u"-1"}};
    for (const auto& c : kKernels) {
        AllOptions o;
        o.filterKernel = c.first;
        EXPECT_EQ(c.second, inlineValue(assetsOf(documentXml(o), u"/SettingsImageFilter"), u"type")) << c.first;
    }
    // File names are escaped; the camera shows its key at time 0, and keys at
    // 1 and 2 only leave that of reset.
    AllOptions o;
    o.output_img_file = u"C:\\a&b<c>.png";
    o.physicalCamera.focal_length.setValue(28, 0.0);
    o.physicalCamera.focal_length.setValue(90, 2.0);
    EXPECT_EQ(u"C:\\a&amp;b&lt;c&gt;.png", inlineValue(assetsOf(documentXml(o), u"/SettingsOutput"), u"img_file"));
    EXPECT_EQ(u"28", inlineValue(assetsOf(documentXml(o), u"/CameraPhysical"), u"focal_length"));
    ASSERT_TRUE(loadsWhole(o.physicalCamera.focal_length, RecordBytes().keys(2).u8(1).f64(1).f32(90).f64(2).f32(95)));
    EXPECT_EQ(u"0", inlineValue(assetsOf(documentXml(o), u"/CameraPhysical"), u"focal_length"));
}

TEST(OptionsDocument, EnvironmentTextures) {
    // A texture's parameter shows the texture multiplier, a colour's the colour
    // multiplier; the textures' Assets, nested ones first, stand in front of
    // the block's own.
    AllOptions o;
    o.bgTexture.reset(new InvertTexture());
    static_cast<InvertTexture&>(*o.bgTexture).texture.reset(new AColorTexture());
    o.giTexture.reset(new AColorTexture(AColor(0.5f, 0.25f, 1, 1)));
    o.refractTexture.reset(new AColorTexture());
    o.bgColorMult = 2; o.bgTextureMult = 3; o.giColorMult = 4; o.giTextureMult = 5;
    o.reflectColorMult = 6; o.reflectTextureMult = 7; o.refractColorMult = 8; o.refractTextureMult = 9;
    expectGolden("options/golden/environment.xml", wideToUtf8(assetsOf(documentXml(o), u"/SettingsEnvironment")));
}

TEST(OptionsDocument, VersionZeroRecordShowsTheLaterDefaults) {
    // Version 0 as laid by hand: the three member records, no textures, the
    // fields of version 0 at their defaults, one channel 8 ("Normals"), ten
    // empty paths.
    RecordBytes b;
    b.u32(documentTag(0)).append(savedBytes(OrvaneParams())).append(savedBytes(OrvaneFrameData()));
    b.append(savedBytes(OrvaneLFBStampInfo())).u8(0).u8(0).vec(0, 0, 0).vec(0.8f, 0.8980392f, 1);
    b.i32(0).i32(0).i32(5).i32(600).i32(800).i32(0).i32(0).i32(0).i32(0).i32(0).i32(0);
    b.f32(45).f32(1).f32(1).f32(1).f32(1).f32(1.5f).f32(1).f32(1.333f).u32(1).u32(8);
    for (int k = 0; k < 10; ++k) b.u32(0);
    TempDir dir;
    const std::u16string doc = OrvOptFile().getXml(write(dir, "old.luopt", b.bytes()));
    // A bare OrvaneParams record: the four values in which a document differs
    // show those of the record.
    EXPECT_EQ(u"0", inlineValue(assetsOf(doc, u"/SettingsImageSampler"), u"type"));
    EXPECT_EQ(u"1e+018", inlineValue(assetsOf(doc, u"/SettingsCaustics"), u"search_distance"));
    // Everything newer than version 0 keeps its default.
    const std::u16string gold = utf8ToWide(readGolden("options/golden/default_options.xml"));
    for (const char16_t* url : {u"/CameraPhysical", u"/SettingsEnvironment", u"/SettingsOutput", u"/SettingsDR"})
        EXPECT_EQ(assetsOf(gold, url), assetsOf(doc, url)) << wideToUtf8(url);
    const std::u16string names = param(assetsOf(doc, u"/SettingsRenderChannels"), u"channel_names");
    const std::u16string indent(16, u' ');
    EXPECT_NE(std::u16string::npos, names.find(u"RGB color</entry>\n" + indent + u"<entry>Alpha</entry>\n" + indent +
                                               u"<entry>Normals</entry>\n"));
}

TEST(OptionsDocument, FileRoad) {
    TempDir dir;
    OrvOptFile file;
    EXPECT_EQ(u"", file.getXml(write(dir, "empty.orvopt", {})));
    EXPECT_EQ(u"", file.getXml(at(dir, "missing.orvopt")));
    EXPECT_EQ(u"<a/>\n", file.getXml(write(dir, "text.orvopt", {'<', 'a', '/', '>', '\n'})));
    // A binary file that fails to load comes back as its text, up to the
    // first zero byte: the tag's first byte.
    RecordBytes bad;
    bad.u32(documentTag(23)).append(savedBytes(OrvaneParams())).u32(tag(2));  // frame data of an unknown version
    EXPECT_EQ(u"\u0001", file.getXml(write(dir, "bad.orvopt", bad.bytes())));
    // A record longer than a block gives a file of whole blocks, and the
    // document of the reloaded file is that of the saved options.
    AllOptions big;
    big.output_img_file = std::u16string(2047, u'x');
    big.caustics_file = std::u16string(2047, u'y');
    ASSERT_TRUE(file.save(big, at(dir, "big.luopt")));
    EXPECT_EQ(8192u, std::filesystem::file_size(dir.file("big.luopt")));
    EXPECT_EQ(wideToUtf8(documentXml(big)), wideToUtf8(file.getXml(at(dir, "big.luopt"))));
}
