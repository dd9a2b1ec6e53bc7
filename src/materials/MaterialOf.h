#pragma once
// Base of a material class: the family's operations (persistence/FamilyOf.h)
// and the two copies of a material. duplicate() copies under a new unique
// name, clone() keeps the name; the uuid stays behind in both. A class with
// children gives
//
//   void copyChildren(bool newName);  // on the fresh copy: replace the children
//                                     // that are not to be shared
//
// and, like every family class, `sameContent` and its own `reset` (the base
// part of a material keeps its name and uuid over a reset).
#include <cstdint>
#include <type_traits>
#include <utility>

#include "materials/BaseMaterial.h"
#include "persistence/FamilyOf.h"

namespace OrvaneLumoCore {

template <class T, class = void>
struct HasCopyChildren : std::false_type {};
template <class T>
struct HasCopyChildren<T, decltype(std::declval<T&>().copyChildren(true))> : std::true_type {};

template <class Derived, std::uint32_t Tag>
class MaterialOf : public FamilyOf<Derived, Tag, BaseMaterial> {
public:
    MaterialPtr duplicate() const override { return copy(true); }
    MaterialPtr clone() const override { return copy(false); }

private:
    MaterialPtr copy(bool newName) const {
        boost::shared_ptr<Derived> c = BaseMaterial::copyOf(static_cast<const Derived&>(*this), newName);
        if constexpr (HasCopyChildren<Derived>::value) c->copyChildren(newName);
        return c;
    }
};

}  // namespace OrvaneLumoCore
