#include "persistence/LoadNote.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include <cxxabi.h>

#include "persistence/QuickArchive.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool LoadNote::fail(LoadRule rule_, std::uint64_t offset_, std::uint64_t value_, const char* detail_) {
    if (!isSet()) {
        rule = rule_;
        offset = offset_;
        reached = offset_;
        value = value_;
        detail = detail_;
    }
    return false;
}

const char* ruleText(LoadRule rule) {
    switch (rule) {
    case LoadRule::None: return "no failure";
    case LoadRule::BadHeader: return "bad header";
    case LoadRule::UnknownTag: return "unknown type tag";
    case LoadRule::VersionNotRead: return "record version not read";
    case LoadRule::CountTooLarge: return "count larger than the bytes left";
    case LoadRule::NestingTooDeep: return "nesting deeper than 256";
    case LoadRule::DataEndsEarly: return "data ends early";
    case LoadRule::RecordRefused: return "record refused by its class";
    case LoadRule::NotRegularFile: return "not a regular file";
    case LoadRule::CannotOpen: return "can't be opened";
    case LoadRule::OutOfMemory: return "out of memory";
    }
    return "?";
}

std::string className(const std::type_info* type) {
    if (!type) return "?";
    int status = 0;
    std::unique_ptr<char, void (*)(void*)> demangled(
        abi::__cxa_demangle(type->name(), nullptr, nullptr, &status), std::free);
    std::string name = status == 0 && demangled ? demangled.get() : type->name();
    const std::size_t colon = name.rfind("::");
    return colon == std::string::npos ? name : name.substr(colon + 2);
}

namespace {

std::string hex32(std::uint64_t v) {
    char buf[16];
    std::snprintf(buf, sizeof buf, "0x%08llx", static_cast<unsigned long long>(v & 0xFFFFFFFFu));
    return buf;
}

// ": <what was refused>" for the rules that refuse a value.
std::string refusedValue(const LoadNote& note) {
    const std::string v = std::to_string(note.value);
    switch (note.rule) {
    case LoadRule::BadHeader:
        return std::string(note.detail ? note.detail : "header") +
               (note.value ? " " + hex32(note.value) : std::string());
    case LoadRule::UnknownTag: return className(note.member) + " tag " + v + " has no class";
    case LoadRule::VersionNotRead: return "version tag " + hex32(note.value);
    case LoadRule::CountTooLarge: return "count " + v;
    case LoadRule::NestingTooDeep: return className(note.member) + " at depth " + v;
    case LoadRule::CannotOpen: return note.value ? std::strerror(static_cast<int>(note.value)) : "";
    default: return note.detail ? note.detail : "";
    }
}

}  // namespace

std::string describe(const LoadNote& note) {
    std::string line = ruleText(note.rule);
    if (note.rule == LoadRule::None || note.rule == LoadRule::NotRegularFile ||
        note.rule == LoadRule::OutOfMemory)
        return line;
    if (note.rule != LoadRule::CannotOpen) line += " at byte " + std::to_string(note.offset);
    if (note.record.type) {
        line += ", reading " + className(note.record.type);
        std::string about;
        if (note.record.tag != RecordFrame::kNoTag) about = "type tag " + std::to_string(note.record.tag);
        if (note.record.version >= 0)
            about += (about.empty() ? "" : ", ") + std::string("version ") +
                     std::to_string(note.record.version);
        if (!about.empty()) line += " (" + about + ")";
        line += " from byte " + std::to_string(note.record.start);
    }
    const std::string value = refusedValue(note);
    if (!value.empty()) line += ": " + value;
    return line;
}

void noteFailure(QuickArchive& ar, LoadRule rule, std::uint64_t offset, std::uint64_t value,
                 const std::type_info* member) {
    LoadNote& note = ar.trace.note;
    if (note.isSet()) return;
    const std::uint64_t end = ar.dataSize();
    if (ar.getReadPosition() > end) {
        rule = LoadRule::DataEndsEarly;
        offset = end;
    }
    note.fail(rule, offset, value);
    note.reached = ar.getReadPosition();
    note.member = member;
    if (!ar.trace.open.empty()) note.record = ar.trace.open.back();
}

RecordScope::RecordScope(QuickArchive& ar, const std::type_info& type, std::int64_t tag) : ar_(ar) {
    RecordFrame frame;
    frame.start = ar.getReadPosition();
    frame.tag = tag;
    frame.type = &type;
    ar.trace.open.push_back(frame);
}

RecordScope::~RecordScope() { ar_.trace.open.pop_back(); }

bool openForLoading(platform::RegularFile& file, const std::u16string& path, LoadNote& note) {
    if (file.open(path)) return true;
    note = LoadNote();
    return file.notRegular() ? note.fail(LoadRule::NotRegularFile, 0)
                             : note.fail(LoadRule::CannotOpen, 0, static_cast<std::uint64_t>(file.error()));
}

void RecordScope::noteRefusal() {
    if (ar_.trace.note.isSet()) return;
    const RecordFrame& frame = ar_.trace.open.back();
    const std::uint64_t at = ar_.getReadPosition();
    if (frame.version < 0 && at == frame.start + 4) {
        std::uint32_t tag = 0;
        ar_.setReadPosition(frame.start);
        ar_.readUInt(tag);
        noteFailure(ar_, LoadRule::VersionNotRead, frame.start, tag);
        return;
    }
    noteFailure(ar_, LoadRule::RecordRefused, at);
}

}  // namespace OrvaneLumoCore
