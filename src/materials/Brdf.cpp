// The six layers are described once as data: per class one table of rows,
// each a field with the versions that hold it, its default, the XML
// parameter that shows it and, for a texture, the word of its slot. save,
// load, reset, isEqual, clone and writeXml walk these tables.
#include "materials/Brdf.h"

#include <algorithm>

#include "persistence/FieldRows.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "textures/Bitmaps.h"
#include "textures/BasicTextures.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

namespace {

// ---- the row form of a layer ---------------------------------------------------------
//
// A table lists the rows of every version in record order; a version reads
// the rows that hold it. Where old versions held a field at another place,
// or a texture as a bare path, a row for that place stands beside the
// field's own row, which carries the default and the XML. A texture row is
// an optional texture member. The rows that need code are hook rows:

enum LayerHook {
    kTextureMember = 0,  // optional texture member (a row of a texture field)
    kPathCode,           // `wstring` path of old records, made into a bitmap texture
    kFresnelIorCode,     // `f32` index of refraction of the old Fresnel pair
    kFresnelSwitchCode,  // `i32` switch of the old Fresnel pair
    kFresnelRuleCode,    // no bytes: applies the Fresnel pair to the Fresnel target
    kBaseCode,           // the base record of Base_BRDF
};

const RowHook kBase{kBaseCode};
const RowHook kFresnelIor{kFresnelIorCode};
const RowHook kFresnelSwitch{kFresnelSwitchCode};
const RowHook kFresnelRule{kFresnelRuleCode};

// The colour "transparency" of the reflection layers: 1 - reflection per
// component, 0 where negative.
enum LayerForm { kFromReflection = 1 };

template <class L>
RecordRow<L> path(TexturePtr L::*texture, int since, int until) {
    return RecordRow<L>(texture, since, until).coded(kPathCode);
}

// What a load resets before it reads.
enum class LoadResets { Layer, BaseRecordOnly };

// What a layer class describes.
template <class L>
struct LayerTable {
    int newest;  // the version save writes
    RowSpan<RecordRow<L>> rows;
    TexturePtr L::*fresnelTarget;  // what the old Fresnel pair fills
    // A new layer holds a Fresnel texture in the target, which a loaded
    // layer doesn't keep.
    bool newHoldsFresnel;
    LoadResets loadResets;
};

// ---- Glass_BRDF ------------------------------------------------------------------------

typedef Glass_BRDF G;
typedef RecordRow<G> GlassRow;
// field, since[, until] | XML parameter, its place | default
const GlassRow kGlassRows[] = {
    GlassRow(&G::color, "color", 1).byDefault(kWhite),
    GlassRow(&G::fog_color, "fog_color", 3).byDefault(kWhite),
    GlassRow(&G::ior, "ior", 8).byDefault(1.55),
    GlassRow(&G::ior_second).byDefault(1.55),
    GlassRow(&G::cutoff, "cutoff", 18).byDefault(0.001),
    GlassRow(&G::fog_color_mult, "fog_color_mult", 9).byDefault(1),
    GlassRow(&G::glossiness, "glossiness", 10).byDefault(1),
    GlassRow(&G::depth_value).byDefault(5),
    GlassRow(&G::subdivs, "subdivs", 20).byDefault(8),
    GlassRow(&G::affect_shadows, "affect_shadows", 5).asFlag(),
    GlassRow(&G::affect_alpha, "affect_alpha", 6).asFlag(),
    GlassRow(&G::transparency_tex_mult, 2, 4),
    GlassRow(&G::color_tex_mult, 5, "color_tex_mult", 19).byDefault(1),
    GlassRow(&G::glossiness_tex_mult, 2, "glossiness_tex_mult", 11).byDefault(1),
    GlassRow(&G::ior_tex_mult, 2, "ior_tex_mult", 12).byDefault(1),
    path(&G::transparency_tex, 2, 3),
    path(&G::glossiness_tex, 2, 3),
    path(&G::ior_tex, 2, 3),
    GlassRow(&G::translucency_on, 3, "translucency_on", 7).asFlag(),
    GlassRow(&G::thickness, 3, "thickness", 16).byDefault(1000),
    GlassRow(&G::scatter_coeff, 3, "scatter_coeff", 14),
    GlassRow(&G::scatter_direction, 3, "scatter_direction", 15).byDefault(1),
    GlassRow(&G::translucency_tex_mult, 3, "translucency_tex_mult", 13).byDefault(1),
    GlassRow(&G::translucency, 3, "translucency", 4).byDefault(kWhite),
    path(&G::translucency_tex, 3, 3),
    GlassRow(&G::transparency_tex, 4, 4),
    GlassRow(&G::color_tex, 5, "color_tex", 22).slot(u"color_texture"),
    GlassRow(&G::glossiness_tex, 4, "glossiness_tex", 23).slot(u"glossy_texture"),
    GlassRow(&G::ior_tex, 4, "ior_texture", 24).slot(u"ior_texture"),
    GlassRow(&G::translucency_tex, 4, "translucency_tex", 25).slot(u"translucency_texture"),
    GlassRow(&G::transparency, 5, "transparency", 2),
    GlassRow(&G::transparency_tex_mult, 5, "transparency_tex_mult", 17).byDefault(1),
    GlassRow(&G::transparency_tex, 5, "transparency_tex", 21).slot(u"transparency_texture"),
    GlassRow(kBase, 6),
};

// ---- Phong_BRDF, Blinn_BRDF ------------------------------------------------------------

typedef BaseGlossy_BRDF P;
typedef RecordRow<P> GlossyRow;
// Up to version 5 the Fresnel pair stands inside the head of the record.
const GlossyRow kGlossyRows[] = {
    GlossyRow(&P::color, "color", 1).byDefault(kWhite),
    GlossyRow(&P::reflection, "transparency", 2).byDefault(kWhite).shownBy(kFromReflection),
    GlossyRow(&P::hilightGlossiness, "hilightGlossiness", 3).byDefault(1),
    GlossyRow(&P::reflectionGlossiness, "reflectionGlossiness", 4).byDefault(1),
    GlossyRow(kFresnelIor, 1, 5),
    GlossyRow(&P::cutoff, "cutoff", 5).byDefault(0.01),
    GlossyRow(&P::subdivs, "subdivs", 6).byDefault(8),
    GlossyRow(kFresnelSwitch, 1, 5),
    GlossyRow(&P::back_side, "back_side", 7),
    GlossyRow(&P::depth_value).byDefault(5),
    GlossyRow(&P::color_tex_mult, 2, "color_tex_mult", 8).byDefault(1),
    GlossyRow(&P::hilightGlossiness_tex_mult, 2, "hilightGlossiness_tex_mult", 9).byDefault(1),
    GlossyRow(&P::reflectionGlossiness_tex_mult, 2, "reflectionGlossiness_tex_mult", 10).byDefault(1),
    GlossyRow(&P::transparency_tex_mult, 6, "transparency_tex_mult", 11).byDefault(1),
    path(&P::color_tex, 2, 3),
    path(&P::hilightGlossiness_tex, 2, 3),
    path(&P::reflectionGlossiness_tex, 2, 3),
    GlossyRow(&P::color_tex, 4, "color_tex", 14).slot(u"color_texture"),
    GlossyRow(&P::hilightGlossiness_tex, 4, "hilightGlossiness_tex", 15).slot(u"hilight_glossiness_texture"),
    GlossyRow(&P::reflectionGlossiness_tex, 4, "reflectionGlossiness_tex", 16)
        .slot(u"reflection_glossiness_texture"),
    GlossyRow(&P::transparency_tex, 6, "transparency_tex", 17).slot(u"transparency_texture"),
    GlossyRow(&P::anisotropy, 3, "anisotropy", 12),
    GlossyRow(&P::anisotropy_rotation, 3, "anisotropy_rotation", 13),
    GlossyRow(kBase, 5),
    GlossyRow(kFresnelRule, 1, 5),
};

// ---- Mirror_BRDF -----------------------------------------------------------------------

typedef Mirror_BRDF M;
typedef RecordRow<M> MirrorRow;
// Up to version 4 the Fresnel pair stands inside the head of the record.
const MirrorRow kMirrorRows[] = {
    MirrorRow(&M::color, "color", 1).byDefault(kWhite),
    MirrorRow(&M::reflection, "transparency", 2).byDefault(kWhite).shownBy(kFromReflection),
    MirrorRow(&M::transparency_tex_mult, "transparency_tex_mult", 4).byDefault(1),
    MirrorRow(kFresnelIor, 1, 4),
    MirrorRow(&M::cutoff, "cutoff", 5).byDefault(0.01),
    MirrorRow(kFresnelSwitch, 1, 4),
    MirrorRow(&M::mirror_value).byDefault(1),
    path(&M::transparency_tex, 1, 2),
    MirrorRow(&M::color_tex_mult, 2, "color_tex_mult", 3).byDefault(1),
    path(&M::color_tex, 2, 2),
    MirrorRow(&M::transparency_tex, 3, "transparency_tex", 6).slot(u"transparency_texture"),
    MirrorRow(&M::color_tex, 3, "color_tex", 7).slot(u"color_texture"),
    MirrorRow(kFresnelRule, 1, 4),
    MirrorRow(kBase, 4),
};

// ---- Diffuse_BRDF ----------------------------------------------------------------------

typedef Diffuse_BRDF D;
typedef RecordRow<D> DiffuseRow;
const DiffuseRow kDiffuseRows[] = {
    DiffuseRow(&D::color, "color").byDefault(Color(0.5f, 0.5f, 0.5f)),
    DiffuseRow(&D::transparency, "transparency"),
    DiffuseRow(&D::color_tex_mult, "color_tex_mult").byDefault(1),
    DiffuseRow(&D::transparency_tex_mult, "transparency_tex_mult").byDefault(1),
    path(&D::color_tex, 1, 1),
    path(&D::transparency_tex, 1, 1),
    DiffuseRow(&D::color_tex, 2, "color_tex").slot(u"color_texture"),
    DiffuseRow(&D::transparency_tex, 2, "transparency_tex").slot(u"transparency_texture"),
    DiffuseRow(kBase, 3),
    DiffuseRow(&D::use_color_tex_alpha_as_transparency, 4, "use_color_tex_alpha_as_transparency"),
};

// ---- Light_BRDF ------------------------------------------------------------------------

typedef Light_BRDF E;
typedef RecordRow<E> EmissiveRow;
const EmissiveRow kEmissiveRows[] = {
    EmissiveRow(&E::color, "color", 1).byDefault(kWhite),
    EmissiveRow(&E::transparency, 2, "transparency", 2),
    EmissiveRow(&E::intensity, "intensity", 3).byDefault(1),
    EmissiveRow(&E::light_value, 2).byDefault(1),
    EmissiveRow(&E::color_tex_mult, 2, "color_tex_mult", 5).byDefault(1),
    EmissiveRow(&E::transparency_tex_mult, "transparency_tex_mult", 4).byDefault(1),
    path(&E::color_tex, 2, 2),
    path(&E::transparency_tex, 1, 2),
    EmissiveRow(&E::color_tex, 3, "color_tex", 7).slot(u"color_texture"),
    EmissiveRow(&E::transparency_tex, 3, "transparency_tex", 8).slot(u"transp_texture"),
    EmissiveRow(kBase, 4),
    EmissiveRow(&E::doubleSided, 5, "doubleSided", 6).asFlag().byDefault(1),
};

// The table of each class.
LayerTable<G> tableOf(const G&) {
    return {6, rowSpan(kGlassRows), &G::transparency_tex, false, LoadResets::BaseRecordOnly};
}
LayerTable<P> tableOf(const P&) { return {6, rowSpan(kGlossyRows), &P::transparency_tex, true, LoadResets::Layer}; }
LayerTable<M> tableOf(const M&) { return {5, rowSpan(kMirrorRows), &M::transparency_tex, true, LoadResets::Layer}; }
LayerTable<D> tableOf(const D&) { return {4, rowSpan(kDiffuseRows), &D::transparency_tex, false, LoadResets::Layer}; }
LayerTable<E> tableOf(const E&) { return {5, rowSpan(kEmissiveRows), &E::transparency_tex, false, LoadResets::Layer}; }

// ---- the walks -----------------------------------------------------------------------

// The old Fresnel pair; neither value is a field of the layer.
struct FresnelPair {
    float ior = 0;
    std::int32_t enabled = 0;
};

TexturePtr makeFresnelTexture(float ior) {
    boost::shared_ptr<FresnelTexture> fresnel(new FresnelTexture);
    fresnel->fresnel_ior = ior;
    return fresnel;
}

// A texture of the layer's current record: a row of the newest version that
// holds a texture member.
template <class L>
bool isTextureRow(const RecordRow<L>& row, int newest) {
    return row.inVersion(newest) && row.field.kind() == FieldRef<L>::Kind::Texture;
}

Color colorFromReflection(const Color& reflection) {
    return Color(std::max(0.0f, 1.0f - reflection.r), std::max(0.0f, 1.0f - reflection.g),
                 std::max(0.0f, 1.0f - reflection.b));
}

const int kBaseRecordVersion = 4;

}  // namespace

