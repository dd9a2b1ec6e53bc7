#include "materials/WrapperAssets.h"

#include "materials/MaterialAssets.h"
#include "materials/MaterialMembers.h"
#include "materials/MaterialRows.h"
#include "materials/MaterialTree.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

template <class T>
const T* as(const BaseMaterial& material) {
    return dynamic_cast<const T*>(&material);
}

// ---- folded wrappers, one pair of writers per class ------------------------------------

void bumpTextures(AssetXmlWriter& w, const MaterialBump& bump, const std::u16string& url) {
    writeTextureAssets(w, bump.bump_tex, childUrl(url, u"bump_tex"));
}

void bumpParameters(AssetXmlWriter& w, const MaterialBump& bump, const std::u16string& url) {
    w.writeBool("bump_on", true);
    w.writeFloat("bump_tex_mult", bump.bump_tex_mult);
    writeTextureRef(w, "bump_tex", bump.bump_tex, childUrl(url, u"bump_tex"));
}

// A wrapper whose record is a table folds its table's textures and
// parameters in; its child material goes out elsewhere.
template <class M>
void tableTextures(AssetXmlWriter& w, const M& m, const std::u16string& url) {
    writeTextureRowAssets(w, m, M::record(), url);
}

template <class M>
void tableParameters(AssetXmlWriter& w, const M& m, const std::u16string& url) {
    writeMaterialParams(w, m, M::record(), url, [](const RecordRow<M>&) {});
}

void displacedParameters(AssetXmlWriter& w, const MaterialDisplaced& d, const std::u16string& url) {
    w.writeBool("displace_on", true);
    tableParameters(w, d, url);
}

// The list of object names doesn't go out here.
void exclusionParameters(AssetXmlWriter& w, const MaterialObjectExclusion& x, const std::u16string&) {
    w.writeBool("ignore_objects", x.mode != 0);
    w.writeBool("short_circuit", x.short_circuit);
}


template <class M>
void noTextures(AssetXmlWriter&, const M&, const std::u16string&) {}

// The folded wrapper of class M with its two writers; the wrapper handed to
// them is of class M, since it was found by M's tag.
template <class M, void (*Textures)(AssetXmlWriter&, const M&, const std::u16string&),
          void (*Parameters)(AssetXmlWriter&, const M&, const std::u16string&)>
FoldedWrapper folded() {
    return {M::kType,
            [](AssetXmlWriter& w, const BaseMaterial& m, const std::u16string& url) {
                Textures(w, static_cast<const M&>(m), url);
            },
            [](AssetXmlWriter& w, const BaseMaterial& m, const std::u16string& url) {
                Parameters(w, static_cast<const M&>(m), url);
            }};
}

// ---- two-child branch ----------------------------------------------------------------

// What the top-level Asset of a two-child class shows beyond its children.
struct TwoChildForm {
    MaterialPtr first, second;
    const char* layout;
    const char* firstName;
    const char* secondName;
};

bool twoChildForm(const BaseMaterial& m, TwoChildForm& form) {
    if (const MaterialAngleBlend* blend = as<MaterialAngleBlend>(m)) {
        form = {blend->mtl_one, blend->mtl_two, "AngleBlendMatLayout", "mtl_one", "mtl_two"};
    } else if (const Material2Sided* twoSided = as<Material2Sided>(m)) {
        form = {twoSided->front, twoSided->back, "TwoSidedMatLayout", "front", "back"};
    } else if (const MaterialSkp2Sided* skp = as<MaterialSkp2Sided>(m)) {
        form = {skp->front, skp->back, "SkpTwoSidedMatLayout", "front", "back"};
    } else {
        return false;
    }
    return true;
}

// Of a Material2Sided only translucency and force_1sided go out here.
void twoChildParameters(AssetXmlWriter& w, const BaseMaterial& m) {
    if (const MaterialAngleBlend* blend = as<MaterialAngleBlend>(m)) {
        tableParameters(w, *blend, u"");
    } else if (const Material2Sided* twoSided = as<Material2Sided>(m)) {
        w.writeColor("translucency", twoSided->translucency);
        w.writeBool("force_1sided", twoSided->force_1sided);
    } else if (const MaterialSkp2Sided* skp = as<MaterialSkp2Sided>(m)) {
        w.writeBool("force_1sided", skp->force_1sided);
    }
}

}  // namespace

std::vector<MaterialPtr> wrapperSearchChildren(const BaseMaterial& m) {
    if (const MaterialReference* ref = as<MaterialReference>(m)) {
        MaterialPtr target = SceneMaterials::instance()->getMaterialByUuid(ref->target_uuid);
        if (!target) target = ref->target;
        return target ? std::vector<MaterialPtr>{target} : std::vector<MaterialPtr>();
    }
    switch (m.getType()) {
    case kMaterial2Sided:
    case kMaterialSkp2Sided:
    case kMaterialAngleBlend: return childMaterials(m);
    default:  // layered, single, multi and instance end the search
        return isSingleChildWrapper(m.getType()) ? childMaterials(m) : std::vector<MaterialPtr>();
    }
}

const std::vector<FoldedWrapper>& foldedWrappers() {
    static const std::vector<FoldedWrapper> wrappers = {
        folded<MaterialBump, bumpTextures, bumpParameters>(),
        folded<MaterialDisplaced, tableTextures, displacedParameters>(),
        folded<MaterialOverrideEnvironment, tableTextures, tableParameters>(),
        folded<MaterialObjectExclusion, noTextures, exclusionParameters>(),
        folded<MaterialAlphaContribution, tableTextures, tableParameters>(),
    };
    return wrappers;
}

void writeTwoChildAssets(AssetXmlWriter& writer, const MaterialPtr& material) {
    TwoChildForm form;
    if (!material || !twoChildForm(*material, form)) return;
    const MaterialPtr a = resolveReference(form.first);
    const MaterialPtr b = resolveReference(form.second);
    writeLayeredAsset(writer, a);
    writeLayeredAsset(writer, b);

    openMaterialAsset(writer, *material, childUrl(u"", material->name), form.layout);
    // A child's reference is the url of its flat Asset: "/" and its name. An
    // unusable child leaves the parameter out altogether.
    if (isUsableMaterial(a)) writeMaterialRef(writer, form.firstName, a, u"");
    if (isUsableMaterial(b)) writeMaterialRef(writer, form.secondName, b, u"");
    twoChildParameters(writer, *material);
    closeMaterialAsset(writer);
}

void writeToonAssets(AssetXmlWriter& writer, const MaterialPtr& material) {
    const MaterialToon* toon = material ? as<MaterialToon>(*material) : nullptr;
    if (!toon) return;
    const MaterialPtr base = resolveReference(toon->base_mtl);
    if (!base) return;
    writeLayeredAsset(writer, base);

    const std::u16string url = childUrl(u"", toon->name);
    toon->writeTextureAssets(writer, url);
    openMaterialAsset(writer, *toon, url, "ToonMatLayout");
    if (isUsableMaterial(base)) writeMaterialRef(writer, "base_mtl", base, u"");
    toon->writeLineParameters(writer, url, MaterialToon::Words::Conversion);
    closeMaterialAsset(writer);
}

std::u16string materialToXml(const MaterialPtr& material) {
    std::u16string text;
    AssetXmlWriter writer(text);
    writeMaterialAssets(writer, material);
    return text;
}

}  // namespace OrvaneLumoCore
