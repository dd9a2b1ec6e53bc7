// Files on Windows: what another program's handle allows, devices, and
// paths beyond the classic limit of 260 characters.
#include <gtest/gtest.h>

#include <string>

#include <windows.h>

#include "module/Outcome.h"
#include "platform/File.h"
#include "support/TempFiles.h"

using namespace tempfiles;

namespace {

std::wstring wideName(const std::string& path) {
    const std::u16string w = wide(path);
    return std::wstring(w.begin(), w.end());
}

// The "\\?\" form of an absolute path, which the wide calls take at any length.
std::wstring longForm(const std::string& path) {
    std::wstring w = L"\\\\?\\" + wideName(path);
    for (wchar_t& c : w)
        if (c == L'/') c = L'\\';
    return w;
}

std::string readAll(platform::RegularFile& file) {
    std::string bytes(static_cast<std::size_t>(file.size()), '\0');
    bytes.resize(file.readAt(0, &bytes[0], bytes.size()));
    return bytes;
}

// A handle that another program holds while the file is converted.
class OtherHandle {
public:
    OtherHandle(const std::string& path, DWORD access, DWORD share)
        : h_(CreateFileW(wideName(path).c_str(), access, share, nullptr, OPEN_EXISTING, 0, nullptr)) {}
    ~OtherHandle() {
        if (h_ != INVALID_HANDLE_VALUE) CloseHandle(h_);
    }
    bool held() const { return h_ != INVALID_HANDLE_VALUE; }

private:
    HANDLE h_;
};

TEST(RegularFileWindows, AFileHeldOpenElsewhereReadsUnlessItsHolderSharesNothing) {
    TempDir dir;
    const std::string path = dir.file("held.orvmat");
    ASSERT_TRUE(writeFile(path, "held text"));
    const struct {
        const char* what;
        DWORD access, share;
        bool opens;
    } cases[] = {
        {"written, sharing reads", GENERIC_WRITE, FILE_SHARE_READ, true},
        {"written, sharing reads and writes", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, true},
        {"read, sharing reads only", GENERIC_READ, FILE_SHARE_READ, true},
        {"read, sharing nothing", GENERIC_READ, 0, false},
        {"written, sharing writes only", GENERIC_WRITE, FILE_SHARE_WRITE, false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        OtherHandle other(path, c.access, c.share);
        ASSERT_TRUE(other.held());
        platform::RegularFile file;
        EXPECT_EQ(c.opens, file.open(wide(path)));
        if (c.opens) {
            EXPECT_EQ("held text", readAll(file));
        } else {
            EXPECT_FALSE(file.notRegular());
            EXPECT_EQ(EACCES, file.error());
        }
        // The text road reads through the same open.
        const OrvaneLumoCore::ConversionOutcome o =
            OrvaneLumoCore::convertFile(wide(path), OrvaneLumoCore::FileKind::Materials);
        EXPECT_EQ(c.opens ? u"held text" : u"", o.text);
    }
}

TEST(RegularFileWindows, DevicesAndFoldersAreNotRegularFiles) {
    TempDir dir;
    ASSERT_TRUE(CreateDirectoryW(wideName(dir.file("folder.orvmat")).c_str(), nullptr));
    for (const std::u16string& path : {std::u16string(u"NUL"), std::u16string(u"nul"), std::u16string(u"\\\\.\\NUL"),
                                       wide(dir.file("folder.orvmat"))}) {
        platform::RegularFile file;
        EXPECT_FALSE(file.open(path));
        EXPECT_TRUE(file.notRegular()) << std::string(path.begin(), path.end());
    }
    platform::RegularFile missing;
    EXPECT_FALSE(missing.open(wide(dir.file("missing.orvmat"))));
    EXPECT_FALSE(missing.notRegular());
    EXPECT_EQ(ENOENT, missing.error());
}

// A folder chain whose file path is about 400 characters: it opens, reads
// and converts by its plain path, with either kind of slash.
TEST(RegularFileWindows, PathsBeyond260Characters) {
    TempDir dir;
    std::string folder = dir.file("");
    folder.pop_back();
    const std::string step(60, 'd');
    for (int i = 0; i < 6; ++i) {
        folder += "/" + step + std::to_string(i);
        ASSERT_TRUE(CreateDirectoryW(longForm(folder).c_str(), nullptr) ||
                    GetLastError() == ERROR_ALREADY_EXISTS);
    }
    const std::string name = folder + "/render_settings.orvopt";
    ASSERT_GT(name.size(), 360u);
    ASSERT_TRUE(CopyFileW(wideName(examplePath("render_settings.orvopt")).c_str(),
                          longForm(name).c_str(), FALSE));
    std::string backslashed = name;
    for (char& c : backslashed)
        if (c == '/') c = '\\';
    const OrvaneLumoCore::ConversionOutcome original =
        OrvaneLumoCore::convertFile(wide(examplePath("render_settings.orvopt")), OrvaneLumoCore::FileKind::Options);
    ASSERT_EQ(OrvaneLumoCore::FileStatus::Document, original.status);
    for (const std::string& path : {name, backslashed}) {
        platform::RegularFile file;
        ASSERT_TRUE(file.open(wide(path))) << file.error();
        EXPECT_EQ(example("render_settings.orvopt"), readAll(file));
        const OrvaneLumoCore::ConversionOutcome o =
            OrvaneLumoCore::convertFile(wide(path), OrvaneLumoCore::FileKind::Options);
        EXPECT_EQ(o.status, OrvaneLumoCore::FileStatus::Document);
        EXPECT_TRUE(o.text == original.text);
    }
    // The chain goes by the long form too, deepest first.
    EXPECT_TRUE(DeleteFileW(longForm(name).c_str()));
    for (std::string at = folder; at.size() > dir.file("").size(); at.erase(at.rfind('/')))
        EXPECT_TRUE(RemoveDirectoryW(longForm(at).c_str())) << at.size();
}

}  // namespace
