#include "materials/WrappingMaterials.h"

#include "materials/MaterialMembers.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

const int kOverrideEnvironmentVersion = 1;
const int kObjectExclusionVersion = 3;

// The four environment groups of MaterialOverrideEnvironment in the order of
// its record, which has the background first. Each row of the record
// (textures, colours, multipliers, switches) walks this table.
typedef MaterialOverrideEnvironment Env;
struct EnvironmentGroup {
    TexturePtr Env::*tex;
    Color Env::*color;
    float Env::*mult;
    bool Env::*override_;
};
const EnvironmentGroup kEnvironmentRecordOrder[] = {
    {&Env::bg_tex, &Env::bg_color, &Env::bg_tex_mult, &Env::override_bg},
    {&Env::gi_tex, &Env::gi_color, &Env::gi_tex_mult, &Env::override_gi},
    {&Env::reflect_tex, &Env::reflect_color, &Env::reflect_tex_mult, &Env::override_reflect},
    {&Env::refract_tex, &Env::refract_color, &Env::refract_tex_mult, &Env::override_refract},
};

}  // namespace

// ---- MaterialOverrideEnvironment ----------------------------------------------------------

MaterialOverrideEnvironment::MaterialOverrideEnvironment() { MaterialOverrideEnvironment::reset(); }

void MaterialOverrideEnvironment::reset() {
    base_mtl.reset();
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) {
        (this->*g.tex).reset();
        this->*g.color = Color(0, 0, 0);
        this->*g.mult = 1;
        this->*g.override_ = false;
    }
}

bool MaterialOverrideEnvironment::save(QuickArchive& ar) const {
    writeVersion(ar, kOverrideEnvironmentVersion);
    if (!BaseMaterial::save(ar) || !saveOptionalMember(ar, base_mtl)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder)
        if (!saveOptionalMember(ar, this->*g.tex)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.writeColor(this->*g.color);
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.writeFloat(this->*g.mult);
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.writeByte(this->*g.override_);
    return true;
}

bool MaterialOverrideEnvironment::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, kOverrideEnvironmentVersion);
    reset();  // also when the tag is refused
    if (v < 0) return false;
    if (!BaseMaterial::load(ar) || !loadMaterialMember(ar, base_mtl)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder)
        if (!loadTextureMember(ar, this->*g.tex)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.readColor(this->*g.color);
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.readFloat(this->*g.mult);
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) ar.readByte(this->*g.override_);
    return true;
}

void MaterialOverrideEnvironment::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, newName);
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder) this->*g.tex = cloneChild(this->*g.tex);
}

bool MaterialOverrideEnvironment::sameContent(const MaterialOverrideEnvironment& o) const {
    if (!childrenEqual(base_mtl, o.base_mtl)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder)
        if (!childrenEqual(this->*g.tex, o.*g.tex)) return false;
    for (const EnvironmentGroup& g : kEnvironmentRecordOrder)
        if (this->*g.color != o.*g.color || this->*g.mult != o.*g.mult ||
            this->*g.override_ != o.*g.override_)
            return false;
    return true;
}

void MaterialOverrideEnvironment::writeXml(AssetXmlWriter& writer, std::u16string url) {
    if (base_mtl) base_mtl->writeXml(writer, url);
}

// ---- MaterialDisplaced ---------------------------------------------------------------------

MaterialDisplaced::MaterialDisplaced() { MaterialDisplaced::reset(); }

typedef MaterialDisplaced Disp;
typedef RowsOf<Disp> DispRow;

// Version 1: base record, base_mtl, displace_tex, displace_tex_mult.
// Version 2: as 1, then the shift, the edge length and the four integers.
const RecordRow<Disp> kDisplacedRecord[] = {
    kBaseRecord,
    &Disp::base_mtl,
    &Disp::displace_tex,
    DispRow::f32(&Disp::displace_tex_mult, 1, 1),
    DispRow::f32(&Disp::displace_shift, 0, 2),
    DispRow::f32(&Disp::displace_edge_length, 4, 2),
    DispRow::i32(&Disp::displace_max_subdivs, 256, 2),
    DispRow::i32(&Disp::displace_continuity, 1, 2),
    DispRow::i32(&Disp::displace_view_dependent, 1, 2),
    DispRow::i32(&Disp::displace_use_globals, 1, 2),
};

RowSpan<RecordRow<MaterialDisplaced>> MaterialDisplaced::record() { return rowSpan(kDisplacedRecord); }

void MaterialDisplaced::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (base_mtl) base_mtl->writeXml(writer, url);
}

// ---- MaterialObjectExclusion ------------------------------------------------------------------

MaterialObjectExclusion::MaterialObjectExclusion() { MaterialObjectExclusion::reset(); }

void MaterialObjectExclusion::reset() {
    base_mtl.reset();
    mode = 0;
    objects.clear();
    short_circuit = true;
}

