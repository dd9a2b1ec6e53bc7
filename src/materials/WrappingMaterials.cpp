#include "materials/WrappingMaterials.h"

#include "materials/MaterialMembers.h"
#include "materials/MaterialRows.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {
const int kObjectExclusionVersion = 3;
}  // namespace

// ---- MaterialOverrideEnvironment ----------------------------------------------------------

MaterialOverrideEnvironment::MaterialOverrideEnvironment() { MaterialOverrideEnvironment::reset(); }

typedef MaterialOverrideEnvironment Env;
typedef RowsOf<Env> EnvRow;

// The four environment groups (background, GI, reflection, refraction), each
// row of the record walking them in this order. In the XML the textures and
// colours go out with the GI group first, the multipliers and switches with
// the background group first.
const RecordRow<Env> kOverrideEnvironmentRecord[] = {
    kBaseRecord,
    &Env::base_mtl,
    RecordRow<Env>(&Env::bg_tex, "bg_tex", 2),
    RecordRow<Env>(&Env::gi_tex, "gi_tex", 1),
    RecordRow<Env>(&Env::reflect_tex, "reflect_tex", 3),
    RecordRow<Env>(&Env::refract_tex, "refract_tex", 4),
    EnvRow::color(&Env::bg_color, Color(0, 0, 0), 1).shownAs("bg_color", 6),
    EnvRow::color(&Env::gi_color, Color(0, 0, 0), 1).shownAs("gi_color", 5),
    EnvRow::color(&Env::reflect_color, Color(0, 0, 0), 1).shownAs("reflect_color", 7),
    EnvRow::color(&Env::refract_color, Color(0, 0, 0), 1).shownAs("refract_color", 8),
    EnvRow::f32(&Env::bg_tex_mult, 1, 1).shownAs("bg_tex_mult", 9),
    EnvRow::f32(&Env::gi_tex_mult, 1, 1).shownAs("gi_tex_mult", 10),
    EnvRow::f32(&Env::reflect_tex_mult, 1, 1).shownAs("reflect_tex_mult", 11),
    EnvRow::f32(&Env::refract_tex_mult, 1, 1).shownAs("refract_tex_mult", 12),
    EnvRow::b8(&Env::override_bg, false, 1).shownAs("override_bg", 13),
    EnvRow::b8(&Env::override_gi, false, 1).shownAs("override_gi", 14),
    EnvRow::b8(&Env::override_reflect, false, 1).shownAs("override_reflect", 15),
    EnvRow::b8(&Env::override_refract, false, 1).shownAs("override_refract", 16),
};

RowSpan<RecordRow<Env>> MaterialOverrideEnvironment::record() { return rowSpan(kOverrideEnvironmentRecord); }

void MaterialOverrideEnvironment::writeXml(AssetXmlWriter& writer, std::u16string url) {
    if (base_mtl) base_mtl->writeXml(writer, url);
}

// ---- MaterialDisplaced ---------------------------------------------------------------------

MaterialDisplaced::MaterialDisplaced() { MaterialDisplaced::reset(); }

typedef MaterialDisplaced Disp;
typedef RowsOf<Disp> DispRow;

// Version 1: base record, base_mtl, displace_tex, displace_tex_mult.
// Version 2: as 1, then the shift, the edge length and the four integers,
// which the XML shows as integers, also those that hold yes or no.
const RecordRow<Disp> kDisplacedRecord[] = {
    kBaseRecord,
    &Disp::base_mtl,
    RecordRow<Disp>(&Disp::displace_tex, "displace_tex", 8),
    DispRow::f32(&Disp::displace_tex_mult, 1, 1).shownAs("displace_tex_mult", 3),
    DispRow::f32(&Disp::displace_shift, 0, 2).shownAs("displace_shift", 1),
    DispRow::f32(&Disp::displace_edge_length, 4, 2).shownAs("displace_edge_length", 2),
    DispRow::i32(&Disp::displace_max_subdivs, 256, 2).shownAs("displace_max_subdivs", 4),
    DispRow::i32(&Disp::displace_continuity, 1, 2).shownAs("displace_continuity", 5),
    DispRow::i32(&Disp::displace_view_dependent, 1, 2).shownAs("displace_view_dependent", 6),
    DispRow::i32(&Disp::displace_use_globals, 1, 2).shownAs("displace_use_globals", 7),
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
// Written by hand: the object names are a counted list, which no row holds.
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
    RecordRow<Blend>(&Blend::mtl_one, "mtl_one"),
    RecordRow<Blend>(&Blend::mtl_two, "mtl_two"),
    RowsOf<Blend>::f32(&Blend::start_angle, 75, 1).shownAs("start_angle"),
    RowsOf<Blend>::f32(&Blend::stop_angle, 150, 1).shownAs("stop_angle"),
};

RowSpan<RecordRow<MaterialAngleBlend>> MaterialAngleBlend::record() { return rowSpan(kAngleBlendRecord); }

void MaterialAngleBlend::writeXml(AssetXmlWriter& writer, std::u16string url) { writeTableAsset(writer, url); }

// ---- MaterialAlphaContribution --------------------------------------------------------------------

MaterialAlphaContribution::MaterialAlphaContribution() { MaterialAlphaContribution::reset(); }

typedef MaterialAlphaContribution Alpha;

const RecordRow<Alpha> kAlphaContributionRecord[] = {
    kBaseRecord,
    RecordRow<Alpha>(&Alpha::base_mtl, "base_mtl", 3),
    RecordRow<Alpha>(&Alpha::alpha_tex, "alpha_tex", 4),
    RowsOf<Alpha>::f32(&Alpha::alpha_tex_mult, 1, 1).shownAs("alpha_tex_mult", 2),
    RowsOf<Alpha>::f32(&Alpha::alpha, 1, 1).shownAs("alpha", 1),
};

RowSpan<RecordRow<MaterialAlphaContribution>> MaterialAlphaContribution::record() { return rowSpan(kAlphaContributionRecord); }

void MaterialAlphaContribution::writeXml(AssetXmlWriter& writer, std::u16string url) { writeTableAsset(writer, url); }

}  // namespace OrvaneLumoCore