// ---- the operations of every layer -----------------------------------------------------

template <class T>
void LayerRecordOf<T>::resetLayer() {
    T& layer = static_cast<T&>(*this);
    const LayerTable<T> table = tableOf(layer);
    Base_BRDF::reset();
    resetFields(layer, table.rows, table.newest);
    for (const RecordRow<T>& row : table.rows)
        if (isTextureRow(row, table.newest)) row.field.template get<TexturePtr>(layer).reset();
    if (table.newHoldsFresnel) layer.*table.fresnelTarget = createTexture(1);
}

template <class T>
bool LayerRecordOf<T>::save(QuickArchive& ar) const {
    const T& layer = static_cast<const T&>(*this);
    const LayerTable<T> table = tableOf(layer);
    writeVersion(ar, table.newest);
    return writeFields(ar, layer, table.rows, table.newest, [&](const RecordRow<T>& row) {
        switch (row.hook) {
        case kTextureMember: return saveOptionalMember(ar, row.field.template get<TexturePtr>(layer));
        case kBaseCode: return layer.Base_BRDF::save(ar);
        default: return false;  // old forms are never written
        }
    });
}

template <class T>
bool LayerRecordOf<T>::load(QuickArchive& ar) {
    T& layer = static_cast<T&>(*this);
    const LayerTable<T> table = tableOf(layer);
    if (table.loadResets == LoadResets::Layer)
        layer.reset();
    else
        Base_BRDF::reset();
    const int version = readVersion(ar, 1, table.newest);
    if (version < 0) return false;
    if (table.newHoldsFresnel) (layer.*table.fresnelTarget).reset();
    FresnelPair fresnel;
    return readFields(ar, layer, table.rows, version, [&](const RecordRow<T>& row) {
        switch (row.hook) {
        case kTextureMember:
            return loadOptionalMember(ar, row.field.template get<TexturePtr>(layer), &createTexture);
        case kPathCode: {
            std::u16string file;
            ar.readWString(file);
            row.field.template get<TexturePtr>(layer) = makeBitmapTextureFromPath(file);
            return true;
        }
        case kFresnelIorCode: ar.readFloat(fresnel.ior); return true;
        case kFresnelSwitchCode: ar.readInt(fresnel.enabled); return true;
        case kFresnelRuleCode:
            if (fresnel.enabled != 0) layer.*table.fresnelTarget = makeFresnelTexture(fresnel.ior);
            return true;
        case kBaseCode: return layer.Base_BRDF::load(ar);
        }
        return false;
    });
}

