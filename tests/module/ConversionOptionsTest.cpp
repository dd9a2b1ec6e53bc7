// The options of a conversion: well-formed XML and path rules change the text
// of a document only where they must, never the text road, and the outcome
// lists the paths that were rewritten.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "module/Outcome.h"
#include "support/TempFiles.h"

using namespace OrvaneLumoCore;

namespace {

std::u16string examplePath16(const char* name) { return tempfiles::wide(tempfiles::examplePath(name)); }

std::vector<std::u16string> lines(const std::u16string& text) {
    std::vector<std::u16string> out;
    for (std::size_t at = 0; at < text.size();) {
        std::size_t end = text.find(u'\n', at);
        if (end == std::u16string::npos) end = text.size();
        out.push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return out;
}

const char* const kExamples[] = {
    "materials_all_layers.orvmat",       "materials_folded_wrappers.orvmat",
    "materials_old_records_v1.lumat",    "materials_old_records_v2.orvmat",
    "materials_old_wrapper_records.orvmat", "materials_top_level_kinds.orvmat",
    "materials_wrapped_trees.orvmat",    "textures_procedural.orvmat",
    "textures_procedural_old.orvmat",    "textures_sky_document_sun_1.orvmat",
    "textures_sky_document_sun_2.orvmat", "textures_sky_versions.orvmat",
    "render_settings.orvopt",            "old_settings_v4.luopt",
    "notes.luopt",                       "text_export.orvmat",
    "unknown_type.orvmat",
};

// No example holds a character that well-formed mode writes differently, so
// each gives the same bytes in both modes; and the text road, "<" and all,
// is never escaped.
TEST(ConversionOptions, ExamplesAreTheSameInBothModes) {
    std::size_t documents = 0;
    for (const char* name : kExamples) {
        SCOPED_TRACE(name);
        FileKind kind;
        ASSERT_TRUE(kindOfPath(examplePath16(name), kind));
        const ConversionOutcome plain = convertFile(examplePath16(name), kind);
        ConversionOptions options;
        EXPECT_TRUE(convertFile(examplePath16(name), kind, options).text == plain.text);
        options.wellFormed = true;
        const ConversionOutcome strict = convertFile(examplePath16(name), kind, options);
        EXPECT_EQ(strict.status, plain.status);
        EXPECT_EQ(strict.items, plain.items);
        EXPECT_TRUE(strict.text == plain.text);
        EXPECT_TRUE(strict.remapped.empty());
        documents += plain.status == FileStatus::Document;
    }
    EXPECT_EQ(documents, 14u);
}

// Only the values of the rewritten paths differ from the exact document, in
// either mode, and the outcome lists each path once, in document order.
TEST(ConversionOptions, PathRulesRewriteOnlyStoredPaths) {
    const std::u16string path = examplePath16("render_settings.orvopt");
    const std::u16string exact = convertFile(path, FileKind::Options).text;
    for (bool wellFormed : {false, true}) {
        SCOPED_TRACE(wellFormed ? "well-formed" : "long-standing");
        ConversionOptions options;
        options.wellFormed = wellFormed;
        options.pathRules = {{u"c:/RENDERS", u"/mnt/renders"}, {u"\\\\farm\\assets", u"/srv/farm/"}};
        const ConversionOutcome o = convertFile(path, FileKind::Options, options);
        ASSERT_EQ(o.status, FileStatus::Document);
        const std::vector<RemappedPath> expected = {
            {u"C:\\renders\\kitchen.vrmap", u"/mnt/renders\\kitchen.vrmap"},
            {u"C:\\renders\\kitchen & hall.png", u"/mnt/renders\\kitchen & hall.png"},
            {u"\\\\farm\\assets", u"/srv/farm/"},
        };
        EXPECT_TRUE(o.remapped == expected);

        const std::vector<std::u16string> before = lines(exact), after = lines(o.text);
        ASSERT_EQ(before.size(), after.size());
        std::vector<std::u16string> changed;
        for (std::size_t i = 0; i < before.size(); ++i)
            if (before[i] != after[i]) changed.push_back(after[i]);
        const std::u16string indent(14, u' ');
        const std::vector<std::u16string> values = {
            indent + u"<value>/mnt/renders\\kitchen.vrmap</value>",
            indent + u"<value>/mnt/renders\\kitchen &amp; hall.png</value>",
            indent + u"<value>/srv/farm/</value>",
        };
        EXPECT_TRUE(changed == values);
    }
}

TEST(ConversionOptions, RelativeMaterialPathsAndNoRuleThatMatches) {
    const std::u16string path = examplePath16("materials_all_layers.orvmat");
    const std::u16string exact = convertFile(path, FileKind::Materials).text;
    ConversionOptions options;
    options.pathRules = {{u"TEXTURES", u"C:\\tex\\"}};
    const ConversionOutcome o = convertFile(path, FileKind::Materials, options);
    ASSERT_EQ(o.remapped.size(), 1u);
    EXPECT_TRUE(o.remapped[0].from == u"textures/wood.png");
    EXPECT_TRUE(o.remapped[0].to == u"C:\\tex\\wood.png");
    std::u16string expected = exact;
    const std::u16string old = u"<value>textures/wood.png</value>";
    ASSERT_NE(expected.find(old), std::u16string::npos);
    for (std::size_t at; (at = expected.find(old)) != std::u16string::npos;)
        expected.replace(at, old.size(), u"<value>C:\\tex\\wood.png</value>");
    EXPECT_TRUE(o.text == expected);

    options.pathRules = {{u"textures/wood", u"X:"}, {u"C:\\maps", u"X:"}};
    const ConversionOutcome none = convertFile(path, FileKind::Materials, options);
    EXPECT_TRUE(none.remapped.empty());
    EXPECT_TRUE(none.text == exact);
}

// The text road is the file's text whatever the options say.
TEST(ConversionOptions, TextRoadIsNeverRewritten) {
    tempfiles::TempDir dir;
    const std::string file = dir.file("export.orvmat");
    const std::string text = "C:\\maps\\wood.png & <a \"b\">\x01\n";
    ASSERT_TRUE(tempfiles::writeFile(file, text));
    ConversionOptions options;
    options.wellFormed = true;
    options.pathRules = {{u"C:\\maps", u"X:"}};
    const ConversionOutcome o = convertFile(tempfiles::wide(file), FileKind::Materials, options);
    EXPECT_EQ(o.status, FileStatus::Text);
    EXPECT_TRUE(o.text == utf8ToWide(text));
    EXPECT_TRUE(o.remapped.empty());
}

}  // namespace
