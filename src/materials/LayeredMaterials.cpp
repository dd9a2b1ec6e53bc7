#include "materials/LayeredMaterials.h"

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

namespace {

const int kLayeredVersion = 4;
const int kSingleVersion = 2;
const int kMultiVersion = 2;

// Children that both lists hold pairwise equal (null equals only null).
template <class T>
bool listsEqual(const std::vector<boost::shared_ptr<T>>& a,
                const std::vector<boost::shared_ptr<T>>& b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (!childrenEqual(a[i], b[i])) return false;
    }
    return true;
}

// count, then per element its tag and record.
template <class T>
bool saveMemberList(QuickArchive& ar, const std::vector<boost::shared_ptr<T>>& list) {
    ar.writeLength(list.size());
    for (std::size_t i = 0; i < list.size(); ++i) {
        if (!saveRequiredMember(ar, list[i])) return false;
    }
    return true;
}

// Appends the elements one by one; what was read before a failure stays.
template <class T, class Tag>
bool loadMemberList(QuickArchive& ar, std::vector<boost::shared_ptr<T>>& list,
                    boost::shared_ptr<T> (*create)(Tag)) {
    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    for (std::uint64_t i = 0; i < count; ++i) {
        boost::shared_ptr<T> member;
        if (!loadRequiredMember(ar, member, create)) return false;
        list.push_back(member);
    }
    return true;
}

}  // namespace

// ---- MaterialLayeredBRDF -------------------------------------------------------

MaterialLayeredBRDF::MaterialLayeredBRDF() { reset(); }

void MaterialLayeredBRDF::reset() {
    BaseMaterial::reset();
    double_sided = 1;
    layered_value_a = 0;
    layered_value_b = 1;
    layered_value_c = 1;
    layered_value_d = 0;
    brdfs.clear();
}

bool MaterialLayeredBRDF::save(QuickArchive& ar) const {
    writeVersion(ar, kLayeredVersion);
    if (!saveMemberList(ar, brdfs)) return false;
    ar.writeInt(double_sided);
    ar.writeInt(layered_value_a);
    ar.writeInt(layered_value_b);
    ar.writeInt(layered_value_c);
    if (!BaseMaterial::save(ar)) return false;
    ar.writeInt(layered_value_d);
    return true;
}

bool MaterialLayeredBRDF::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kLayeredVersion);
    // The list starts empty whatever the version, also when it is refused.
    reset();
    if (version < 0) return false;
    if (!loadMemberList(ar, brdfs, &createBrdf)) return false;
    ar.readInt(double_sided);
    ar.readInt(layered_value_a);
    if (version >= 3) {
        ar.readInt(layered_value_b);
        ar.readInt(layered_value_c);
    }
    if (version == 1) {
        loadInlineName(ar);
        return true;
    }
    const bool baseLoaded = BaseMaterial::load(ar);
    if (version >= 4) ar.readInt(layered_value_d);
    return baseLoaded;
}

void MaterialLayeredBRDF::copyChildren(bool) {
    for (std::size_t i = 0; i < brdfs.size(); ++i) brdfs[i] = cloneChild(brdfs[i]);
}

bool MaterialLayeredBRDF::sameContent(const MaterialLayeredBRDF& o) const {
    return listsEqual(brdfs, o.brdfs) && double_sided == o.double_sided &&
           layered_value_a == o.layered_value_a && layered_value_b == o.layered_value_b &&
           layered_value_c == o.layered_value_c && layered_value_d == o.layered_value_d;
}

void MaterialLayeredBRDF::writeLayerAssets(AssetXmlWriter& writer,
                                           const std::u16string& url) const {
    for (std::size_t i = 0; i < brdfs.size(); ++i) {
        if (brdfs[i]) brdfs[i]->writeXml(writer, url);
    }
}

void MaterialLayeredBRDF::openMainAsset(AssetXmlWriter& writer, const std::u16string& url) const {
    openPluginAsset(writer, url, getAssetType(), getPluginName(), "deflumat");
}

void MaterialLayeredBRDF::writeOwnParameters(AssetXmlWriter& writer,
                                             const std::u16string& url) const {
    writer.writeInteger("double_sided", double_sided);
    writer.openList("brdfs", "plugin", "");
    for (std::size_t i = 0; i < brdfs.size(); ++i) {
        if (brdfs[i]) writer.writeListEntry(url + u"/" + brdfs[i]->name);
    }
    writer.closeList();
}

void MaterialLayeredBRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url += u"/";
    url += name;
    writeLayerAssets(writer, url);
    openMainAsset(writer, url);
    writeOwnParameters(writer, url);
    writer.closeParameters();
    writer.closePlugin();
    writer.closeAsset();
}

// ---- MaterialSingleBRDF --------------------------------------------------------

MaterialSingleBRDF::MaterialSingleBRDF() { reset(); }

void MaterialSingleBRDF::reset() {
    BaseMaterial::reset();
    brdf.reset();
    single_value_a = 0;
    single_value_b = 0;
}

bool MaterialSingleBRDF::save(QuickArchive& ar) const {
    writeVersion(ar, kSingleVersion);
    ar.writeInt(single_value_a);
    ar.writeInt(single_value_b);
    if (!saveRequiredMember(ar, brdf)) return false;
    return BaseMaterial::save(ar);
}

bool MaterialSingleBRDF::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kSingleVersion);
    if (version < 0) return false;
    ar.readInt(single_value_a);
    ar.readInt(single_value_b);
    if (version == 1) loadInlineName(ar);
    if (!loadRequiredMember(ar, brdf, &createBrdf)) return false;
    if (version == 1) return true;
    return BaseMaterial::load(ar);
}

bool MaterialSingleBRDF::sameContent(const MaterialSingleBRDF& o) const {
    return childrenEqual(brdf, o.brdf) && single_value_a == o.single_value_a &&
           single_value_b == o.single_value_b;
}

// ---- MaterialMulti -------------------------------------------------------------

MaterialMulti::MaterialMulti() { reset(); }

void MaterialMulti::reset() {
    BaseMaterial::reset();
    materials.clear();
}

bool MaterialMulti::save(QuickArchive& ar) const {
    writeVersion(ar, kMultiVersion);
    if (!saveMemberList(ar, materials)) return false;
    return BaseMaterial::save(ar);
}

bool MaterialMulti::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kMultiVersion);
    if (version < 0) return false;
    if (!loadMemberList(ar, materials, &createMaterial)) return false;
    if (version == 1) {
        loadInlineName(ar);
        return true;
    }
    return BaseMaterial::load(ar);
}

bool MaterialMulti::sameContent(const MaterialMulti& o) const {
    return listsEqual(materials, o.materials);
}

}  // namespace OrvaneLumoCore