template <class T>
void LayerRecordOf<T>::finishClone() {
    T& copy = static_cast<T&>(*this);
    const LayerTable<T> table = tableOf(copy);
    for (const RecordRow<T>& row : table.rows) {
        if (!isTextureRow(row, table.newest)) continue;
        TexturePtr& texture = row.field.template get<TexturePtr>(copy);
        texture = cloneChild(texture);
    }
}

// Every field of the current record but the base record: textures through
// their own isEqual, colours per component, numbers exactly.
template <class T>
bool LayerRecordOf<T>::sameContent(const T& o) const {
    const T& layer = static_cast<const T&>(*this);
    const LayerTable<T> table = tableOf(layer);
    for (const RecordRow<T>& row : table.rows) {
        if (isTextureRow(row, table.newest) &&
            !childrenEqual(row.field.template get<TexturePtr>(layer), row.field.template get<TexturePtr>(o)))
            return false;
    }
    return fieldsEqual(layer, o, table.rows, table.newest);
}

template <class T>
void LayerRecordOf<T>::writeXml(AssetXmlWriter& writer, std::u16string url) {
    const T& layer = static_cast<const T&>(*this);
    const LayerTable<T> table = tableOf(layer);
    url += u'/';
    url += layer.name;
    const std::u16string slotPrefix = url + u'/';
    static const ShownRows<T> shown = shownRows<T>(table.rows);
    // The textures' Assets first, in the order of the parameters that refer to them.
    for (const RecordRow<T>* row : shown) {
        if (!isTextureRow(*row, table.newest)) continue;
        const TexturePtr& texture = row->field.template get<TexturePtr>(layer);
        if (texture) texture->writeXml(writer, slotPrefix + row->xml.slot);
    }
    openPluginAsset(writer, url, layer.getAssetType(), layer.getPluginName(), "");
    writeShownFields(writer, layer, shown, [&](const RecordRow<T>& row) {
        if (row.xml.form == kFromReflection) {
            writer.writeColor(row.xml.name, colorFromReflection(row.field.template get<Color>(layer)));
        } else {
            const TexturePtr& texture = row.field.template get<TexturePtr>(layer);
            writer.writeTextureRef(row.xml.name, texture.get(), slotPrefix, row.xml.slot);
        }
    });
    closePluginAsset(writer);
}

