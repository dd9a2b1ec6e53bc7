#pragma once
// Root of the material classes: a name, a UUID and the common interface.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

// Type tags of the material classes: the value of getType(), the tag in front
// of a material's record and the key of createMaterial.
enum MaterialTag : std::uint32_t {
    kMaterialSingleBRDF = 0,
    kMaterialLayeredBRDF = 1,
    kMaterialMulti = 2,
    kMaterialBump = 3,
    kMaterialInstance = 4,
    kMaterial2Sided = 5,
    kMaterialLinked = 6,
    kMaterialSkp2Sided = 7,
    kMaterialOverrideEnvironment = 8,
    kMaterialDisplaced = 9,
    kMaterialObjectExclusion = 10,
    kMaterialAlphaContribution = 11,
    kMaterialAngleBlend = 12,
    kMaterialReference = 13,
    kMaterialToon = 14,
    kMaterialTagCount = 15
};

// The name every new material starts from.
extern const char16_t kDefaultMaterialName[];

// getUniqueName of the scene table.
std::u16string uniqueMaterialName(const std::u16string& candidate);

class BaseMaterial : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    BaseMaterial();
    ~BaseMaterial() override;

    // The base record (version head, name, uuid).
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;

    virtual std::uint32_t getType() const = 0;
    // Back to the class's defaults. The base part takes a fresh unique
    // "DefaultMaterial" name from the scene table and clears the uuid.
    virtual void reset() = 0;
    // Copy under a new unique name; the uuid stays behind.
    virtual boost::shared_ptr<BaseMaterial> duplicate() const = 0;
    // Copy that keeps the name; the uuid stays behind.
    virtual boost::shared_ptr<BaseMaterial> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<BaseMaterial>& other) const = 0;

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override;
    std::u16string getAssetType() const override;
    // A material is referred to by its name.
    const std::u16string* referenceName(std::u16string&) const override { return &name; }

    std::u16string name;
    std::u16string uuid;

protected:
    BaseMaterial(const BaseMaterial&) = default;
    BaseMaterial& operator=(const BaseMaterial&) = default;

    // The name as old records hold it, a bare wstring in place of the base
    // record. With `defaultWhenEmpty` an empty name becomes a unique
    // "DefaultMaterial" name. Control characters stay: only the base record
    // removes them.
    void loadInlineName(QuickArchive& ar, bool defaultWhenEmpty = true);

    // A plain copy of `source` for duplicate() and clone(): the uuid stays
    // behind, and with `newName` the copy takes getUniqueName of the name.
    // The caller then replaces the children that are not to be shared.
    template <class T>
    static boost::shared_ptr<T> copyOf(const T& source, bool newName) {
        boost::shared_ptr<T> copy(new T(source));
        copy->uuid.clear();
        if (newName) copy->name = uniqueMaterialName(source.name);
        return copy;
    }
};

typedef boost::shared_ptr<BaseMaterial> MaterialPtr;

// New default material for tags 0 to 14, null otherwise.
MaterialPtr createMaterial(std::uint32_t tag);

}  // namespace OrvaneLumoCore
