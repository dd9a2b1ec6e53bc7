// The options document: the golden documents, where each parameter comes
// from, the translated values, an old record and the file road.
#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "OptionBytes.h"
#include "persistence/OrvOptFile.h"
#include "textures/BasicTextures.h"

using namespace opttest;

namespace {

// A fresh folder for files, removed with everything in it.
struct TempDir {
    const std::filesystem::path path = std::filesystem::temp_directory_path() /
        ("opttest_" + std::to_string(std::chrono::steady_clock::now().time_since_epoch().count()));
    TempDir() { std::filesystem::create_directories(path); }
    ~TempDir() { std::filesystem::remove_all(path); }
    std::u16string file(const std::string& name) const { return utf8ToWide((path / name).string()); }
    std::u16string write(const std::string& name, const std::vector<std::uint8_t>& content) const {
        std::ofstream((path / name).string(), std::ios::binary).write(reinterpret_cast<const char*>(content.data()),
                                                                        static_cast<std::streamsize>(content.size()));
        return file(name);
    }
};

// Where each parameter of a block comes from, in the block's order: p, f, d
// and c name a row of the params, frame data, document and camera records;
// "!" marks an inverted flag; x is a setting that no record holds, t a
// texture reference, l the channel list.
const std::pair<const char16_t*, const char*> kSources[] = {
    {u"SettingsImageSampler", "p2 p3 p4 p5 p6 p7 p8 p10 p9 p11 p13 p14"},
    {u"SettingsImageFilter", "p1 d11 d29"}, {u"SettingsCamera", "p17 f19 f21 d24 f20 f22 d14"},
    {u"SettingsCameraDof", "d20! p18 f11 p20 f10 p21 p22 f12 p23 p19"},
    {u"SettingsMotionBlur", "p24 p25 p34 p35 p28 p38 p36"},
    {u"SettingsGI", "p39 p40 p41 p42 p43 p44 p45 p46 p47 p48 p51"},
    {u"SettingsIrradianceMap",
     "p52 p53 p54 p55 p56 x p57 p58 p59 p74 p75 p76 p77 p64 p61 p70 p62 p63 d38 p60 p65 p66 x p67 p71 p68 d39"},
    {u"SettingsPhotonMap", "p78 p80 p81 p82 p83 d42 p85 p79 p86 p87 p88 d43 p92 p84 p93 p90 p91 x p85"},
    {u"SettingsLightCache",
     "p95 p96 p97 p108 p98 p109 p110 p99 p100 p101 p102 p103 d40 p105 p106 d41 p112 p111 p113 x x x"},
    {u"SettingsCaustics", "p114 p116 p115 p118 p117 p119 d44 p120 p121 d45 x"},
    {u"SettingsRaycaster", "p124 p125 p126 p127 x"}, {u"SettingsDMCGI", "p49 p50"},
    {u"SettingsRegionsGenerator", "p128 p129 p130 p131 p132"},
    {u"SettingsDMCSampler", "p134 p136 p137 p138 p139 p140"}, {u"SettingsRenderChannels", "d34 d32 d33 l"},
    {u"SettingsColorMapping", "d48 d49 d66 p141 p142 f46 f47 p145 p144 p143 x x x"},
    {u"SettingsOptions",
     "p146 x p147 p149 p151 p148 p150 p160 p152 p153 p154 p155 p156 x p157 p158 p161 p159 x p162 p164 d21 d47 d46"},
    {u"SettingsDefaultDisplacement", "p165 p166 p167 p168 p169 p170 p171"}, {u"SettingsDR", "d63 d68 d69 d70"},
    {u"SettingsEnvironment", "d10 d7 t d26 d9 d8 t d25 d59 d53 t d55 d60 d54 t d56"},
    {u"SettingsOutput",
     "d13 d12 d30 d31 d36 d18 d52 f30 f31 f32 f33 f36 f37 f38 f39 f40 f41 d37 d15 d50 d19 d51 d16 d17"},
    {u"CameraPhysical",
     "d22 c1 c2 c3 c4 c5 c6 c7 c8 c9 c10 c11 c12 c13 c14 c15 c16 c17 c18 c19 c20 c21 c22 c23 c24 c25 c26 c27 c28 "
     "d72 d23"},
};

// The parameters of a block, as (type, name, inline value or first number).
struct Shown { std::u16string type, name, value; };
std::vector<Shown> parameters(const std::u16string& block) {
    std::vector<Shown> out;
    for (std::size_t at = block.find(u"<parameter type=\""); at != std::u16string::npos;
         at = block.find(u"<parameter type=\"", at + 1)) {
        Shown p;
        const std::size_t type = at + 17, name = block.find(u"name=\"", at) + 6;
        p.type = block.substr(type, block.find(u'"', type) - type);
        p.name = block.substr(name, block.find(u'"', name) - name);
        const std::u16string text = param(block.substr(at), p.name);
        std::size_t v = text.find(p.type == u"color" ? u"<r>" : u"<value>");
        if (v != std::u16string::npos) {
            v = text.find(u'>', v) + 1;
            p.value = text.substr(v, text.find(u'<', v) - v);
        }
        out.push_back(p);
    }
    return out;
}

// The text that a parameter of `type` shows for a row as the records lay it.
std::string shownForRow(Holder h, char rowType, int row, const std::u16string& type, bool inverted) {
    if (rowType == 's') return textAt(h, row);
    const bool isFloat = rowType == 'f' || rowType == 'd' || rowType == 'c';
    const double laid = isFloat ? floatAt(h, row) : rowType == 'b' ? flagAt(h, row) : intAt(h, row);
    if (type == u"bool") return (laid != 0) != inverted ? "1" : "0";
    char text[32];
    std::snprintf(text, sizeof text, "%g", laid);
    return text;
}

// Checks each parameter of a document against the records it was loaded
// from: a row that the record's version holds shows the laid value, any
// other parameter its default.
void expectSources(const std::u16string& doc, int version, int paramsVersion) {
    static const std::u16string gold = utf8ToWide(golden("options/golden/default_options.xml"));
    const char* const kRowTypes[] = {kParamsRowTypes, kFrameRowTypes, kDocumentRowTypes, kCameraV1RowTypes};
    for (const auto& b : kSources) {
        const std::u16string url = std::u16string(u"/") + b.first;
        const std::vector<Shown> shown = parameters(assetsOf(doc, url)), byDefault = parameters(assetsOf(gold, url));
        ASSERT_EQ(byDefault.size(), shown.size()) << wideToUtf8(url);
        std::istringstream tokens(b.second);
        std::string token;
        std::size_t k = 0;
        for (; k < shown.size() && tokens >> token; ++k) {
            const std::string where = wideToUtf8(url + u" " + shown[k].name) + " (" + token + "), version " +
                                      std::to_string(version) + "/" + std::to_string(paramsVersion);
            ASSERT_EQ(byDefault[k].name, shown[k].name) << where;
            const char kind = token[0];
            const int row = std::atoi(token.c_str() + 1);
            const Holder h = kind == 'p' ? kParams : kind == 'f' ? kFrame : kind == 'd' ? kDocument : kCamera;
            const bool present = kind == 'p'   ? paramsRowInVersion(row, paramsVersion)
                                 : kind == 'd' ? version >= kDocumentRowSince[row - 1]
                                               : kind == 'f' || (kind == 'c' && version >= 5);
            if (kind == 't' || kind == 'l') continue;
            std::string expected = wideToUtf8(byDefault[k].value);
            if (kind == 'p' && row == 140) expected = "2";  // every load gives 2
            else if (present)
                expected = shownForRow(h, kRowTypes[h][row - 1], row, shown[k].type, token.back() == '!');
            EXPECT_EQ(expected, wideToUtf8(shown[k].value)) << where;
        }
        EXPECT_TRUE(k == shown.size() && !(tokens >> token)) << "parameters of " << wideToUtf8(url);
    }
}

}  // namespace

