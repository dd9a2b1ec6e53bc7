#pragma once
// The per-class operations of a model family, written once.
//
// Every family (textures, UVW generators, bitmaps, BRDF layers, lights, and
// materials through materials/MaterialOf.h) has a root with a type tag, a
// copy and a comparison of content. A class derives
// from FamilyOf<Class, Tag, Base>, where Base is the family's root or a base
// that a few classes of it share, and supplies its content:
//
//   bool sameContent(const Class& other) const;  // content equal; the tags already are
//   void finishClone();                          // optional: on a fresh copy, clone the
//                                                // children, draw new ids
//
// Either may come from Base. `reset` assigns a default-constructed object, so
// a class whose defaults are its member initialisers needs no reset of its
// own. A class that sets its defaults by hand overrides reset; its
// constructor then calls that reset (by its class name where it is a base's).
//
// A class whose record is one flat table derives from FlatFamilyOf instead and
// also gets save, load and the comparison from its table; its defaults are
// the table's, which its constructor sets.
#include <cstdint>
#include <type_traits>
#include <utility>

#include <boost/make_shared.hpp>

#include "persistence/FieldRows.h"

namespace OrvaneLumoCore {

template <class T, class = void>
struct HasFinishClone : std::false_type {};
template <class T>
struct HasFinishClone<T, decltype(std::declval<T&>().finishClone())> : std::true_type {};

template <class Derived, std::uint32_t Tag, class Base>
class FamilyOf : public Base {
public:
    // boost::shared_ptr of the family's root, as the root's clone returns it.
    using Ptr = decltype(std::declval<const Base&>().clone());

    static constexpr std::uint32_t kType = Tag;

    std::uint32_t getType() const override { return Tag; }
    void reset() override { static_cast<Derived&>(*this) = Derived(); }
    Ptr clone() const override {
        boost::shared_ptr<Derived> copy = boost::make_shared<Derived>(self());
        if constexpr (HasFinishClone<Derived>::value) copy->finishClone();
        return copy;
    }
    bool isEqual(const Ptr& other) const override {
        const Derived* o = sameClass(other);
        return o && self().sameContent(*o);
    }

protected:
    const Derived& self() const { return static_cast<const Derived&>(*this); }

    // `other` as a Derived, or null if it is null or of another class.
    const Derived* sameClass(const Ptr& other) const {
        if (!other || other->getType() != Tag) return nullptr;
        return static_cast<const Derived*>(other.get());
    }
};

// Base of a family class whose record is one flat table. The class gives
//
//   static RowSpan<RecordRow<Class>> record();  // the table, in record order
//   static constexpr int kRecordVersion = N;    // the version that save writes
//
// and gets save, load (from version 1) and the comparison from it. Its
// defaults are the table's: its constructor calls setTableDefaults(), and
// `reset` assigns a new object.
template <class Derived, std::uint32_t Tag, class Base>
class FlatFamilyOf : public FamilyOf<Derived, Tag, Base> {
public:
    bool save(QuickArchive& ar) const override {
        return saveFlatRecord(this->self(), ar, Derived::record(), Derived::kRecordVersion);
    }
    bool load(QuickArchive& ar) override {
        return loadFlatRecord(static_cast<Derived&>(*this), ar, Derived::record(), Derived::kRecordVersion) > 0;
    }
    bool sameContent(const Derived& o) const { return fieldsEqual(this->self(), o, Derived::record()); }

protected:
    void setTableDefaults() { resetFields(static_cast<Derived&>(*this), Derived::record()); }
};

// A family's factory: a new default object of the class among Classes whose
// type tag is `tag`, or null for a tag that none of them has.
template <class Root, class... Classes>
boost::shared_ptr<Root> createByTag(std::int64_t tag) {
    boost::shared_ptr<Root> made;
    ((tag == static_cast<std::int64_t>(Classes::kType) ? (made = boost::make_shared<Classes>(), true) : false) || ...);
    return made;
}

}  // namespace OrvaneLumoCore
