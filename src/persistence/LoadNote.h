#pragma once
// Why a load failed. The loaders answer only true or false; besides that, the
// first place that refuses a file leaves a note: the byte where reading
// stopped, the record being read and the rule that refused it. The shared
// record helpers (persistence/Record.h) and the containers set it, so the
// classes' own load code knows nothing of it.
#include <cstdint>
#include <string>
#include <typeinfo>
#include <vector>

namespace platform {
class RegularFile;
}

namespace OrvaneLumoCore {

class QuickArchive;

enum class LoadRule : std::uint8_t {
    None,
    BadHeader,       // the container's header is refused
    UnknownTag,      // a type tag that its family has no class for
    VersionNotRead,  // a version tag that the record's class doesn't read
    CountTooLarge,   // a count larger than the bytes left
    NestingTooDeep,  // member records nested deeper than kMaxNestingDepth
    DataEndsEarly,   // reading went past the end of the data
    RecordRefused,   // a check of the record's own class
    NotRegularFile,
    CannotOpen,
    OutOfMemory,     // memory ran out while the file was converted
};

// A record being read: where it starts, the type tag it was read under, its
// class and the version that its tag gave.
struct RecordFrame {
    static constexpr std::int64_t kNoTag = -1;
    std::uint64_t start = 0;
    std::int64_t tag = kNoTag;             // none for a member of a fixed class
    const std::type_info* type = nullptr;  // null: the container's own bytes
    int version = -1;                      // -1 until a version tag is accepted
};

struct LoadNote {
    LoadRule rule = LoadRule::None;
    std::uint64_t offset = 0;   // the byte where reading stopped
    std::uint64_t reached = 0;  // the read position then, behind the refused value
    // The refused value: the header word, the type tag, the version tag, the
    // count or the nesting depth.
    std::uint64_t value = 0;
    // The member asked for: the family root that has no class for an unknown
    // tag, or the class of a member nested too deep.
    const std::type_info* member = nullptr;
    const char* detail = nullptr;  // a fixed text the container adds
    RecordFrame record;            // the record being read

    bool isSet() const { return rule != LoadRule::None; }
    // Sets rule, offset (and reached), value and detail unless a note is set
    // already.
    // Returns false, for `return note.fail(...)` in a loader.
    bool fail(LoadRule rule, std::uint64_t offset, std::uint64_t value = 0,
              const char* detail = nullptr);
};

// What an archive keeps while it is read: the note and the records open.
struct LoadTrace {
    LoadNote note;
    std::vector<RecordFrame> open;  // innermost last
};

// The rule in words, as the explanations use it ("unknown type tag").
const char* ruleText(LoadRule rule);
// A class's name without its namespace; "?" for null.
std::string className(const std::type_info* type);
// One line on a note: "record version not read at byte 24, reading
// Diffuse_BRDF (type tag 2): version tag 0x00070000".
std::string describe(const LoadNote& note);

// Notes a failure in the record being read, unless a note is set already. A
// read that went past the end of the data makes it DataEndsEarly at that end.
void noteFailure(QuickArchive& ar, LoadRule rule, std::uint64_t offset, std::uint64_t value = 0,
                 const std::type_info* member = nullptr);

// Opens `path` into `file` for a load. A path that can't be opened, or that
// names no regular file, replaces `note` with why (the system's error number
// as its value) and gives false; the file is then never read.
bool openForLoading(platform::RegularFile& file, const std::u16string& path, LoadNote& note);

// Keeps one record on the archive's list of open records while it is read.
class RecordScope {
public:
    RecordScope(QuickArchive& ar, const std::type_info& type, std::int64_t tag);
    ~RecordScope();
    RecordScope(const RecordScope&) = delete;
    RecordScope& operator=(const RecordScope&) = delete;
    // For a record whose load failed without a note: a record that read
    // nothing but its first four bytes refused them as its version tag;
    // anything else is a check of its own class.
    void noteRefusal();

private:
    QuickArchive& ar_;
};

}  // namespace OrvaneLumoCore
