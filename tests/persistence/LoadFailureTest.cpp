// Why loads fail: hand-laid damaged files, one per rule, and the note that
// the load leaves on the container.
#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "module/OrvMatFile.h"
#include "options/AllOptions.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"

using namespace OrvaneLumoCore;

namespace {

// Little-endian bytes, laid by hand.
struct Bytes {
    std::string s;
    Bytes& u32(std::uint32_t v) {
        for (int i = 0; i < 4; ++i) s.push_back(static_cast<char>(v >> (8 * i)));
        return *this;
    }
    Bytes& raw(const std::string& more) {
        s += more;
        return *this;
    }
    Bytes& zeros(std::size_t n) { return raw(std::string(n, '\0')); }
};

Bytes header(std::uint32_t tag, std::uint32_t count) { return Bytes().u32(tag).u32(count); }

// Material and BRDF tags and record versions used below.
constexpr std::uint32_t kSingle = 0, kMulti = 2, kDiffuse = 2;
constexpr std::uint32_t kVersion2 = 0x20000;

// MaterialSingleBRDF version 2 up to its BRDF member's tag: tag, version,
// two i32 values.
Bytes singleHead(Bytes b) { return b.u32(kSingle).u32(kVersion2).u32(7).u32(8); }

// `levels` MaterialMulti records, each holding the next as its one member.
Bytes multiChain(Bytes b, int levels) {
    for (int i = 0; i < levels; ++i) b.u32(kMulti).u32(kVersion2).u32(1);
    return b;
}

struct Case {
    const char* what;
    std::string file;
    LoadRule rule;
    std::uint64_t offset;
    const char* recordClass;  // "" for the container's own bytes
    std::int64_t recordTag;
    int recordVersion;
    std::uint64_t value;
};

TEST(LoadFailure, MaterialFileNotesTheFirstRefusal) {
    const Case cases[] = {
        {"shorter than the header", "\3\0\0", LoadRule::BadHeader, 0, "", -1, -1, 0},
        {"no materials", header(0x30000, 0).zeros(8).s, LoadRule::BadHeader, 4, "", -1, -1, 0},
        {"low half set", header(0x20001, 1).zeros(8).s, LoadRule::BadHeader, 0, "", -1, -1, 0x20001},
        {"unknown container version", header(0x40000, 1).zeros(8).s, LoadRule::BadHeader, 0, "", -1, -1,
         0x40000},
        {"no blocks", header(0x30000, 1).u32(0).s, LoadRule::BadHeader, 8, "", -1, -1, 0},
        // Counts are checked against whole blocks of 4096 bytes.
        {"more materials than bytes", header(0x20000, 5000).zeros(16).s, LoadRule::CountTooLarge, 4, "",
         -1, -1, 5000},
        {"top-level tag without a class", header(0x20000, 1).u32(15).zeros(8).s, LoadRule::UnknownTag, 8,
         "", -1, -1, 15},
        // The single material's BRDF tag 3 is no BRDF class (their tags are bits).
        {"member tag without a class", singleHead(header(0x20000, 1)).u32(3).zeros(8).s,
         LoadRule::UnknownTag, 24, "MaterialSingleBRDF", kSingle, 2, 3},
        {"member version not read", singleHead(header(0x20000, 1)).u32(kDiffuse).u32(0x630000).zeros(8).s,
         LoadRule::VersionNotRead, 28, "Diffuse_BRDF", kDiffuse, -1, 0x630000},
        {"version tag with a low half", header(0x20000, 1).u32(kSingle).u32(0x20001).zeros(8).s,
         LoadRule::VersionNotRead, 12, "MaterialSingleBRDF", kSingle, -1, 0x20001},
        {"list count larger than the bytes left",
         header(0x20000, 1).u32(kMulti).u32(kVersion2).u32(5000).zeros(8).s, LoadRule::CountTooLarge,
         16, "MaterialMulti", kMulti, 2, 5000},
        // The top-level material is not nested; its members from 1 on are.
        {"nesting deeper than 256", multiChain(header(0x20000, 1), 258).zeros(16).s,
         LoadRule::NestingTooDeep, 8 + 258 * 12 - 8, "MaterialMulti", kMulti, 2, 257},
        {"data ends inside a record", singleHead(header(0x20000, 1)).s.substr(0, 18),
         LoadRule::DataEndsEarly, 18, "MaterialSingleBRDF", kSingle, 2, 0},
        // A version 1 bump material checks its base material's tag itself:
        // name, path, multiplier, then tag 99.
        {"a check of the class's own",
         header(0x20000, 1).u32(3).u32(0x10000).u32(0).u32(0).u32(0).u32(99).zeros(8).s,
         LoadRule::RecordRefused, 32, "MaterialBump", 3, 1, 0},
        // Version 1: the CR LF pairs of the file count once in the stream;
        // the offset is the file's.
        {"version 1 offsets count CR LF pairs",
         header(0x10000, 1).u32(kSingle).u32(kVersion2).raw("\r\n\r\n\r\n\r\n").u32(8).u32(3).zeros(8).s,
         LoadRule::UnknownTag, 28, "MaterialSingleBRDF", kSingle, 2, 3},
        {"version 3 offsets count the block count",
         header(0x30000, 1).u32(1).raw(singleHead(Bytes()).u32(3).s).zeros(4096 - 20).s,
         LoadRule::UnknownTag, 28, "MaterialSingleBRDF", kSingle, 2, 3},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        OrvMatFile file;
        std::istringstream in(c.file);
        ASSERT_FALSE(file.load(in));
        const LoadNote& note = file.loadNote;
        EXPECT_EQ(note.rule, c.rule) << describe(note);
        EXPECT_EQ(note.offset, c.offset) << describe(note);
        EXPECT_EQ(note.record.type ? className(note.record.type) : "", c.recordClass);
        EXPECT_EQ(note.record.tag, c.recordTag);
        EXPECT_EQ(note.record.version, c.recordVersion);
        if (c.rule != LoadRule::DataEndsEarly) {
            EXPECT_EQ(note.value, c.value);
        }
    }
}

TEST(LoadFailure, OptionsRecordNotesItsVersion) {
    // The options record reads its own tag: a refused one is seen as the
    // record failing after its first four bytes.
    const std::string bytes = Bytes().u32(0x7F0001).zeros(64).s;
    QuickArchive ar(bytes.data(), bytes.size());
    AllOptions options;
    ASSERT_FALSE(loadRecord(ar, options));
    const LoadNote& note = ar.trace.note;
    EXPECT_EQ(note.rule, LoadRule::VersionNotRead);
    EXPECT_EQ(note.offset, 0u);
    EXPECT_EQ(note.value, 0x7F0001u);
    EXPECT_EQ(className(note.record.type), "AllOptions");
    EXPECT_TRUE(ar.trace.open.empty());
}

TEST(LoadFailure, FirstNoteWinsAndLoadsThatPassLeaveNone) {
    const std::string bytes = header(0x20000, 1).u32(15).s;
    QuickArchive ar(bytes.data(), bytes.size());
    noteFailure(ar, LoadRule::CountTooLarge, 3, 9);
    noteFailure(ar, LoadRule::UnknownTag, 5, 15);
    EXPECT_EQ(ar.trace.note.rule, LoadRule::CountTooLarge);
    EXPECT_EQ(ar.trace.note.offset, 3u);

    OrvMatFile saved;
    saved.materials.push_back(createMaterial(kMulti));
    ASSERT_TRUE(saved.materials[0]);
    std::stringstream io;
    ASSERT_TRUE(saved.save(io));
    OrvMatFile loaded;
    ASSERT_TRUE(loaded.load(io));
    EXPECT_FALSE(loaded.loadNote.isSet());
}

TEST(LoadFailure, DescriptionsNameRecordAndValue) {
    LoadNote note;
    note.fail(LoadRule::VersionNotRead, 28, 0x630000);
    EXPECT_EQ(describe(note), "record version not read at byte 28: version tag 0x00630000");
    RecordFrame frame;
    frame.start = 12;
    frame.tag = 0;
    frame.version = 2;
    frame.type = &typeid(AllOptions);
    note.record = frame;
    EXPECT_EQ(describe(note),
              "record version not read at byte 28, reading AllOptions (type tag 0, version 2) from "
              "byte 12: version tag 0x00630000");
    LoadNote open;
    open.fail(LoadRule::CannotOpen, 0, ENOENT);
    EXPECT_EQ(describe(open), "can't be opened: No such file or directory");
}

}  // namespace
