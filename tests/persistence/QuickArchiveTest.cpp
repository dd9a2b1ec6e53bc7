#include <gtest/gtest.h>

#include <cstring>
#include <sstream>
#include <string>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"

using namespace OrvaneLumoCore;

namespace {

std::string bytesOf(QuickArchive& ar) {
    std::string out;
    const std::uint64_t end = ar.getWritePosition();
    ar.setReadPosition(0);
    for (std::uint64_t i = 0; i < end; ++i) {
        std::uint8_t b = 0;
        ar.readByte(b);
        out.push_back(static_cast<char>(b));
    }
    ar.setReadPosition(0);
    return out;
}

TEST(QuickArchive, BlocksGrowOnlyWhenAByteNeedsThem) {
    QuickArchive ar(static_cast<std::size_t>(1));
    for (int i = 0; i < 4096; ++i) ar.writeByte(static_cast<std::uint8_t>(i));
    EXPECT_EQ(ar.getBlockCount(), 1u);
    ar.writeByte(static_cast<std::uint8_t>(7));
    EXPECT_EQ(ar.getBlockCount(), 2u);
}

TEST(QuickArchive, ValuesCrossBlockBorders) {
    QuickArchive ar(static_cast<std::size_t>(1));
    for (int i = 0; i < 4094; ++i) ar.writeByte(static_cast<std::uint8_t>(0));
    ar.writeUInt(0xAABBCCDDu);
    EXPECT_EQ(static_cast<unsigned char>((*ar.getBlock(0))[4094]), 0xDD);
    EXPECT_EQ(static_cast<unsigned char>((*ar.getBlock(1))[1]), 0xAA);
    ar.writeDouble(-1.25);
    ar.writeWString(u"\u00E9t\u00E9");
    ar.writeTransform(Transform(Matrix(Vector(1, 2, 3), Vector(4, 5, 6), Vector(7, 8, 9)),
                                Vector(10, 11, 12)));
    ar.setReadPosition(4094);
    std::uint32_t u = 0;
    double d = 0;
    std::u16string s;
    Transform t;
    ar.readUInt(u);
    ar.readDouble(d);
    ar.readWString(s);
    ar.readTransform(t);
    EXPECT_EQ(u, 0xAABBCCDDu);
    EXPECT_EQ(d, -1.25);
    EXPECT_EQ(s, u"\u00E9t\u00E9");
    EXPECT_EQ(t.m[2].z, 9);
    EXPECT_EQ(t.offs.y, 11);
}

TEST(QuickArchive, ReadsBehindTheEndLeaveTheDestinationAlone) {
    QuickArchive empty(nullptr, 0);
    EXPECT_EQ(empty.getBlockCount(), 0u);
    std::uint8_t b = 9;
    EXPECT_FALSE(empty.readByte(b));
    EXPECT_EQ(b, 9);
    std::int32_t i = 77;
    float f = 2.5f;
    std::u16string s = u"keep";
    empty.readInt(i);
    empty.readFloat(f);
    empty.readWString(s);
    EXPECT_EQ(i, 77);
    EXPECT_EQ(f, 2.5f);
    EXPECT_EQ(s, u"");  // a length that was never there counts as 0
    EXPECT_EQ(empty.getReadPosition(), 13u);
}

TEST(QuickArchive, TextEncodings) {
    QuickArchive ar(static_cast<std::size_t>(1));
    ar.writeWString(u"");
    ar.writeWString(u"\u00E9");
    EXPECT_EQ(bytesOf(ar), std::string("\0\0\0\0\x02\0\0\0\xC3\xA9", 10));

    // Invalid UTF-8 reads through the ANSI code page.
    const char latin[] = "\x01\0\0\0\xE9";
    QuickArchive a1(latin, 5);
    std::u16string s;
    a1.readWString(s);
    EXPECT_EQ(s, u"\u00E9");

    // An inner zero ends the text; the next value follows the whole length.
    const char inner[] = "\x03\0\0\0a\0b\x2A\0\0\0";
    QuickArchive a2(inner, 11);
    std::int32_t next = 0;
    a2.readWString(s);
    a2.readInt(next);
    EXPECT_EQ(s, u"a");
    EXPECT_EQ(next, 42);

    // A length far behind the end reads what exists and allocates no more.
    const char huge[] = "\xFF\xFF\xFF\x7F" "abc";
    QuickArchive a3(huge, 7);
    a3.readWString(s);
    EXPECT_EQ(s.substr(0, 3), u"abc");
    EXPECT_EQ(a3.getReadPosition(), 4u + 0x7FFFFFFFu);
}

TEST(QuickArchive, ReadBytesStrictAndLoose) {
    QuickArchive ar(static_cast<std::size_t>(1));
    ar.writeBytes("abcdef", 6);
    ar.writeInt(5);
    char buf[4] = {0, 0, 0, 0};
    EXPECT_EQ(ar.readBytes(buf, 4, true), 6u);
    EXPECT_EQ(ar.getReadPosition(), 0u);  // strict: back at the length field
    EXPECT_EQ(ar.readBytes(buf, 4, false), 6u);
    EXPECT_EQ(std::string(buf, 4), "abcd");
    std::int32_t after = 0;
    ar.readInt(after);
    EXPECT_EQ(after, 5);
}

TEST(QuickArchive, RectAndLength) {
    QuickArchive ar(static_cast<std::size_t>(1));
    Rect r;
    r.x0 = 1; r.y0 = 2; r.x1 = 11; r.y1 = 32;
    ar.writeRect(r);
    ar.writeLength(0x1234567890ULL);
    Rect back;
    back.reserved0 = 5;
    std::uint64_t n = 0xFFFFFFFF00000000ULL;
    ar.readRect(back);
    ar.readLength(n);
    EXPECT_EQ(back.width, 10);
    EXPECT_EQ(back.height, 30);
    EXPECT_EQ(back.reserved0, 0);
    EXPECT_EQ(n, 0x34567890ULL);
}

TEST(QuickArchive, BlockFileForm) {
    QuickArchive ar(static_cast<std::size_t>(1));
    for (int i = 0; i < 5000; ++i) ar.writeByte(static_cast<std::uint8_t>(i * 7));
    std::stringstream file;
    ASSERT_TRUE(ar.saveBlocks(file));
    EXPECT_EQ(file.str().size(), 4u + 2 * 4096);
    QuickArchive back(static_cast<std::size_t>(1));
    ASSERT_TRUE(back.loadBlocks(file));
    EXPECT_EQ(back.getReadPosition(), 0u);
    EXPECT_EQ(back.getWritePosition(), 0u);
    for (int i = 0; i < 5000; ++i) {
        std::uint8_t b = 0;
        ASSERT_TRUE(back.readByte(b));
        ASSERT_EQ(b, static_cast<std::uint8_t>(i * 7));
    }
    std::stringstream none(std::string("\0\0\0\0", 4));
    EXPECT_FALSE(back.loadBlocks(none));
    EXPECT_EQ(back.getBlockCount(), 0u);
    // A damaged count does not make blocks out of nothing.
    std::stringstream lie(std::string("\xFF\xFF\xFF\xFF" "abc", 7));
    EXPECT_TRUE(back.loadBlocks(lie));
    EXPECT_LE(back.getBlockCount(), 1u);
}

TEST(RecordHead, VersionTagsAndCounts) {
    const struct {
        std::uint32_t tag;
        int expected;
    } cases[] = {{0x10000, 1}, {0x40000, 4}, {0x20001, -1}, {0x50000, -1}, {0, -1}};
    for (const auto& c : cases) {
        QuickArchive ar(static_cast<std::size_t>(1));
        ar.writeUInt(c.tag);
        EXPECT_EQ(readVersion(ar, 1, 4), c.expected) << std::hex << c.tag;
    }
    QuickArchive ar(static_cast<std::size_t>(1));
    ar.writeUInt(100);
    ar.writeUInt(5000);
    std::uint64_t n = 0;
    EXPECT_TRUE(readCount(ar, n));   // 100 fits in the bytes of the block
    EXPECT_FALSE(readCount(ar, n));  // 5000 can't
}

}  // namespace
