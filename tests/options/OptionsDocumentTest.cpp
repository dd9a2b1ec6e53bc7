// The options document: the golden default document, the parameters with a
// translated value, the environment block and the file road.
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <vector>

#include <gtest/gtest.h>

#include "OptionBytes.h"
#include "persistence/OrvOptFile.h"
#include "textures/BasicTextures.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;
using namespace opttest;

namespace {

std::string readBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

std::u16string golden() {
    return utf8ToWide(readBytes(ORVXML_SOURCE_DIR "/tests/options/golden/default_options.xml"));
}

std::u16string documentXml(AllOptions& o) {
    std::u16string out;
    AssetXmlWriter w(out);
    w.openRoot(u"orvopt");
    o.writeXml(w, u"");
    w.closeRoot();
    return out;
}

// The Assets element that holds the asset with `url`.
std::u16string assetsOf(const std::u16string& doc, const std::u16string& url) {
    const std::size_t at = doc.find(u"url=\"" + url + u"\" >");
    if (at == std::u16string::npos) return std::u16string();
    const std::size_t begin = doc.rfind(u"  <Assets>\n", at);
    const std::size_t end = doc.find(u"  </Assets>\n", at) + 12;
    return doc.substr(begin, end - begin);
}

// The text of one parameter, from its head to its closing line.
std::u16string param(const std::u16string& block, const std::u16string& name) {
    const std::size_t at = block.find(u"name=\"" + name + u"\"");
    if (at == std::u16string::npos) return std::u16string();
    const std::size_t begin = block.rfind(u"<parameter ", at);
    const std::size_t end = block.find(u"</parameter>\n", at) + 13;
    return block.substr(begin, end - begin);
}

std::u16string inlineValue(const std::u16string& block, const std::u16string& name) {
    const std::u16string p = param(block, name);
    const std::size_t at = p.find(u"<value>");
    if (at == std::u16string::npos) return u"(none)";
    return p.substr(at + 7, p.find(u"</value>") - at - 7);
}

void expectSameLines(const std::u16string& expected, const std::u16string& actual) {
    std::istringstream e(wideToUtf8(expected)), a(wideToUtf8(actual));
    std::string le, la;
    for (int line = 1;; ++line) {
        const bool moreE = static_cast<bool>(std::getline(e, le));
        const bool moreA = static_cast<bool>(std::getline(a, la));
        if (!moreE && !moreA) break;
        ASSERT_EQ(moreE, moreA) << "documents differ in length at line " << line;
        ASSERT_EQ(le, la) << "line " << line;
    }
    EXPECT_EQ(expected, actual);
}

class TempDir {
public:
    TempDir() {
        path_ = std::filesystem::temp_directory_path() /
                ("opttest_" + std::to_string(reinterpret_cast<std::uintptr_t>(this)) + "_" +
                 std::to_string(std::rand()));
        std::filesystem::create_directories(path_);
    }
    ~TempDir() { std::filesystem::remove_all(path_); }
    std::u16string file(const std::string& name, const std::string& content = std::string()) {
        const std::string p = (path_ / name).string();
        if (!content.empty() || name.find("empty") != std::string::npos) {
            std::ofstream out(p, std::ios::binary);
            out << content;
        }
        return utf8ToWide(p);
    }

private:
    std::filesystem::path path_;
};

}  // namespace

TEST(OptionsDocument, DefaultOptionsGiveTheGoldenDocument) {
    TempDir dir;
    const std::u16string path = dir.file("default.orvopt");
    AllOptions defaults;
    OrvOptFile file;
    ASSERT_TRUE(file.save(defaults, path));
    expectSameLines(golden(), file.getXml(path));
}

