#pragma once
// Shared pieces of every record: the version head, counts, and the byte forms
// of members held by shared pointers.
#include <cstdint>
#include <initializer_list>
#include <typeinfo>
#include <vector>

#include <boost/shared_ptr.hpp>

#include "persistence/QuickArchive.h"

namespace OrvaneLumoCore {

// ---- version head ------------------------------------------------------------

inline std::uint32_t versionTag(int version) { return static_cast<std::uint32_t>(version) << 16; }

inline void writeVersion(QuickArchive& ar, int version) { ar.writeUInt(versionTag(version)); }

// Reads a version tag. Returns the version if the low half is 0 and the
// version lies in [minVersion, maxVersion], else -1. A tag behind the end of
// the data reads as 0 and is refused unless 0 is accepted. A refused tag is
// noted on the archive; the first version accepted in a record is noted as
// the record's own.
inline int readVersion(QuickArchive& ar, int minVersion, int maxVersion) {
    const std::uint64_t at = ar.getReadPosition();
    std::uint32_t tag = 0;
    ar.readUInt(tag);
    const int v = static_cast<int>(tag >> 16);
    if ((tag & 0xFFFF) != 0 || v < minVersion || v > maxVersion) {
        noteFailure(ar, LoadRule::VersionNotRead, at, tag);
        return -1;
    }
    std::vector<RecordFrame>& open = ar.trace.open;
    if (!open.empty() && open.back().version < 0) open.back().version = v;
    return v;
}

// The head of a record whose load starts afresh: resets `obj`, then reads a
// version tag of 1 to `newest`. The version, or -1 for a refused tag.
template <class T>
int resetAndReadVersion(T& obj, QuickArchive& ar, int newest) {
    obj.reset();
    return readVersion(ar, 1, newest);
}

// ---- counts --------------------------------------------------------------------

// Reads an element count with readLength. Every element takes at least one
// byte, so a count larger than the bytes left in the archive can't be real:
// it comes from damaged data, and loading it would only spin or fill memory.
// Returns false for such a count.
inline bool readCount(QuickArchive& ar, std::uint64_t& count) {
    const std::uint64_t at = ar.getReadPosition();
    count = 0;
    ar.readLength(count);
    if (count <= ar.bytesLeft()) return true;
    noteFailure(ar, LoadRule::CountTooLarge, at, count);
    return false;
}

// ---- nesting -------------------------------------------------------------------

// Member records nest as deep as the object tree. No real file comes near
// this depth; a deeper nesting comes from damaged or hostile data and would
// otherwise overflow the stack.
constexpr int kMaxNestingDepth = 256;

// Counts one level of nesting for the lifetime of the guard.
class NestingGuard {
public:
    explicit NestingGuard(QuickArchive& ar) : ar_(ar) { ++ar_.nestingDepth; }
    ~NestingGuard() { --ar_.nestingDepth; }
    NestingGuard(const NestingGuard&) = delete;
    NestingGuard& operator=(const NestingGuard&) = delete;
    bool ok() const { return ar_.nestingDepth <= kMaxNestingDepth; }

private:
    QuickArchive& ar_;
};

// Loads a record, with it on the archive's list of records being read; `tag`
// is the type tag it was read under, if any.
template <class T>
bool loadRecord(QuickArchive& ar, T& record, std::int64_t tag = RecordFrame::kNoTag) {
    RecordScope scope(ar, typeid(record), tag);
    if (record.load(ar)) return true;
    scope.noteRefusal();
    return false;
}

// Loads a member's record one nesting level deeper.
template <class T>
bool loadNested(QuickArchive& ar, T& member, std::int64_t tag = RecordFrame::kNoTag) {
    NestingGuard guard(ar);
    if (!guard.ok()) {
        noteFailure(ar, LoadRule::NestingTooDeep, ar.getReadPosition(),
                    static_cast<std::uint64_t>(ar.nestingDepth), &typeid(member));
        return false;
    }
    return loadRecord(ar, member, tag);
}

// Creates a member through its family's factory; a tag without a class is
// noted at `at`, where the tag stands.
template <class T, class Tag>
boost::shared_ptr<T> createMember(QuickArchive& ar, std::uint64_t at, std::uint32_t tag,
                                  boost::shared_ptr<T> (*create)(Tag)) {
    boost::shared_ptr<T> member = create(static_cast<Tag>(tag));
    if (!member) noteFailure(ar, LoadRule::UnknownTag, at, tag, &typeid(T));
    return member;
}

// ---- members held by shared pointers ---------------------------------------------
//
// `create` is the family's factory: a tag without a class gives a null pointer
// and the load fails.

// Required member: tag, then the record.
template <class T, class Tag>
bool loadRequiredMember(QuickArchive& ar, boost::shared_ptr<T>& member,
                        boost::shared_ptr<T> (*create)(Tag)) {
    const std::uint64_t at = ar.getReadPosition();
    std::uint32_t tag = 0xFFFFFFFFu;
    ar.readUInt(tag);
    member = createMember(ar, at, tag, create);
    if (!member) return false;
    return loadNested(ar, *member, tag);
}

// Writes tag and record; a missing member makes the save fail.
template <class T>
bool saveRequiredMember(QuickArchive& ar, const boost::shared_ptr<T>& member) {
    if (!member) return false;
    ar.writeUInt(static_cast<std::uint32_t>(member->getType()));
    return member->save(ar);
}

// Optional member: a bool8 "present", then tag and record if present. An
// absent member leaves the pointer null.
template <class T, class Tag>
bool loadOptionalMember(QuickArchive& ar, boost::shared_ptr<T>& member,
                        boost::shared_ptr<T> (*create)(Tag)) {
    bool present = false;
    ar.readByte(present);
    member.reset();
    if (!present) return true;
    return loadRequiredMember(ar, member, create);
}

template <class T>
bool saveOptionalMember(QuickArchive& ar, const boost::shared_ptr<T>& member) {
    ar.writeByte(static_cast<bool>(member));
    if (!member) return true;
    return saveRequiredMember(ar, member);
}

// Paired members: both tags first, then both records. Both must exist.
template <class A, class TagA, class B, class TagB>
bool loadPairedMembers(QuickArchive& ar, boost::shared_ptr<A>& first,
                       boost::shared_ptr<A> (*createFirst)(TagA), boost::shared_ptr<B>& second,
                       boost::shared_ptr<B> (*createSecond)(TagB)) {
    const std::uint64_t at = ar.getReadPosition();
    std::uint32_t tagA = 0xFFFFFFFFu, tagB = 0xFFFFFFFFu;
    ar.readUInt(tagA);
    ar.readUInt(tagB);
    first = createMember(ar, at, tagA, createFirst);
    second = createMember(ar, at + 4, tagB, createSecond);
    if (!first || !second) return false;
    return loadNested(ar, *first, tagA) && loadNested(ar, *second, tagB);
}

template <class A, class B>
bool savePairedMembers(QuickArchive& ar, const boost::shared_ptr<A>& first,
                       const boost::shared_ptr<B>& second) {
    if (!first || !second) return false;
    ar.writeUInt(static_cast<std::uint32_t>(first->getType()));
    ar.writeUInt(static_cast<std::uint32_t>(second->getType()));
    return first->save(ar) && second->save(ar);
}

// ---- copies and comparisons through the tree ------------------------------------

// Clone of a child that may be null.
template <class T>
boost::shared_ptr<T> cloneChild(const boost::shared_ptr<T>& child) {
    return child ? child->clone() : boost::shared_ptr<T>();
}

// Children agree if both are null, or both exist and compare equal.
template <class T>
bool childrenEqual(const boost::shared_ptr<T>& a, const boost::shared_ptr<T>& b) {
    if (!a || !b) return !a && !b;
    return a->isEqual(b);
}

}  // namespace OrvaneLumoCore
