#include "materials/TwoSidedBump.h"

#include "materials/MaterialMembers.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/Bitmaps.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {
const int k2SidedVersion = 3;
const int kSkp2SidedVersion = 1;
const int kBumpVersion = 3;
}  // namespace

// ---- Material2Sided ------------------------------------------------------------

Material2Sided::Material2Sided() { Material2Sided::reset(); }

void Material2Sided::reset() {
    front.reset();
    back.reset();
    translucency_tex.reset();
    transparency_tex.reset();
    translucency = Color(0, 0, 0);
    transparency = Color(0, 0, 0);
    translucency_tex_mult = 1;
    transparency_tex_mult = 1;
    force_1sided = false;
}

bool Material2Sided::save(QuickArchive& ar) const {
    writeVersion(ar, k2SidedVersion);
    if (!saveOptionalMember(ar, front) || !saveOptionalMember(ar, back) ||
        !saveOptionalMember(ar, translucency_tex))
        return false;
    ar.writeColor(translucency);
    ar.writeFloat(translucency_tex_mult);
    ar.writeByte(force_1sided);
    if (!saveOptionalMember(ar, transparency_tex)) return false;
    ar.writeColor(transparency);
    ar.writeFloat(transparency_tex_mult);
    return BaseMaterial::save(ar);
}

// Version 1: front, back, translucency_tex, translucency,
//            translucency_tex_mult, force_1sided.
// Version 2: as 1, then transparency_tex, transparency, transparency_tex_mult.
// Version 3: as 2, then the base record.
bool Material2Sided::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, k2SidedVersion);
    if (v < 0) return false;
    if (!loadMaterialMember(ar, front) || !loadMaterialMember(ar, back) ||
        !loadTextureMember(ar, translucency_tex))
        return false;
    ar.readColor(translucency);
    ar.readFloat(translucency_tex_mult);
    ar.readByte(force_1sided);
    if (v >= 2) {
        if (!loadTextureMember(ar, transparency_tex)) return false;
        ar.readColor(transparency);
        ar.readFloat(transparency_tex_mult);
    }
    if (v >= 3) return BaseMaterial::load(ar);
    return true;
}

// The textures stay shared with the source.
void Material2Sided::copyChildren(bool newName) {
    front = copyChild(front, newName);
    back = copyChild(back, newName);
}

bool Material2Sided::sameContent(const Material2Sided& o) const {
    return childrenEqual(front, o.front) && childrenEqual(back, o.back) &&
           childrenEqual(translucency_tex, o.translucency_tex) &&
           childrenEqual(transparency_tex, o.transparency_tex) && translucency == o.translucency &&
           transparency == o.transparency && translucency_tex_mult == o.translucency_tex_mult &&
           transparency_tex_mult == o.transparency_tex_mult && force_1sided == o.force_1sided;
}

void Material2Sided::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (front) front->writeXml(writer, url);
    if (back) back->writeXml(writer, url);
    const std::u16string translucencyUrl = childUrl(url, u"translucency_tex");
    const std::u16string transparencyUrl = childUrl(url, u"transparency_tex");
    writeTextureAssets(writer, translucency_tex, translucencyUrl);
    writeTextureAssets(writer, transparency_tex, transparencyUrl);

    openMaterialAsset(writer, *this, url, "");
    writeMaterialRef(writer, "front", front, url);
    writeMaterialRef(writer, "back", back, url);
    writeTextureRef(writer, "translucency_tex", translucency_tex, translucencyUrl);
    writeTextureRef(writer, "transparency_tex", transparency_tex, transparencyUrl);
    writer.writeColor("translucency", translucency);
    writer.writeColor("transparency", transparency);
    writer.writeFloat("translucency_tex_mult", translucency_tex_mult);
    writer.writeFloat("transparency_tex_mult", transparency_tex_mult);
    writer.writeBool("force_1sided", force_1sided);
    closeMaterialAsset(writer);
}

// ---- MaterialSkp2Sided -------------------------------------------------------------

MaterialSkp2Sided::MaterialSkp2Sided() { MaterialSkp2Sided::reset(); }

void MaterialSkp2Sided::reset() {
    front.reset();
    back.reset();
    force_1sided = false;
}

bool MaterialSkp2Sided::save(QuickArchive& ar) const {
    writeVersion(ar, kSkp2SidedVersion);
    if (!BaseMaterial::save(ar) || !saveOptionalMember(ar, front) || !saveOptionalMember(ar, back))
        return false;
    ar.writeByte(force_1sided);
    return true;
}

bool MaterialSkp2Sided::load(QuickArchive& ar) {
    if (readVersion(ar, 1, kSkp2SidedVersion) < 0) return false;
    if (!BaseMaterial::load(ar) || !loadMaterialMember(ar, front) || !loadMaterialMember(ar, back))
        return false;
    ar.readByte(force_1sided);
    return true;
}

void MaterialSkp2Sided::copyChildren(bool newName) {
    front = copyChild(front, newName);
    back = copyChild(back, newName);
}

bool MaterialSkp2Sided::sameContent(const MaterialSkp2Sided& o) const {
    return childrenEqual(front, o.front) && childrenEqual(back, o.back) &&
           force_1sided == o.force_1sided;
}

void MaterialSkp2Sided::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (front) front->writeXml(writer, url);
    if (back) back->writeXml(writer, url);
    openMaterialAsset(writer, *this, url, "");
    writeMaterialRef(writer, "front", front, url);
    writeMaterialRef(writer, "back", back, url);
    writer.writeBool("force_1sided", force_1sided);
    closeMaterialAsset(writer);
}

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
