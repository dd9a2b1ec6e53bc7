#pragma once
// Root of the material classes: a name, a UUID and the common interface.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

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

    std::u16string name;
    std::u16string uuid;
};

typedef boost::shared_ptr<BaseMaterial> MaterialPtr;

// New default material for tags 0 to 14, null otherwise.
MaterialPtr createMaterial(std::uint32_t tag);

}  // namespace OrvaneLumoCore
