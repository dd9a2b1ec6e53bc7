#include "materials/SceneMaterials.h"

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/NumberFormat.h"
#include "platform/Uuid.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {
const int kTableVersion = 2;
}  // namespace

boost::shared_ptr<SceneMaterials> SceneMaterials::instance() {
    static const boost::shared_ptr<SceneMaterials> table(new SceneMaterials);
    return table;
}

void SceneMaterials::clear() {
    materials.clear();
    uuids.clear();
}

bool SceneMaterials::addMaterial(const MaterialPtr& material) {
    if (!material || material->name.empty()) return false;
    if (!materials.insert(MaterialMap::value_type(material->name, material)).second) return false;
    // A UUID made here lives in the map only; the material keeps its own.
    const std::u16string id = material->uuid.empty() ? platform::newUuidString() : material->uuid;
    uuids.insert(UuidMap::value_type(id, material->name));
    return true;
}

bool SceneMaterials::replaceMaterial(const std::u16string& oldName, const MaterialPtr& material) {
    const std::u16string& newName = material->name;
    if (!platform::iequals(newName, oldName) && materials.count(newName)) return false;
    MaterialMap::iterator entry = materials.find(oldName);
    if (entry == materials.end()) return false;
    materials.erase(entry);
    materials.insert(MaterialMap::value_type(newName, material));
    if (newName != oldName) {
        for (UuidMap::iterator it = uuids.begin(); it != uuids.end(); ++it) {
            if (platform::iequals(it->second, oldName)) {
                it->second = newName;
                break;
            }
        }
    }
    return true;
}

bool SceneMaterials::removeMaterial(const std::u16string& name) {
    MaterialMap::iterator entry = materials.find(name);
    if (entry == materials.end()) return false;
    materials.erase(entry);
    for (UuidMap::iterator it = uuids.begin(); it != uuids.end(); ++it) {
        if (platform::iequals(it->second, name)) {
            uuids.erase(it);
            break;
        }
    }
    return true;
}

MaterialPtr SceneMaterials::getMaterial(const std::u16string& name) const {
    MaterialMap::const_iterator entry = materials.find(name);
    return entry == materials.end() ? MaterialPtr() : entry->second;
}

MaterialPtr SceneMaterials::getMaterialCopy(const std::u16string& name) const {
    const MaterialPtr material = getMaterial(name);
    return material ? material->duplicate() : MaterialPtr();
}

MaterialPtr SceneMaterials::getMaterialByUuid(const std::u16string& uuid) const {
    UuidMap::const_iterator entry = uuids.find(uuid);
    return entry == uuids.end() ? MaterialPtr() : getMaterial(entry->second);
}

std::u16string SceneMaterials::getUuid(const std::u16string& name) const {
    for (UuidMap::const_iterator it = uuids.begin(); it != uuids.end(); ++it) {
        if (platform::iequals(it->second, name)) return it->first;
    }
    return std::u16string();
}

void SceneMaterials::getMaterialNames(std::vector<std::u16string>& names) const {
    names.clear();
    for (MaterialMap::const_iterator it = materials.begin(); it != materials.end(); ++it) {
        names.push_back(it->first);
    }
}

bool SceneMaterials::isNameUnused(const std::u16string& name) const {
    return materials.find(name) == materials.end();
}

bool SceneMaterials::isNameValid(const std::u16string& name, std::u16string& message) const {
    if (!isNameUnused(name)) {
        message = u"The name, \"" + name + u"\", is already in use";
        return false;
    }
    if (name.empty()) {
        message = u"A name must have at least one character";
        return false;
    }
    message.clear();
    return true;
}

std::u16string SceneMaterials::getUniqueName(const std::u16string& candidate) const {
    std::size_t stemLength = candidate.size();
    while (stemLength > 0 && platform::isDigit(candidate[stemLength - 1])) --stemLength;
    const std::u16string stem = candidate.substr(0, stemLength);

    std::u16string name = stem;
    for (std::int64_t counter = 1; !isNameUnused(name); ++counter) {
        name = stem;
        platform::appendInt(name, counter);
    }
    // The free name is made fit for a url step; it is not looked up again.
    for (std::u16string::iterator c = name.begin(); c != name.end(); ++c) {
        if (*c == u' ') *c = u'_';
    }
    if (!name.empty() && platform::isDigit(name[0])) name.insert(name.begin(), u'a');
    return name;
}

std::u16string SceneMaterials::getDefaultMaterialName() { return u"Default_Lumo_Material"; }

void SceneMaterials::dump(std::u16string& out) const {
    for (MaterialMap::const_iterator it = materials.begin(); it != materials.end(); ++it) {
        out += it->first;
        out += u'\n';
    }
    out += u"Beginning UUIDs\n";
    for (UuidMap::const_iterator it = uuids.begin(); it != uuids.end(); ++it) {
        out += it->first;
        out += u' ';
        out += it->second;
        out += u'\n';
    }
}

void SceneMaterials::writeAllXml(AssetXmlWriter& writer) {
    for (MaterialMap::const_iterator it = materials.begin(); it != materials.end(); ++it) {
        it->second->writeXml(writer, std::u16string());
    }
}

bool SceneMaterials::save(QuickArchive& ar) const {
    writeVersion(ar, kTableVersion);
    ar.writeLength(materials.size());
    for (MaterialMap::const_iterator it = materials.begin(); it != materials.end(); ++it) {
        if (!saveRequiredMember(ar, it->second)) return false;
    }
    ar.writeLength(uuids.size());
    for (UuidMap::const_iterator it = uuids.begin(); it != uuids.end(); ++it) {
        ar.writeWString(it->first);
        ar.writeWString(it->second);
    }
    return true;
}

bool SceneMaterials::load(QuickArchive& ar) {
    clear();
    const int version = readVersion(ar, 1, kTableVersion);
    if (version < 0) return false;
    // Version 1 goes through addMaterial, which makes the UUID entries.
    if (!loadMaterials(ar, version == 1)) return false;
    if (version == 1) return true;

    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    for (std::uint64_t i = 0; i < count; ++i) {
        std::u16string id, name;
        ar.readWString(id);
        ar.readWString(name);
        uuids[id] = name;
    }
    return true;
}

bool SceneMaterials::loadMaterials(QuickArchive& ar, bool throughAdd) {
    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    for (std::uint64_t i = 0; i < count; ++i) {
        MaterialPtr material;
        if (!loadRequiredMember(ar, material, &createMaterial)) return false;
        if (throughAdd) {
            if (!addMaterial(material)) return false;
        } else {
            materials[material->name] = material;
        }
    }
    return true;
}

}  // namespace OrvaneLumoCore
