// The conversion with its outcome: the same text as the module's drivers,
// whatever was converted before, and the reason for the text road.
#include <gtest/gtest.h>

#include <string>

#include "lights/SunIesDome.h"
#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "module/Outcome.h"
#include "persistence/QuickArchive.h"
#include "support/TempFiles.h"

using namespace OrvaneLumoCore;
using tempfiles::TempDir;

namespace {

std::u16string example(const char* name) { return tempfiles::wide(tempfiles::examplePath(name)); }

// What the module returns for the path in a fresh process.
std::u16string moduleText(const std::u16string& path, FileKind kind) {
    resetDocumentSun();
    return kind == FileKind::Materials ? OrvMatFile().getXml(path) : OrvOptFile().getXml(path);
}

TEST(Outcome, TextIsTheModulesForEveryExample) {
    const struct {
        const char* name;
        FileStatus status;
        const char* line;
    } examples[] = {
        {"materials_folded_wrappers.orvmat", FileStatus::Document, "document, 3 materials, 4108 bytes"},
        {"materials_old_records_v1.lumat", FileStatus::Document, "document, 2 materials, 407 bytes"},
        {"textures_sky_document_sun_2.orvmat", FileStatus::Document, "document, 1 material, 4108 bytes"},
        {"render_settings.orvopt", FileStatus::Document, "document, 22 blocks, 4096 bytes"},
        {"unknown_type.orvmat", FileStatus::Text,
         "text: unknown type tag at byte 12: BaseMaterial tag 15 has no class"},
        {"notes.luopt", FileStatus::Text,
         "text: record version not read at byte 0, reading AllOptions from byte 0: version tag 0x646e6552"},
        {"text_export.orvmat", FileStatus::Text, nullptr},
        {"textures_sky_document_sun_1.orvmat", FileStatus::Document, nullptr},
        {"old_settings_v4.luopt", FileStatus::Document, nullptr},
        {"materials_all_layers.orvmat", FileStatus::Document, nullptr},
    };
    // Twice over, so that every file also comes after every other one.
    for (int round = 0; round < 2; ++round) {
        for (const auto& e : examples) {
            SCOPED_TRACE(e.name);
            FileKind kind;
            ASSERT_TRUE(kindOfPath(example(e.name), kind));
            const ConversionOutcome o = convertFile(example(e.name), kind);
            EXPECT_EQ(o.status, e.status);
            if (e.line) {
                EXPECT_EQ(explainOutcome(o, kind), e.line);
            }
            EXPECT_TRUE(o.text == moduleText(example(e.name), kind));
        }
    }
}

TEST(Outcome, DocumentSunStartsAfreshForEachFile) {
    // A version 3 sky replaces the document sun: without the reset, the
    // second file's text depends on the first.
    const std::u16string one = example("textures_sky_document_sun_1.orvmat");
    const std::u16string two = example("textures_sky_document_sun_2.orvmat");
    const std::u16string fresh = convertFile(two, FileKind::Materials).text;
    convertFile(one, FileKind::Materials);
    EXPECT_TRUE(convertFile(two, FileKind::Materials).text == fresh);

    resetDocumentSun();
    OrvMatFile().getXml(one);
    EXPECT_FALSE(OrvMatFile().getXml(two) == fresh);
    resetDocumentSun();
    EXPECT_TRUE(documentSun()->isEqual(boost::make_shared<SunLight>(u"Default", documentSunId)));
}

// Names far from any ANSI code page (Greek, CJK, a character beyond the
// 16-bit plane) reach the file: the path travels as UTF-16 to the system's
// wide calls on Windows, and as UTF-8 elsewhere.
TEST(Outcome, NamesOutsideTheAnsiCodePage) {
    TempDir dir;
    const std::u16string folder = tempfiles::wide(dir.file(""));
    for (const char* name : {"materials_folded_wrappers.orvmat", "render_settings.orvopt", "notes.luopt"}) {
        SCOPED_TRACE(name);
        const std::u16string copy = folder + u"\u03a9\u03bc\u03ad\u03b3\u03b1 \u6750\u6599 \U0001F600 " +
                                    tempfiles::wide(name);
        ASSERT_TRUE(std::filesystem::copy_file(tempfiles::examplePath(name), std::filesystem::path(copy)));
        FileKind kind;
        ASSERT_TRUE(kindOfPath(copy, kind));
        const ConversionOutcome o = convertFile(copy, kind), original = convertFile(example(name), kind);
        EXPECT_EQ(o.status, original.status);
        EXPECT_EQ(explainOutcome(o, kind), explainOutcome(original, kind));
        EXPECT_TRUE(o.text == original.text);
    }
}

TEST(Outcome, PathsThatAreNotReadAtAll) {
    TempDir dir;
    ASSERT_TRUE(std::filesystem::create_directory(dir.file("folder.orvmat")));
    const struct {
        std::string path;
        LoadRule rule;
        const char* line;
    } cases[] = {
        {dir.file("folder.orvmat"), LoadRule::NotRegularFile, "unreadable: not a regular file"},
        {dir.file("missing.orvopt"), LoadRule::CannotOpen,
         "unreadable: can't be opened: No such file or directory"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.path);
        const ConversionOutcome o = convertFile(utf8ToWide(c.path), FileKind::Options);
        EXPECT_EQ(o.status, FileStatus::Unreadable);
        EXPECT_EQ(o.note.rule, c.rule);
        EXPECT_TRUE(o.text.empty());
        EXPECT_EQ(explainOutcome(o, FileKind::Options), c.line);
    }
}

TEST(Outcome, ReadingIntoBlocksTheFileLacksIsDataEndingEarly) {
    // A version 3 file that announces two blocks and ends after 30 bytes of
    // the first: a single material whose record is cut short.
    std::string file("\0\0\3\0\1\0\0\0\2\0\0\0", 12);
    file += std::string("\0\0\0\0\0\0\2\0", 8) + std::string(10, '\0');
    TempDir dir;
    const std::string path = dir.file("cut.orvmat");
    ASSERT_TRUE(tempfiles::writeFile(path, file));
    const ConversionOutcome o = convertFile(utf8ToWide(path), FileKind::Materials);
    EXPECT_EQ(o.status, FileStatus::Text);
    EXPECT_EQ(o.note.rule, LoadRule::DataEndsEarly);
    EXPECT_EQ(o.note.offset, file.size());
    EXPECT_EQ(o.fileSize, file.size());
}

}  // namespace
