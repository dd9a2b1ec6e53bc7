#include "materials/TwoSidedBump.h"

#include "materials/MaterialMembers.h"
#include "materials/MaterialRows.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/Bitmaps.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {
const int kBumpVersion = 3;
}  // namespace

// ---- Material2Sided ------------------------------------------------------------

Material2Sided::Material2Sided() { Material2Sided::reset(); }

typedef Material2Sided TS;

const RecordRow<TS> k2SidedRecord[] = {
    {&TS::front, "front", 1},
    {&TS::back, "back", 2},
    RecordRow<TS>(&TS::translucency_tex, "translucency_tex", 3).coded(kSharedOnCopy),
    {&TS::translucency, "translucency", 5},
    RowsOf<TS>::f32(&TS::translucency_tex_mult, 1, 1).shownAs("translucency_tex_mult", 7),
    {&TS::force_1sided, "force_1sided", 9},
    RecordRow<TS>(&TS::transparency_tex, 2, "transparency_tex", 4).coded(kSharedOnCopy),
    {&TS::transparency, 2, "transparency", 6},
    RowsOf<TS>::f32(&TS::transparency_tex_mult, 1, 2).shownAs("transparency_tex_mult", 8),
    RecordRow<TS>(kBaseRecord, 3),
};

RowSpan<RecordRow<TS>> Material2Sided::record() { return rowSpan(k2SidedRecord); }

// ---- MaterialSkp2Sided -------------------------------------------------------------

MaterialSkp2Sided::MaterialSkp2Sided() { MaterialSkp2Sided::reset(); }

typedef MaterialSkp2Sided Skp;

const RecordRow<Skp> kSkp2SidedRecord[] = {
    kBaseRecord,
    {&Skp::front, "front"},
    {&Skp::back, "back"},
    {&Skp::force_1sided, "force_1sided"},
};

RowSpan<RecordRow<Skp>> MaterialSkp2Sided::record() { return rowSpan(kSkp2SidedRecord); }

// ---- MaterialBump ----------------------------------------------------------------

MaterialBump::MaterialBump() { MaterialBump::reset(); }

void MaterialBump::reset() {
    BaseMaterial::reset();
    base_mtl.reset();
    bump_tex.reset();
    bump_tex_mult = 1;
}

bool MaterialBump::save(QuickArchive& ar) const {
    if (!base_mtl) return false;
    writeVersion(ar, kBumpVersion);
    ar.writeFloat(bump_tex_mult);
    if (!saveOptionalMember(ar, bump_tex) || !saveRequiredMember(ar, base_mtl)) return false;
    return BaseMaterial::save(ar);
}

// Version 1: name (an empty one becomes a default name), a path that gives a
//            bitmap bump_tex, bump_tex_mult, base_mtl as tag and record.
// Version 2: name (an empty one stays empty), bump_tex_mult, bump_tex as
//            texture member, base_mtl as tag and record.
// Version 3: bump_tex_mult, bump_tex, base_mtl, then the base record.
// Written by hand: version 1 holds a path where the others hold a texture.
bool MaterialBump::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, kBumpVersion);
    if (v < 0) return false;
    if (v == 1) {
        loadInlineName(ar, true);
        std::u16string path;
        ar.readWString(path);
        bump_tex = makeBitmapTextureFromPath(path);
        ar.readFloat(bump_tex_mult);
        // The old reader reset the new base material before its record.
        std::uint32_t tag = 0xFFFFFFFFu;
        ar.readUInt(tag);
        base_mtl = createMaterial(tag);
        if (!base_mtl) return false;
        base_mtl->reset();
        return loadNested(ar, *base_mtl);
    }
    if (v == 2) loadInlineName(ar, false);
    ar.readFloat(bump_tex_mult);
    if (!loadTextureMember(ar, bump_tex) || !loadBareMaterial(ar, base_mtl)) return false;
    return v == 2 || BaseMaterial::load(ar);
}

void MaterialBump::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, newName);
    bump_tex = cloneChild(bump_tex);
}

bool MaterialBump::sameContent(const MaterialBump& o) const {
    return childrenEqual(base_mtl, o.base_mtl) && childrenEqual(bump_tex, o.bump_tex) &&
           bump_tex_mult == o.bump_tex_mult;
}

void MaterialBump::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (base_mtl) base_mtl->writeXml(writer, url);
    const std::u16string bumpUrl = childUrl(url, u"bump_tex");
    writeTextureAssets(writer, bump_tex, bumpUrl);
    openMaterialAsset(writer, *this, url, "");
    writer.writeFloat("bump_tex_mult", bump_tex_mult);
    writeMaterialRef(writer, "base_mtl", base_mtl, url);
    writeTextureRef(writer, "bump_tex", bump_tex, bumpUrl);
    closeMaterialAsset(writer);
}

}  // namespace OrvaneLumoCore
