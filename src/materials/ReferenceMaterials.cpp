#include "materials/ReferenceMaterials.h"

#include <vector>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/MaterialMembers.h"
#include "materials/MaterialTree.h"
#include "materials/SceneMaterials.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

namespace {

const int kReferenceVersion = 2;
const int kInstanceVersion = 1;
const int kLinkedVersion = 1;
const int kIdDataVersion = 1;

// Comparisons of references go through the scene table, where a material may
// hold a reference to itself. Such a cycle makes the comparison fail instead
// of recursing without end.
class TableDepthGuard {
public:
    TableDepthGuard() { ++depth_; }
    ~TableDepthGuard() { --depth_; }
    TableDepthGuard(const TableDepthGuard&) = delete;
    TableDepthGuard& operator=(const TableDepthGuard&) = delete;
    bool ok() const { return depth_ <= kMaxNestingDepth; }

private:
    static int depth_;
};

int TableDepthGuard::depth_ = 0;

bool validIdKind(std::int32_t kind) { return kind >= 0 && kind <= 2; }

}  // namespace

// ---- MaterialReference -------------------------------------------------------------

MaterialReference::MaterialReference() { MaterialReference::reset(); }

void MaterialReference::reset() {
    BaseMaterial::reset();
    target_uuid.clear();
    target.reset();
}

bool MaterialReference::save(QuickArchive& ar) const {
    writeVersion(ar, kReferenceVersion);
    if (!BaseMaterial::save(ar)) return false;
    ar.writeWString(target_uuid);
    target = SceneMaterials::instance()->getMaterialByUuid(target_uuid);
    // A table material may embed a reference to itself; the depth count
    // turns that into a failed save.
    NestingGuard guard(ar);
    return guard.ok() && saveOptionalMember(ar, target);
}

// Version 1: base record, target_uuid.
// Version 2: as 1, then the embedded copy as optional member.
bool MaterialReference::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, kReferenceVersion);
    if (v < 0 || !BaseMaterial::load(ar)) return false;
    ar.readWString(target_uuid);
    if (v >= 2) return loadMaterialMember(ar, target);
    return true;
}

MaterialPtr MaterialReference::duplicate() const { return clone(); }

MaterialPtr MaterialReference::clone() const {
    boost::shared_ptr<MaterialReference> c = copyOf(*this, false);
    c->target.reset();
    return c;
}

bool MaterialReference::sameContent(const MaterialReference& o) const {
    if (!platform::iequals(target_uuid, o.target_uuid)) return false;
    TableDepthGuard guard;
    if (!guard.ok()) return false;
    const boost::shared_ptr<SceneMaterials> table = SceneMaterials::instance();
    const MaterialPtr mine = table->getMaterialByUuid(target_uuid);
    const MaterialPtr theirs = table->getMaterialByUuid(o.target_uuid);
    if (!mine || !theirs) return !mine && !theirs;
    return mine->isEqual(theirs) && theirs->isEqual(mine);
}

// ---- MaterialInstance ----------------------------------------------------------------

MaterialInstance::MaterialInstance() { MaterialInstance::reset(); }

MaterialInstance::MaterialInstance(const MaterialPtr& material) {
    MaterialInstance::reset();
    *this = material;
}

MaterialInstance& MaterialInstance::operator=(const MaterialPtr& material) {
    if (material) name = material->name;
    instance_of = material;
    return *this;
}

void MaterialInstance::reset() {
    BaseMaterial::reset();
    instance_of.reset();
}

bool MaterialInstance::save(QuickArchive& ar) const {
    writeVersion(ar, kInstanceVersion);
    return BaseMaterial::save(ar);
}

bool MaterialInstance::load(QuickArchive& ar) {
    return readVersion(ar, 1, kInstanceVersion) >= 0 && BaseMaterial::load(ar);
}

MaterialPtr MaterialInstance::duplicate() const { return clone(); }

bool MaterialInstance::sameContent(const MaterialInstance&) const { return false; }

// ---- MaterialLinked::IdData -------------------------------------------------------------

bool MaterialLinked::IdData::save(QuickArchive& ar) const {
    if (!validIdKind(kind)) return false;
    writeVersion(ar, kIdDataVersion);
    ar.writeUInt(static_cast<std::uint32_t>(kind));
    if (kind == 2)
        ar.writeInt(number);
    else
        ar.writeWString(text);
    return true;
}

bool MaterialLinked::IdData::load(QuickArchive& ar) {
    if (readVersion(ar, 1, kIdDataVersion) < 0) return false;
    std::uint32_t k = 0xFFFFFFFFu;
    ar.readUInt(k);
    kind = static_cast<std::int32_t>(k);
    if (!validIdKind(kind)) return false;
    if (kind == 2)
        ar.readInt(number);
    else
        ar.readWString(text);
    return true;
}