template class LayerRecordOf<Glass_BRDF>;
template class LayerRecordOf<BaseGlossy_BRDF>;
template class LayerRecordOf<Mirror_BRDF>;
template class LayerRecordOf<Diffuse_BRDF>;
template class LayerRecordOf<Light_BRDF>;

// ---- Base_BRDF -------------------------------------------------------------------------

void Base_BRDF::reset() {
    name = getPluginName();
    layer_flag_a = true;
    layer_flag_b = false;
    layer_flag_c = false;
}

bool Base_BRDF::save(QuickArchive& ar) const {
    writeVersion(ar, kBaseRecordVersion);
    ar.writeWString(name);
    ar.writeByte(layer_flag_a);
    ar.writeByte(layer_flag_b);
    ar.writeByte(layer_flag_c);
    return true;
}

bool Base_BRDF::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kBaseRecordVersion);
    if (version < 0) return false;
    ar.readWString(name);
    platform::removeControlCharacters(name);
    if (version >= 2) ar.readByte(layer_flag_a);
    if (version >= 3) ar.readByte(layer_flag_b);
    if (version >= 4) ar.readByte(layer_flag_c);
    return true;
}

void Base_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {}

std::u16string Base_BRDF::getPluginName() const { return std::u16string(); }

std::u16string getBrdfGroupName(std::int32_t group) {
    switch (group) {
    case 0: return u"Emissive";
    case 1: return u"Reflection";
    case 2: return u"Diffuse";
    case 3: return u"Refraction";
    default: return std::u16string();
    }
}

// ---- the classes -----------------------------------------------------------------------

Glass_BRDF::Glass_BRDF() { resetLayer(); }

Phong_BRDF::Phong_BRDF() { resetLayer(); }

Blinn_BRDF::Blinn_BRDF() { resetLayer(); }

Mirror_BRDF::Mirror_BRDF() { resetLayer(); }

Diffuse_BRDF::Diffuse_BRDF() { resetLayer(); }

Light_BRDF::Light_BRDF() { resetLayer(); }

}  // namespace OrvaneLumoCore
