#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "module/OrvMatFile.h"

using namespace OrvaneLumoCore;

namespace {

std::string containerHeader(std::uint32_t tag, std::uint32_t count) {
    std::string h(8, '\0');
    for (int i = 0; i < 4; ++i) {
        h[i] = static_cast<char>(tag >> (8 * i));
        h[4 + i] = static_cast<char>(count >> (8 * i));
    }
    return h;
}

TEST(OrvMatFile, RefusedHeaders) {
    const std::string body(64, '\0');
    const std::string files[] = {
        "",                             // nothing
        std::string("\0\0\3\0", 4),     // shorter than the header
        containerHeader(0x30000, 0) + body,      // no materials
        containerHeader(0x20001, 1) + body,      // low half set
        containerHeader(0x40000, 1) + body,      // unknown container version
        containerHeader(0x30000, 1) + std::string("\0\0\0\0", 4),  // no blocks
        containerHeader(0x20000, 1) + std::string("\x0F\0\0\0", 4) + body,  // type tag without a class
        containerHeader(0x20000, 1000) + body,   // more materials than bytes
    };
    for (const std::string& f : files) {
        OrvMatFile file;
        std::istringstream in(f);
        EXPECT_FALSE(file.load(in)) << f.size();
        EXPECT_EQ(file.getMaterialCount(), 0u);
    }
}

TEST(OrvMatFile, VersionOneUndoesTextMode) {
    EXPECT_EQ(undoTextMode("a\r\nb"), "a\nb");
    EXPECT_EQ(undoTextMode("\r\r\n"), "\r\n");
    EXPECT_EQ(undoTextMode("\r\n\r\n"), "\n\n");
    EXPECT_EQ(undoTextMode("\r \n\r"), "\r \n\r");
}

TEST(OrvMatFile, EmptyListIsNotSaved) {
    OrvMatFile file;
    std::ostringstream out;
    EXPECT_FALSE(file.save(out));
    EXPECT_TRUE(out.str().empty());
    MaterialPtr m;
    EXPECT_FALSE(file.getMaterial(0, m));
}

}  // namespace
