#pragma once
// Shared pieces of every record: the version head, counts, and the byte forms
// of members held by shared pointers.
#include <cstdint>
#include <initializer_list>

#include <boost/shared_ptr.hpp>

#include "persistence/QuickArchive.h"

namespace OrvaneLumoCore {

// ---- version head ------------------------------------------------------------

inline std::uint32_t versionTag(int version) { return static_cast<std::uint32_t>(version) << 16; }

inline void writeVersion(QuickArchive& ar, int version) { ar.writeUInt(versionTag(version)); }

// Reads a version tag. Returns the version if the low half is 0 and the
// version lies in [minVersion, maxVersion], else -1. A tag behind the end of
// the data reads as 0 and is refused unless 0 is accepted.
inline int readVersion(QuickArchive& ar, int minVersion, int maxVersion) {
    std::uint32_t tag = 0;
    ar.readUInt(tag);
    if ((tag & 0xFFFF) != 0) return -1;
    const int v = static_cast<int>(tag >> 16);
    return (v >= minVersion && v <= maxVersion) ? v : -1;
}

// ---- counts --------------------------------------------------------------------

// Reads an element count with readLength. Every element takes at least one
// byte, so a count larger than the bytes left in the archive can't be real:
// it comes from damaged data, and loading it would only spin or fill memory.
// Returns false for such a count.
inline bool readCount(QuickArchive& ar, std::uint64_t& count) {
    count = 0;
    ar.readLength(count);
    return count <= ar.bytesLeft();
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

// Loads a member's record one nesting level deeper.
template <class T>
bool loadNested(QuickArchive& ar, T& member) {
    NestingGuard guard(ar);
    return guard.ok() && member.load(ar);
}

// ---- members held by shared pointers ---------------------------------------------
//
// `create` is the family's factory: a tag without a class gives a null pointer
// and the load fails.

// Required member: tag, then the record.
template <class T, class Tag>
bool loadRequiredMember(QuickArchive& ar, boost::shared_ptr<T>& member,
                        boost::shared_ptr<T> (*create)(Tag)) {
    std::uint32_t tag = 0xFFFFFFFFu;
    ar.readUInt(tag);
    member = create(static_cast<Tag>(tag));
    if (!member) return false;
    return loadNested(ar, *member);
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
    std::uint32_t tagA = 0xFFFFFFFFu, tagB = 0xFFFFFFFFu;
    ar.readUInt(tagA);
    ar.readUInt(tagB);
    first = createFirst(static_cast<TagA>(tagA));
    second = createSecond(static_cast<TagB>(tagB));
    if (!first || !second) return false;
    return loadNested(ar, *first) && loadNested(ar, *second);
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
