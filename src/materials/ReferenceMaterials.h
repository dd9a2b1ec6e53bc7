#pragma once
// Materials that stand for a material living elsewhere:
// - MaterialReference points at a material of the scene table by UUID and
//   carries a copy of it, so that a library file stays readable without the
//   scene it came from;
// - MaterialInstance is a run-time alias of a material under its name;
// - MaterialLinked wraps a material together with the identifier of an
//   outside object.
// None of them writes XML: the asset conversion resolves them first.
#include <cstdint>
#include <string>

#include "materials/MaterialOf.h"

namespace OrvaneLumoCore {

class MaterialReference : public MaterialOf<MaterialReference, kMaterialReference> {
public:
    MaterialReference();

    // Takes the target afresh from the scene table by target_uuid (an empty
    // one if the table doesn't hold it) and embeds that copy.
    bool save(QuickArchive& ar) const override;
    // Does not reset first. Version 1 has no embedded copy.
    bool load(QuickArchive& ar) override;
    // BaseMaterial's reset, then no target.
    void reset() override;
    // Both give a reference with the same name and target_uuid and no target.
    MaterialPtr duplicate() const override;
    MaterialPtr clone() const override;
    // Same target_uuid (ignoring case), and the scene table's materials of
    // both UUIDs both absent or equal, compared from either side.
    bool sameContent(const MaterialReference& o) const;

    std::u16string target_uuid;
    // The embedded copy of the target; save replaces it.
    mutable MaterialPtr target;
};

class MaterialInstance : public MaterialOf<MaterialInstance, kMaterialInstance> {
public:
    MaterialInstance();
    // An alias of `material`: its name, and instance_of set to it.
    explicit MaterialInstance(const MaterialPtr& material);
    MaterialInstance& operator=(const MaterialPtr& material);

    // The base record alone: instance_of is not stored.
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    // A plain copy that shares instance_of and keeps the name, as clone().
    MaterialPtr duplicate() const override;
    // Always false, also with itself.
    bool sameContent(const MaterialInstance& o) const;

    MaterialPtr instance_of;
};

class MaterialLinked : public MaterialOf<MaterialLinked, kMaterialLinked> {
public:
    // The identifier of the outside object: a text (kinds 0 and 1) or a
    // number (kind 2). Any other kind is invalid and fails save and load.
    class IdData : public OrvaneSerializable {
    public:
        IdData() = default;
        bool save(QuickArchive& ar) const override;
        bool load(QuickArchive& ar) override;

        // `text` for kinds 0 and 1, else empty.
        std::u16string getText() const;
        // `number` for kind 2, else -1.
        std::int32_t getNumber() const;
        // Same kind, then the text ignoring case or the number.
        bool isEqual(const IdData& other) const;

        std::int32_t kind = 2;
        std::u16string text;
        std::int32_t number = 0;
    };

    MaterialLinked();

    // False, writing nothing, without linked_material.
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    // BaseMaterial's reset, then no material and id kind 2, number 0.
    void reset() override;
    bool sameContent(const MaterialLinked& o) const;

    MaterialPtr linked_material;
    IdData id;

    // linked_material by its own duplicate()/clone(); id by value.
    void copyChildren(bool newName);
};

}  // namespace OrvaneLumoCore