namespace {

// Where each parameter of a block comes from, in the block's order: p, f, d
// and c name a row of the params, frame data, document and camera records;
// "!" marks an inverted flag; x is a setting that no record holds, t a
// texture reference, l the channel list.
const struct {
    const char16_t* block;
    const char* sources;
} kSources[] = {
    {u"SettingsImageSampler", "p2 p3 p4 p5 p6 p7 p8 p10 p9 p11 p13 p14"},
    {u"SettingsImageFilter", "p1 d11 d29"},
    {u"SettingsCamera", "p17 f19 f21 d24 f20 f22 d14"},
    {u"SettingsCameraDof", "d20! p18 f11 p20 f10 p21 p22 f12 p23 p19"},
    {u"SettingsMotionBlur", "p24 p25 p34 p35 p28 p38 p36"},
    {u"SettingsGI", "p39 p40 p41 p42 p43 p44 p45 p46 p47 p48 p51"},
    {u"SettingsIrradianceMap",
     "p52 p53 p54 p55 p56 x p57 p58 p59 p74 p75 p76 p77 p64 p61 p70 p62 p63 d38 p60 p65 p66 x "
     "p67 p71 p68 d39"},
    {u"SettingsPhotonMap",
     "p78 p80 p81 p82 p83 d42 p85 p79 p86 p87 p88 d43 p92 p84 p93 p90 p91 x p85"},
    {u"SettingsLightCache",
     "p95 p96 p97 p108 p98 p109 p110 p99 p100 p101 p102 p103 d40 p105 p106 d41 p112 p111 p113 x "
     "x x"},
    {u"SettingsCaustics", "p114 p116 p115 p118 p117 p119 d44 p120 p121 d45 x"},
    {u"SettingsRaycaster", "p124 p125 p126 p127 x"},
    {u"SettingsRegionsGenerator", "p128 p129 p130 p131 p132"},
    {u"SettingsDMCGI", "p49 p50"},
    {u"SettingsDMCSampler", "p134 p136 p137 p138 p139 p140"},
    {u"SettingsColorMapping", "d48 d49 d66 p141 p142 f46 f47 p145 p144 p143 x x x"},
    {u"SettingsRenderChannels", "d34 d32 d33 l"},
    {u"SettingsOptions",
     "p146 x p147 p149 p151 p148 p150 p160 p152 p153 p154 p155 p156 x p157 p158 p161 p159 x "
     "p162 p164 d21 d47 d46"},
    {u"SettingsDefaultDisplacement", "p165 p166 p167 p168 p169 p170 p171"},
    {u"SettingsEnvironment", "d10 d7 t d26 d9 d8 t d25 d59 d53 t d55 d60 d54 t d56"},
    {u"SettingsOutput",
     "d13 d12 d30 d31 d36 d18 d52 f30 f31 f32 f33 f36 f37 f38 f39 f40 f41 d37 d15 d50 d19 d51 "
     "d16 d17"},
    {u"CameraPhysical",
     "d22 c1 c2 c3 c4 c5 c6 c7 c8 c9 c10 c11 c12 c13 c14 c15 c16 c17 c18 c19 c20 c21 c22 c23 "
     "c24 c25 c26 c27 c28 d72 d23"},
    {u"SettingsDR", "d63 d68 d69 d70"},
};

// The parameters of a block, as (type, name, inline value or first number).
struct Shown {
    std::u16string type, name, value;
};
std::vector<Shown> parameters(const std::u16string& block) {
    std::vector<Shown> out;
    for (std::size_t at = block.find(u"<parameter type=\""); at != std::u16string::npos;
         at = block.find(u"<parameter type=\"", at + 1)) {
        Shown p;
        const std::size_t type = at + 17;
        p.type = block.substr(type, block.find(u'"', type) - type);
        const std::size_t name = block.find(u"name=\"", at) + 6;
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
std::u16string shownForRow(Holder h, char rowType, int row, const std::u16string& type, bool inverted) {
    if (rowType == 's') return utf8ToWide(textAt(h, row));
    const bool isFloat = rowType == 'f' || rowType == 'd' || rowType == 'c';
    const double laid = isFloat ? floatAt(h, row) : rowType == 'b' ? flagAt(h, row) : intAt(h, row);
    if (type == u"bool") return (laid != 0) != inverted ? u"1" : u"0";
    char text[32];
    std::snprintf(text, sizeof text, "%g", laid);
    return utf8ToWide(text);
}

// Checks each parameter of a document against the records it was loaded
// from: a row that the record's version holds shows the laid value, any
// other parameter its default.
void expectSources(const std::u16string& doc, int version, int paramsVersion) {
    const std::u16string gold = golden();
    for (const auto& b : kSources) {
        const std::vector<Shown> shown = parameters(assetsOf(doc, std::u16string(u"/") + b.block));
        const std::vector<Shown> byDefault = parameters(assetsOf(gold, std::u16string(u"/") + b.block));
        std::istringstream tokens(b.sources);
        std::string token;
        std::size_t k = 0;
        for (; tokens >> token; ++k) {
            ASSERT_LT(k, shown.size()) << wideToUtf8(b.block);
            const Shown& s = shown[k];
            const std::string where = wideToUtf8(b.block) + " " + wideToUtf8(s.name) + " (" + token +
                                      "), version " + std::to_string(version) + "/" +
                                      std::to_string(paramsVersion);
            ASSERT_EQ(byDefault[k].name, s.name) << where;
            const char kind = token[0];
            if (kind == 'x' || kind == 't' || kind == 'l') {
                if (kind == 'x') {
                    EXPECT_EQ(byDefault[k].value, s.value) << where;
                }
                continue;
            }
            const int row = std::atoi(token.c_str() + 1);
            const bool inverted = token.back() == '!';
            Holder h = kParams;
            char rowType = 0;
            bool present = true;
            switch (kind) {
            case 'p':
                rowType = kParamsRowTypes[row - 1];
                present = paramsRowInVersion(row, paramsVersion);
                break;
            case 'f': h = kFrame; rowType = kFrameRowTypes[row - 1]; break;
            case 'd':
                h = kDocument;
                rowType = kDocumentRowTypes[row - 1];
                present = version >= kDocumentRowSince[row - 1];
                break;
            case 'c':
                h = kCamera;
                rowType = kCameraV1RowTypes[row - 1];
                present = version >= 5;
                break;
            }
            std::u16string expected = byDefault[k].value;
            if (kind == 'p' && row == 140) expected = u"2";  // every load gives 2
            else if (present) expected = shownForRow(h, rowType, row, s.type, inverted);
            EXPECT_EQ(wideToUtf8(expected), wideToUtf8(s.value)) << where;
        }
        EXPECT_EQ(shown.size(), k) << "parameters of " << wideToUtf8(b.block);
    }
}

}  // namespace

TEST(OptionsDocument, EveryParameterShowsItsRecordField) {
    for (int version : {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 16, 17, 18, 19, 20, 21, 22, 23}) {
        AllOptions o;
        ASSERT_TRUE(loadFrom(o, documentRecord(version, {})));
        expectSources(documentXml(o), version, 5);
    }
    for (int paramsVersion = 1; paramsVersion <= 4; ++paramsVersion) {
        AllOptions o;
        ASSERT_TRUE(loadFrom(o, documentRecord(23, {}, paramsVersion)));
        expectSources(documentXml(o), 23, paramsVersion);
    }
}

TEST(OptionsDocument, FilterKernelsOneAndTwoChangePlaces) {
    const std::pair<std::int32_t, const char16_t*> kCases[] = {
        {0, u"0"}, {1, u"2"}, {2, u"1"}, {3, u"3"}, {5, u"5"}, {-1, u"-1"}};
    for (const auto& c : kCases) {
        AllOptions o;
        o.filterKernel = c.first;
        const std::u16string block = assetsOf(documentXml(o), u"/SettingsImageFilter");
        EXPECT_EQ(c.second, inlineValue(block, u"type")) << c.first;
    }
}

TEST(OptionsDocument, FlagsAndTheirTranslations) {
    struct Case {
        const char* what;
        void (*set)(AllOptions&);
        const char16_t* block;
        const char16_t* name;
        const char16_t* value;
    };
    const Case kCases[] = {
        {"focal distance from the camera: not overridden",
         [](AllOptions& o) { o.focalDistFromCamera = 1; }, u"/SettingsCameraDof",
         u"override_focal_dist", u"0"},
        {"focal distance not from the camera: overridden",
         [](AllOptions& o) { o.focalDistFromCamera = 0; }, u"/SettingsCameraDof",
         u"override_focal_dist", u"1"},
        {"file names are escaped",
         [](AllOptions& o) { o.output_img_file = u"C:\\a&b<c>.png"; }, u"/SettingsOutput",
         u"img_file", u"C:\\a&amp;b&lt;c&gt;.png"},
        {"the camera shows its key at time 0",
         [](AllOptions& o) {
             o.physicalCamera.focal_length.setValue(28, 0.0);
             o.physicalCamera.focal_length.setValue(90, 2.0);
         },
         u"/CameraPhysical", u"focal_length", u"28"},
        {"keys at 1 and 2 only leave the key at 0",
         [](AllOptions& o) {
             QuickArchive ar;
             AnimatedReal keys(true);
             keys.track.clear();
             keys.setValue(90, 1.0);
             keys.setValue(95, 2.0);
             keys.save(ar);
             o.physicalCamera.focal_length.load(ar);
         },
         u"/CameraPhysical", u"focal_length", u"0"},
    };
    for (const Case& c : kCases) {
        AllOptions o;
        c.set(o);
        EXPECT_EQ(c.value, inlineValue(assetsOf(documentXml(o), c.block), c.name)) << c.what;
    }
}

TEST(OptionsDocument, EnvironmentWithoutTextures) {
    AllOptions o;
    o.bgColorMult = 2;
    o.bgTextureMult = 3;
    o.refractColorMult = 6;
    o.refractTextureMult = 7;
    const std::u16string block = assetsOf(documentXml(o), u"/SettingsEnvironment");
    EXPECT_EQ(0u, block.find(u"  <Assets>\n    <Asset layout=\"\" renderer=\"lumo\" type=\"settings\" "
                             u"url=\"/SettingsEnvironment\" >\n"));
    EXPECT_EQ(u"2", inlineValue(block, u"bg_mult"));
    EXPECT_EQ(u"6", inlineValue(block, u"refract_mult"));
    for (const char16_t* tex : {u"bg_tex", u"gi_tex", u"reflect_tex", u"refract_tex"})
        EXPECT_EQ(u"(none)", inlineValue(block, tex)) << "an absent texture has no value";
}

TEST(OptionsDocument, EnvironmentWithAGiTexture) {
    AllOptions o;
    o.giTexture.reset(new AColorTexture(AColor(0.5f, 0.25f, 1, 1)));
    o.giColorMult = 2;
    o.giTextureMult = 3;
    o.bgColorMult = 4;
    o.bgTextureMult = 5;

    // The block of the default document, with the texture's Asset in front
    // of the block's own, the reference and the texture's multiplier.
    std::u16string expected = assetsOf(golden(), u"/SettingsEnvironment");
    const std::u16string textureAsset =
        u"    <Asset layout=\"\" renderer=\"lumo\" type=\"texture\" url=\"/SettingsEnvironment/gi_texture/TexAColor\" >\n"
        u"      <plugin>\n"
        u"        <lumoplugin name=\"TexAColor\" type=\"texture\">\n"
        u"          <parameters>\n"
        u"            <parameter type=\"acolor\" name=\"texture\" handler=\"default\" listType=\"none\" label=\"texture\">\n"
        u"              <value>\n"
        u"                <r>0.5</r>\n"
        u"                <g>0.25</g>\n"
        u"                <b>1</b>\n"
        u"                <a>1</a>\n"
        u"              </value>\n"
        u"            </parameter>\n"
        u"          </parameters>\n"
        u"        </lumoplugin>\n"
        u"      </plugin>\n"
        u"    </Asset>\n";
    expected.insert(std::u16string(u"  <Assets>\n").size(), textureAsset);
    const std::u16string emptyRef =
        u"<parameter type=\"plugin\" name=\"gi_tex\" handler=\"default\" listType=\"none\" label=\"gi_tex\">\n"
        u"            </parameter>\n";
    const std::u16string ref =
        u"<parameter type=\"plugin\" name=\"gi_tex\" handler=\"default\" listType=\"none\" label=\"gi_tex\">\n"
        u"              <value>/SettingsEnvironment/gi_texture/TexAColor</value>\n"
        u"            </parameter>\n";
    ASSERT_NE(std::u16string::npos, expected.find(emptyRef));
    expected.replace(expected.find(emptyRef), emptyRef.size(), ref);
    const std::u16string defaultMult = u"label=\"gi_mult\">\n              <value>1</value>";
    ASSERT_NE(std::u16string::npos, expected.find(defaultMult));
    expected.replace(expected.find(defaultMult), defaultMult.size(),
                     u"label=\"gi_mult\">\n              <value>3</value>");
    const std::u16string bgMult = u"label=\"bg_mult\">\n              <value>1</value>";
    expected.replace(expected.find(bgMult), bgMult.size(),
                     u"label=\"bg_mult\">\n              <value>4</value>");

    expectSameLines(expected, assetsOf(documentXml(o), u"/SettingsEnvironment"));
}

TEST(OptionsDocument, AllFourTexturesInTheirOrder) {
    AllOptions o;
    o.refractTexture.reset(new AColorTexture());
    o.bgTexture.reset(new InvertTexture());
    static_cast<InvertTexture&>(*o.bgTexture).texture.reset(new AColorTexture());
    o.reflectTexture.reset(new AColorTexture());
    o.giTexture.reset(new AColorTexture());
    const std::u16string block = assetsOf(documentXml(o), u"/SettingsEnvironment");
    const char16_t* const kUrls[] = {
        u"url=\"/SettingsEnvironment/bg_texture/TexInvert/base_texture/TexAColor\" >",
        u"url=\"/SettingsEnvironment/bg_texture/TexInvert\" >",
        u"url=\"/SettingsEnvironment/gi_texture/TexAColor\" >",
        u"url=\"/SettingsEnvironment/reflect_texture/TexAColor\" >",
        u"url=\"/SettingsEnvironment/refract_texture/TexAColor\" >",
        u"url=\"/SettingsEnvironment\" >",
        u"<value>/SettingsEnvironment/bg_texture/TexInvert</value>",
        u"<value>/SettingsEnvironment/refract_texture/TexAColor</value>",
    };
    std::size_t at = 0;
    for (const char16_t* url : kUrls) {
        const std::size_t found = block.find(url, at);
        ASSERT_NE(std::u16string::npos, found) << wideToUtf8(url);
        at = found;
    }
}

TEST(OptionsDocument, VersionZeroRecordShowsTheLaterDefaults) {
    // Version 0 as laid by hand: the three member records, no textures, the
    // fields of version 0 at their defaults, one channel 8 ("Normals"), ten
    // empty paths.
    RecordBytes b;
    b.u32(documentTag(0));
    b.append(savedBytes(OrvaneParams()));
    b.append(savedBytes(OrvaneFrameData()));
    b.append(savedBytes(OrvaneLFBStampInfo()));
    b.u8(0).u8(0);
    b.vec(0, 0, 0).vec(0.8f, 0.8980392f, 1);
    b.i32(0).i32(0).i32(5).i32(600).i32(800);
    for (int k = 0; k < 6; ++k) b.i32(0);
    b.f32(45).f32(1).f32(1).f32(1).f32(1).f32(1.5f).f32(1).f32(1.333f);
    b.u32(1).u32(8);
    for (int k = 0; k < 10; ++k) b.u32(0);

    TempDir dir;
    const std::u16string path = dir.file("old.luopt", std::string(b.bytes().begin(), b.bytes().end()));
    const std::u16string doc = OrvOptFile().getXml(path);
    const std::u16string gold = golden();
    // A bare OrvaneParams record: the four values in which a document differs
    // show those of the record.
    EXPECT_EQ(u"0", inlineValue(assetsOf(doc, u"/SettingsImageSampler"), u"type"));
    EXPECT_EQ(u"1e+018", inlineValue(assetsOf(doc, u"/SettingsCaustics"), u"search_distance"));
    // Everything newer than version 0 keeps its default.
    EXPECT_EQ(assetsOf(gold, u"/CameraPhysical"), assetsOf(doc, u"/CameraPhysical"));
    EXPECT_EQ(assetsOf(gold, u"/SettingsEnvironment"), assetsOf(doc, u"/SettingsEnvironment"));
    EXPECT_EQ(assetsOf(gold, u"/SettingsOutput"), assetsOf(doc, u"/SettingsOutput"));
    EXPECT_EQ(assetsOf(gold, u"/SettingsDR"), assetsOf(doc, u"/SettingsDR"));
    const std::u16string channels = param(assetsOf(doc, u"/SettingsRenderChannels"), u"channel_names");
    EXPECT_NE(std::u16string::npos,
              channels.find(u"<entry>RGB color</entry>\n                <entry>Alpha</entry>\n"
                            u"                <entry>Normals</entry>\n              </list>"));
}

TEST(OptionsDocument, FileRoad) {
    TempDir dir;
    OrvOptFile file;
    EXPECT_EQ(u"", file.getXml(dir.file("empty.orvopt", "")));
    EXPECT_EQ(u"", file.getXml(dir.file("missing.orvopt")));
    EXPECT_EQ(u"<a/>\n", file.getXml(dir.file("text.orvopt", "<a/>\n")));

    // A binary file that fails to load comes back as its text, up to the
    // first zero byte: the tag's first byte.
    RecordBytes bad;
    bad.u32(documentTag(23)).append(savedBytes(OrvaneParams()));
    bad.u32(0x00020000u);  // frame data of an unknown version
    EXPECT_EQ(u"\u0001", file.getXml(dir.file("bad.orvopt", std::string(bad.bytes().begin(), bad.bytes().end()))));

    // A record longer than a block gives a file of whole blocks, and the
    // document of the reloaded file is that of the saved options.
    AllOptions big;
    big.output_img_file = std::u16string(2047, u'x');
    big.caustics_file = std::u16string(2047, u'y');
    const std::u16string path = dir.file("big.luopt");
    ASSERT_TRUE(file.save(big, path));
    EXPECT_EQ(8192u, std::filesystem::file_size(wideToUtf8(path)));
    expectSameLines(documentXml(big), file.getXml(path));
}
