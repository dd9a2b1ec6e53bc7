// Rewriting the beginnings of stored file paths: the rules as Windows compares
// paths, whole steps only, the first rule that matches; and the writer that
// applies them to the file names of a document.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "persistence/QuickArchive.h"
#include "xml/AssetXmlWriter.h"
#include "xml/PathRemap.h"

using namespace OrvaneLumoCore;

namespace {

std::string utf8(const std::u16string& s) { return wideToUtf8(s); }

// The rewritten path, or "-" when no rule matches.
std::string remapped(const PathRules& rules, const std::u16string& path) {
    std::u16string out = u"untouched";
    if (!remapPath(rules, path, out)) return out == u"untouched" ? "-" : "changed without a match";
    return utf8(out);
}

struct RemapCase {
    std::u16string path;
    const char* expected;  // "-": no rule matches
};

void checkAll(const PathRules& rules, const std::vector<RemapCase>& cases) {
    for (const RemapCase& c : cases) {
        SCOPED_TRACE(utf8(c.path));
        EXPECT_EQ(remapped(rules, c.path), c.expected);
    }
}

TEST(PathRemap, WholeStepsWithoutRegardToCaseOrSeparator) {
    checkAll({{u"C:\\Maps", u"D:\\textures"}},
             {
                 {u"C:\\Maps\\wood.png", "D:\\textures\\wood.png"},
                 {u"c:\\MAPS\\Wood.PNG", "D:\\textures\\Wood.PNG"},     // the rest keeps its case
                 {u"C:/maps/oak/bark.png", "D:\\textures/oak/bark.png"},  // and its separators
                 {u"c:/maps\\oak/bark.png", "D:\\textures\\oak/bark.png"},
                 {u"C:\\maps", "D:\\textures"},                        // the step itself
                 {u"C:\\maps\\", "D:\\textures\\"},
                 {u"C:\\maps\\\\double.png", "D:\\textures\\\\double.png"},
                 {u"C:\\maps2\\wood.png", "-"},                        // another step
                 {u"C:\\map", "-"},
                 {u"C:\\maps.png", "-"},
                 {u"D:\\C:\\maps\\wood.png", "-"},                      // only at the beginning
                 {u"textures\\C:\\maps", "-"},
                 {u"", "-"},
             });
    // Only ASCII letters fold: other letters compare as they are.
    checkAll({{u"C:\\\u00c9t\u00e9", u"E:"}},
             {{u"c:\\\u00c9t\u00e9\\a.png", "E:\\a.png"}, {u"C:\\\u00e9t\u00e9\\a.png", "-"}});
}

TEST(PathRemap, SeparatorsAtTheEndOfARule) {
    const struct {
        PathRule rule;
        const char16_t* path;
        const char* expected;
    } cases[] = {
        // A separator at the end of the old beginning changes nothing.
        {{u"C:\\maps\\", u"D:\\tex"}, u"C:\\maps\\wood.png", "D:\\tex\\wood.png"},
        {{u"C:/maps//", u"D:\\tex"}, u"C:\\maps\\wood.png", "D:\\tex\\wood.png"},
        {{u"C:\\maps\\", u"D:\\tex"}, u"C:\\maps2\\wood.png", "-"},
        {{u"C:\\maps\\", u"D:\\tex"}, u"C:\\maps", "D:\\tex"},
        // A new beginning that ends in a separator takes the rest's first one.
        {{u"C:\\maps", u"/mnt/tex/"}, u"C:\\maps\\wood.png", "/mnt/tex/wood.png"},
        {{u"C:\\maps\\", u"/mnt/tex/"}, u"C:\\maps\\oak\\bark.png", "/mnt/tex/oak\\bark.png"},
        {{u"C:\\maps", u"/mnt/tex/"}, u"C:\\maps", "/mnt/tex/"},
        // An empty new beginning leaves the rest.
        {{u"C:\\maps", u""}, u"C:\\maps\\wood.png", "\\wood.png"},
        // A rule of separators only: every path that starts with one.
        {{u"/", u"X:"}, u"/home/maps/wood.png", "X:/home/maps/wood.png"},
        {{u"/", u"X:"}, u"home/wood.png", "-"},
        // An empty old beginning matches nothing.
        {{u"", u"X:"}, u"C:\\maps\\wood.png", "-"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(utf8(c.rule.from) + " -> " + utf8(c.rule.to));
        checkAll({c.rule}, {{c.path, c.expected}});
    }
}

TEST(PathRemap, UncPaths) {
    checkAll({{u"\\\\Farm\\Assets", u"/srv/assets"}},
             {
                 {u"\\\\farm\\assets\\wood.png", "/srv/assets\\wood.png"},
                 {u"//FARM/ASSETS/wood.png", "/srv/assets/wood.png"},
                 {u"\\\\farm\\assets", "/srv/assets"},
                 {u"\\\\farm\\assets2\\wood.png", "-"},
                 {u"\\\\farm\\other\\wood.png", "-"},
                 {u"\\farm\\assets\\wood.png", "-"},  // a single leading separator: another path
             });
    checkAll({{u"\\\\farm", u"//nas"}}, {{u"\\\\farm\\assets\\x.png", "//nas\\assets\\x.png"}});
}

TEST(PathRemap, TheFirstMatchingRuleWins) {
    checkAll(
        {
            {u"C:\\maps\\wood", u"W:"},
            {u"C:\\maps", u"M:"},
            {u"c:\\MAPS\\wood\\oak", u"never"},  // covered by the first rule
            {u"C:\\", u"C-root:"},
        },
        {
            {u"C:\\maps\\wood\\oak\\bark.png", "W:\\oak\\bark.png"},
            {u"C:\\maps\\wood2\\oak.png", "M:\\wood2\\oak.png"},
            {u"C:\\maps\\stone.png", "M:\\stone.png"},
            {u"C:\\renders\\out.png", "C-root:\\renders\\out.png"},
            {u"D:\\maps\\stone.png", "-"},
        });
}

// The writer rewrites the file names of a document, and only those, and
// keeps each rewritten path once, in the order of its first appearance.
TEST(PathRemap, WriterRewritesFileNamesOnly) {
    XmlOptions options;
    options.pathRules = {{u"C:\\maps", u"D:\\new & tex"}, {u"textures", u"/srv/tex"}};
    const auto write = [](AssetXmlWriter& w) {
        w.writeFileName("file", u"c:\\MAPS\\wood.png");
        w.writeString("name", u"C:\\maps\\wood.png");  // a string, not a file name
        w.writeFileName("file", u"textures/wood.png");
        w.writeFileName("file", u"C:\\maps2\\wood.png");
        w.writeFileName("file", u"c:\\MAPS\\wood.png");
        w.openList("l", "plugin");
        w.writeListEntry(u"C:\\maps\\wood.png");
        w.closeList();
        w.writeFileName("file", u"C:/maps/a&amp;b.png");
    };
    std::u16string plain, rewritten, wellFormed;
    {
        AssetXmlWriter w(plain);
        write(w);
        EXPECT_TRUE(w.remappedPaths().empty());
    }
    AssetXmlWriter w(rewritten, options);
    write(w);
    const std::vector<RemappedPath> expected = {
        {u"c:\\MAPS\\wood.png", u"D:\\new & tex\\wood.png"},
        {u"textures/wood.png", u"/srv/tex/wood.png"},
        {u"C:/maps/a&amp;b.png", u"D:\\new & tex/a&amp;b.png"},
    };
    EXPECT_TRUE(w.remappedPaths() == expected);

    // The text is the plain one with the rewritten values in place, escaped
    // as file names are in each mode.
    std::u16string expectedText = plain;
    const auto replace = [&](const std::u16string& from, const std::u16string& to) {
        const std::u16string value = u"<value>" + from + u"</value>";
        for (std::size_t at = expectedText.find(value); at != std::u16string::npos;
             at = expectedText.find(value, at + 1))
            expectedText.replace(at, value.size(), u"<value>" + to + u"</value>");
    };
    replace(u"c:\\MAPS\\wood.png", u"D:\\new &amp; tex\\wood.png");
    replace(u"textures/wood.png", u"/srv/tex/wood.png");
    replace(u"C:/maps/a&amp;b.png", u"D:\\new &amp; tex/a&amp;b.png");
    EXPECT_EQ(utf8(rewritten), utf8(expectedText));

    options.wellFormed = true;
    AssetXmlWriter strict(wellFormed, options);
    write(strict);
    EXPECT_TRUE(strict.remappedPaths() == expected);
    replace(u"D:\\new &amp; tex/a&amp;b.png", u"D:\\new &amp; tex/a&amp;amp;b.png");
    EXPECT_EQ(utf8(wellFormed), utf8(expectedText));
}

}  // namespace
