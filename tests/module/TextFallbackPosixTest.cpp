// The text road on a large sparse file of a POSIX system: reading stops at
// the first zero byte, so memory follows the text, not the file.
#include <gtest/gtest.h>

#include <string>

#include "module/TextFallback.h"
#include "support/PosixFiles.h"

using namespace OrvaneLumoCore;
using namespace tempfiles;

namespace {

TEST(TextFallback, ALargeFileCostsItsText) {
    TempDir dir;
    const std::string path = dir.file("large.orvmat");
    ASSERT_TRUE(writeSparse(path, "short text", 1ull << 30));
    expectSmallChild([&] { return readFileAsText(wide(path)) == u"short text"; }, path);
}

}  // namespace