TEST(OptionsDocument, DefaultOptionsGiveTheGoldenDocument) {
    TempDir dir;
    AllOptions defaults;
    OrvOptFile file;
    ASSERT_TRUE(file.save(defaults, dir.file("default.orvopt")));
    EXPECT_EQ(golden("options/golden/default_options.xml"), wideToUtf8(file.getXml(dir.file("default.orvopt"))));
}

TEST(OptionsDocument, EveryParameterShowsItsRecordField) {
    for (int version : kDocumentVersions) {
        AllOptions o;
        ASSERT_TRUE(loadsWhole(o, documentRecord(version, {})));
        expectSources(documentXml(o), version, 5);
    }
    for (int paramsVersion = 1; paramsVersion <= 4; ++paramsVersion) {
        AllOptions o;
        ASSERT_TRUE(loadsWhole(o, documentRecord(23, {}, paramsVersion)));
        expectSources(documentXml(o), 23, paramsVersion);
    }
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
    EXPECT_EQ(golden("options/golden/environment.xml"), wideToUtf8(assetsOf(documentXml(o), u"/SettingsEnvironment")));
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
    const std::u16string doc = OrvOptFile().getXml(dir.write("old.luopt", b.bytes()));
    // A bare OrvaneParams record: the four values in which a document differs
    // show those of the record.
    EXPECT_EQ(u"0", inlineValue(assetsOf(doc, u"/SettingsImageSampler"), u"type"));
    EXPECT_EQ(u"1e+018", inlineValue(assetsOf(doc, u"/SettingsCaustics"), u"search_distance"));
    // Everything newer than version 0 keeps its default.
    const std::u16string gold = utf8ToWide(golden("options/golden/default_options.xml"));
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
    EXPECT_EQ(u"", file.getXml(dir.write("empty.orvopt", {})));
    EXPECT_EQ(u"", file.getXml(dir.file("missing.orvopt")));
    EXPECT_EQ(u"<a/>\n", file.getXml(dir.write("text.orvopt", {'<', 'a', '/', '>', '\n'})));
    // A binary file that fails to load comes back as its text, up to the
    // first zero byte: the tag's first byte.
    RecordBytes bad;
    bad.u32(documentTag(23)).append(savedBytes(OrvaneParams())).u32(tag(2));  // frame data of an unknown version
    EXPECT_EQ(u"\u0001", file.getXml(dir.write("bad.orvopt", bad.bytes())));
    // A record longer than a block gives a file of whole blocks, and the
    // document of the reloaded file is that of the saved options.
    AllOptions big;
    big.output_img_file = std::u16string(2047, u'x');
    big.caustics_file = std::u16string(2047, u'y');
    ASSERT_TRUE(file.save(big, dir.file("big.luopt")));
    EXPECT_EQ(8192u, std::filesystem::file_size(dir.path / "big.luopt"));
    EXPECT_EQ(wideToUtf8(documentXml(big)), wideToUtf8(file.getXml(dir.file("big.luopt"))));
}