std::u16string MaterialLinked::IdData::getText() const {
    return kind == 0 || kind == 1 ? text : std::u16string();
}

std::int32_t MaterialLinked::IdData::getNumber() const { return kind == 2 ? number : -1; }

bool MaterialLinked::IdData::isEqual(const IdData& other) const {
    if (kind != other.kind) return false;
    if (kind == 0 || kind == 1) return platform::iequals(text, other.text);
    if (kind == 2) return number == other.number;
    return true;
}

// ---- MaterialLinked -----------------------------------------------------------------------

MaterialLinked::MaterialLinked() { MaterialLinked::reset(); }

void MaterialLinked::reset() {
    BaseMaterial::reset();
    linked_material.reset();
    id = IdData();
}

bool MaterialLinked::save(QuickArchive& ar) const {
    if (!linked_material) return false;
    writeVersion(ar, kLinkedVersion);
    return id.save(ar) && saveRequiredMember(ar, linked_material) && BaseMaterial::save(ar);
}

bool MaterialLinked::load(QuickArchive& ar) {
    if (resetAndReadVersion(*this, ar, kLinkedVersion) < 0) return false;
    return loadNested(ar, id) && loadBareMaterial(ar, linked_material) && BaseMaterial::load(ar);
}

void MaterialLinked::copyChildren(bool newName) {
    linked_material = copyChild(linked_material, newName);
}

bool MaterialLinked::sameContent(const MaterialLinked& o) const {
    return childrenEqual(linked_material, o.linked_material) && id.isEqual(o.id);
}

// ---- the scene table's operations on references -------------------------------------------

namespace {

const char16_t kDefaultMaterialTableName[] = u"Default_Lumo_Material";

// The template of the default material, made once: a layered material with
// one diffuse layer of default values.
MaterialPtr defaultMaterialTemplate() {
    static const MaterialPtr templ = [] {
        boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
        m->name = u"Default_Lumo_Material_Actual";
        BrdfPtr diffuse(new Diffuse_BRDF);
        diffuse->name = u"Diffuse";
        m->brdfs.push_back(diffuse);
        return MaterialPtr(m);
    }();
    return templ;
}

// Every reference to `uuid` in the tree below `material`, in depth-first
// order. An embedded copy isn't entered: it stands for a material of the
// table, whose own references are found under its own entry.
void collectReferences(const MaterialPtr& material, const std::u16string& uuid,
                       std::vector<boost::shared_ptr<MaterialReference>>& found) {
    if (!material) return;
    if (material->getType() == kMaterialReference) {
        boost::shared_ptr<MaterialReference> ref =
            boost::dynamic_pointer_cast<MaterialReference>(material);
        if (ref && platform::iequals(ref->target_uuid, uuid)) found.push_back(ref);
        return;
    }
    for (const MaterialPtr& child : childMaterials(*material)) collectReferences(child, uuid, found);
}

}  // namespace

boost::shared_ptr<MaterialReference> SceneMaterials::createReference(const std::u16string& name) const {
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->target_uuid = getUuid(name);
    return ref;
}

MaterialPtr SceneMaterials::getDefaultMaterial() const { return getMaterial(kDefaultMaterialTableName); }

void SceneMaterials::ensureDefaultMaterial() {
    MaterialPtr copy = defaultMaterialTemplate()->duplicate();
    copy->name = kDefaultMaterialTableName;
    addMaterial(copy);  // a refusal (the name is taken) is no error here
}

std::vector<boost::shared_ptr<MaterialReference>> SceneMaterials::findReferences(
    const std::u16string& uuid) const {
    std::vector<boost::shared_ptr<MaterialReference>> found;
    for (const MaterialMap::value_type& entry : materials) collectReferences(entry.second, uuid, found);
    return found;
}

void SceneMaterials::mergeDuplicateUuids() {
    for (const MaterialMap::value_type& entry : materials) {
        std::vector<UuidMap::iterator> same;
        for (UuidMap::iterator it = uuids.begin(); it != uuids.end(); ++it)
            if (platform::iequals(it->second, entry.first)) same.push_back(it);
        if (same.size() < 2) continue;
        // The last UUID in key order stays; references to the others move to it.
        const std::u16string survivor = same.back()->first;
        const MaterialPtr target = getMaterialByUuid(survivor);
        for (std::size_t i = 0; i + 1 < same.size(); ++i) {
            for (const boost::shared_ptr<MaterialReference>& ref : findReferences(same[i]->first)) {
                ref->target_uuid = survivor;
                ref->target = target;
            }
            uuids.erase(same[i]);
        }
    }
}

}  // namespace OrvaneLumoCore