bool MaterialObjectExclusion::save(QuickArchive& ar) const {
    writeVersion(ar, kObjectExclusionVersion);
    ar.writeInt(mode);
    if (!saveOptionalMember(ar, base_mtl)) return false;
    ar.writeLength(objects.size());
    for (const std::u16string& object : objects) ar.writeWString(object);
    if (!BaseMaterial::save(ar)) return false;
    ar.writeByte(short_circuit);
    return true;
}

// Version 1: mode, base_mtl, the object names.
// Version 2: as 1, then the base record.
// Version 3: as 2, then short_circuit.
bool MaterialObjectExclusion::load(QuickArchive& ar) {
    const int v = readVersion(ar, 1, kObjectExclusionVersion);
    reset();  // also when the tag is refused
    if (v < 0) return false;
    ar.readInt(mode);
    if (!loadMaterialMember(ar, base_mtl)) return false;
    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    objects.resize(static_cast<std::size_t>(count));
    for (std::u16string& object : objects) ar.readWString(object);
    if (v >= 2 && !BaseMaterial::load(ar)) return false;
    if (v >= 3) ar.readByte(short_circuit);
    return true;
}

void MaterialObjectExclusion::copyChildren(bool newName) {
    base_mtl = copyChild(base_mtl, newName);
}

bool MaterialObjectExclusion::sameContent(const MaterialObjectExclusion& o) const {
    if (!childrenEqual(base_mtl, o.base_mtl) || mode != o.mode ||
        short_circuit != o.short_circuit || objects.size() != o.objects.size())
        return false;
    for (std::size_t i = 0; i < objects.size(); ++i)
        if (!platform::iequals(objects[i], o.objects[i])) return false;
    return true;
}

void MaterialObjectExclusion::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (base_mtl) base_mtl->writeXml(writer, url);
    openMaterialAsset(writer, *this, url, "");
    writeMaterialRef(writer, "base_mtl", base_mtl, url);
    writer.writeInteger("mode", mode);
    writer.writeBool("short_circuit", short_circuit);
    writer.openList("objects", "");
    for (const std::u16string& object : objects) writer.writeStringEntry(object);
    writer.closeList();
    closeMaterialAsset(writer);
}

// ---- MaterialAngleBlend ------------------------------------------------------------------------

MaterialAngleBlend::MaterialAngleBlend() { MaterialAngleBlend::reset(); }

typedef MaterialAngleBlend Blend;

const RecordRow<Blend> kAngleBlendRecord[] = {
    kBaseRecord,
    &Blend::mtl_one,
    &Blend::mtl_two,
    RowsOf<Blend>::f32(&Blend::start_angle, 75, 1),
    RowsOf<Blend>::f32(&Blend::stop_angle, 150, 1),
};

RowSpan<RecordRow<MaterialAngleBlend>> MaterialAngleBlend::record() { return rowSpan(kAngleBlendRecord); }

void MaterialAngleBlend::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (mtl_one) mtl_one->writeXml(writer, url);
    if (mtl_two) mtl_two->writeXml(writer, url);
    openMaterialAsset(writer, *this, url, "");
    writeMaterialRef(writer, "mtl_one", mtl_one, url);
    writeMaterialRef(writer, "mtl_two", mtl_two, url);
    writer.writeFloat("start_angle", start_angle);
    writer.writeFloat("stop_angle", stop_angle);
    closeMaterialAsset(writer);
}

// ---- MaterialAlphaContribution --------------------------------------------------------------------

MaterialAlphaContribution::MaterialAlphaContribution() { MaterialAlphaContribution::reset(); }

typedef MaterialAlphaContribution Alpha;

const RecordRow<Alpha> kAlphaContributionRecord[] = {
    kBaseRecord,
    &Alpha::base_mtl,
    &Alpha::alpha_tex,
    RowsOf<Alpha>::f32(&Alpha::alpha_tex_mult, 1, 1),
    RowsOf<Alpha>::f32(&Alpha::alpha, 1, 1),
};

RowSpan<RecordRow<MaterialAlphaContribution>> MaterialAlphaContribution::record() { return rowSpan(kAlphaContributionRecord); }

void MaterialAlphaContribution::writeXml(AssetXmlWriter& writer, std::u16string url) {
    url = childUrl(url, name);
    if (base_mtl) base_mtl->writeXml(writer, url);
    const std::u16string alphaUrl = childUrl(url, u"alpha_tex");
    writeTextureAssets(writer, alpha_tex, alphaUrl);
    openMaterialAsset(writer, *this, url, "");
    writer.writeFloat("alpha", alpha);
    writer.writeFloat("alpha_tex_mult", alpha_tex_mult);
    writeMaterialRef(writer, "base_mtl", base_mtl, url);
    writeTextureRef(writer, "alpha_tex", alpha_tex, alphaUrl);
    closeMaterialAsset(writer);
}

}  // namespace OrvaneLumoCore
