#pragma once
// The scene's table of materials: materials by name, and a second map from a
// UUID to a material's name. The table also owns the naming rules: every new
// material takes its default name from it. Both maps treat keys that differ
// only in case as one key.
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include <boost/shared_ptr.hpp>

#include "materials/BaseMaterial.h"
#include "persistence/Serializable.h"
#include "platform/WideChar.h"

class AssetXmlWriter;

namespace OrvaneLumoCore {

class SceneMaterials : public OrvaneSerializable {
public:
    typedef std::map<std::u16string, MaterialPtr, platform::CaseInsensitiveLess> MaterialMap;
    typedef std::map<std::u16string, std::u16string, platform::CaseInsensitiveLess> UuidMap;

    // The process-wide table, made at first use.
    static boost::shared_ptr<SceneMaterials> instance();

    SceneMaterials() = default;
    ~SceneMaterials() override = default;

    // Version 2: the materials in key order, then the UUID map.
    bool save(QuickArchive& ar) const override;
    // Empties the table first. What was read before a failure stays.
    bool load(QuickArchive& ar) override;
    // writeXml(writer, "") of every material in key order.
    virtual void writeAllXml(AssetXmlWriter& writer);

    void clear();

    // Refuses an empty pointer, an empty name and a name already in use. A
    // material without a uuid gets a new one in the UUID map only.
    bool addMaterial(const MaterialPtr& material);
    // Moves the entry `oldName` to the material's own name; the UUID entry
    // follows the new name. `material` must not be empty.
    bool replaceMaterial(const std::u16string& oldName, const MaterialPtr& material);
    bool removeMaterial(const std::u16string& name);

    MaterialPtr getMaterial(const std::u16string& name) const;
    // duplicate() of the entry, or empty.
    MaterialPtr getMaterialCopy(const std::u16string& name) const;
    MaterialPtr getMaterialByUuid(const std::u16string& uuid) const;
    // The first UUID in key order that maps to `name`; empty if there is none.
    std::u16string getUuid(const std::u16string& name) const;
    void getMaterialNames(std::vector<std::u16string>& names) const;

    bool isNameUnused(const std::u16string& name) const;
    // False with a message for a name in use or an empty name.
    bool isNameValid(const std::u16string& name, std::u16string& message) const;
    // The candidate without trailing digits, made unique by a counter, with
    // blanks turned into "_" and an "a" in front of a leading digit.
    std::u16string getUniqueName(const std::u16string& candidate) const;
    static std::u16string getDefaultMaterialName();

    // One line per material name, then "Beginning UUIDs" and one line per
    // UUID entry ("uuid name").
    void dump(std::u16string& out) const;

    const MaterialMap& getMaterials() const { return materials; }
    const UuidMap& getUuids() const { return uuids; }

private:
    bool loadMaterials(QuickArchive& ar, bool throughAdd);

    MaterialMap materials;
    UuidMap uuids;
};

}  // namespace OrvaneLumoCore
