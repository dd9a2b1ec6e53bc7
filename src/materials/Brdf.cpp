// The six layers are described once as data: per class the rows of each
// record version, the texture slots with their url words, and the XML
// parameters. save, load, isEqual, clone and writeXml walk these tables.
#include "materials/Brdf.h"

#include <algorithm>
#include <initializer_list>
#include <vector>

#include <boost/any.hpp>

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

// ---- record rows -----------------------------------------------------------------
//
// A layer's record is one list of rows per version, in the one record row
// form. Plain fields are written as bare member pointers; a texture member is
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

template <class L>
using Rows = std::vector<RecordRow<L>>;

// Rows of several groups, one after the other: a version of a record reads
// like its table ("rows 1 to 3; rows 5 to 7").
template <class L>
Rows<L> join(std::initializer_list<Rows<L>> groups) {
    Rows<L> all;
    for (const Rows<L>& g : groups) all.insert(all.end(), g.begin(), g.end());
    return all;
}

template <class L>
RecordRow<L> path(TexturePtr L::*texture) {
    RecordRow<L> row(texture);
    row.hook = kPathCode;
    return row;
}

// ---- XML parameters --------------------------------------------------------------
//
// Plain fields in the form of their type; a texture is referred to by its slot
// url; an integer flag is a bool (asFlag); one parameter is derived from a
// field:

enum ParamHook {
    kFromReflection = 1,  // colour: 1 - reflection per component, 0 where negative
};

template <class L>
ParamRow<L> fromReflection(const char* name, Color L::*p) { return {name, p, "", false, kFromReflection}; }

// A texture slot: the field and the word of its url.
template <class L>
struct Slot {
    TexturePtr L::*texture;
    const char16_t* word;
};

// What a layer class describes: its records by version, its slots and its
// parameters.
template <class L>
struct LayerLayout {
    int currentVersion;
    std::vector<Rows<L>> records;     // by version; entry 0 unused
    std::vector<Slot<L>> slots;       // in the order their Assets are written
    std::vector<ParamRow<L>> params;  // in XML order
    TexturePtr L::*fresnelTarget;     // what the Fresnel rule fills
};

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

// The texture field of a row or parameter.
template <class L, class Row>
TexturePtr& textureOf(L& layer, const Row& row) {
    return row.field.template get<TexturePtr>(layer);
}
template <class L, class Row>
const TexturePtr& textureOf(const L& layer, const Row& row) {
    return row.field.template get<TexturePtr>(layer);
}

template <class L>
bool saveRows(const L& layer, QuickArchive& ar, const LayerLayout<L>& table) {
    writeVersion(ar, table.currentVersion);
    return writeFields(ar, layer, table.records[table.currentVersion], table.currentVersion,
                       [&](const RecordRow<L>& row) {
                           switch (row.hook) {
                           case kTextureMember: return saveOptionalMember(ar, textureOf(layer, row));
                           case kBaseCode: return layer.Base_BRDF::save(ar);
                           default: return false;  // old forms are never written
                           }
                       });
}

// Reads the rows of the version that the tag names. The caller has reset
// the layer as its class requires.
template <class L>
bool loadRows(L& layer, QuickArchive& ar, const LayerLayout<L>& table, bool emptyFresnelTarget) {
    const int version = readVersion(ar, 1, table.currentVersion);
    if (version < 0) return false;
    // The default Fresnel texture of a new layer survives in no loaded one.
    if (emptyFresnelTarget) (layer.*table.fresnelTarget).reset();
    FresnelPair fresnel;
    return readFields(ar, layer, table.records[version], version, [&](const RecordRow<L>& row) {
        switch (row.hook) {
        case kTextureMember: return loadOptionalMember(ar, textureOf(layer, row), &createTexture);
        case kPathCode: {
            std::u16string file;
            ar.readWString(file);
            textureOf(layer, row) = makeBitmapTextureFromPath(file);
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

// Every field of the current record but the base record: textures through
// their own isEqual, colours per component, numbers exactly.
template <class L>
bool fieldsEqual(const L& a, const L& b, const LayerLayout<L>& table) {
    const Rows<L>& rows = table.records[table.currentVersion];
    for (const RecordRow<L>& row : rows) {
        const bool isTexture = row.field.kind() == FieldRef<L>::Kind::Texture;
        if (isTexture && !childrenEqual(textureOf(a, row), textureOf(b, row))) return false;
    }
    return fieldsEqual(a, b, rows);
}

template <class L>
void cloneSlots(L& copy, const LayerLayout<L>& table) {
    for (const Slot<L>& slot : table.slots) copy.*slot.texture = cloneChild(copy.*slot.texture);
}

template <class L>
const char16_t* slotWord(const L& layer, const TexturePtr& texture, const LayerLayout<L>& table) {
    for (const Slot<L>& slot : table.slots) {
        if (&(layer.*slot.texture) == &texture) return slot.word;
    }
    return u"";
}

Color colorFromReflection(const Color& reflection) {
    return Color(std::max(0.0f, 1.0f - reflection.r), std::max(0.0f, 1.0f - reflection.g),
                 std::max(0.0f, 1.0f - reflection.b));
}

template <class L>
void writeLayer(const L& layer, AssetXmlWriter& writer, std::u16string url,
                const LayerLayout<L>& table) {
    url += u'/';
    url += layer.name;
    const std::u16string slotPrefix = url + u'/';
    for (const Slot<L>& slot : table.slots) {
        const TexturePtr& texture = layer.*slot.texture;
        if (texture) texture->writeXml(writer, slotPrefix + slot.word);
    }
    openPluginAsset(writer, url, layer.getAssetType(), layer.getPluginName(), "");
    writeParams(writer, layer, table.params, [&](const ParamRow<L>& p) {
        switch (p.hook) {
        case kFromReflection:
            writer.writeColor(p.name, colorFromReflection(p.field.template get<Color>(layer)));
            break;
        default: {
            const TexturePtr& texture = textureOf(layer, p);
            writer.writeTextureRef(p.name, texture.get(), slotPrefix, slotWord(layer, texture, table));
        }
        }
    });
    closePluginAsset(writer);
}

// ---- Glass_BRDF ------------------------------------------------------------------------

const LayerLayout<Glass_BRDF>& glassTable() {
    typedef Glass_BRDF G;
    static const LayerLayout<G> table = [] {
        // The rows of the current record, numbered as old versions name them.
        const Rows<G> r1 = {&G::color, &G::fog_color};
        const Rows<G> r2 = {&G::ior, &G::ior_second, &G::cutoff, &G::fog_color_mult, &G::glossiness};
        const Rows<G> r3 = {&G::depth_value, &G::subdivs, &G::affect_shadows, &G::affect_alpha};
        const Rows<G> r4 = {&G::color_tex_mult, &G::glossiness_tex_mult, &G::ior_tex_mult};
        const Rows<G> r5 = {&G::translucency_on};
        const Rows<G> r6 = {&G::thickness, &G::scatter_coeff, &G::scatter_direction,
                            &G::translucency_tex_mult};
        const Rows<G> r7 = {&G::translucency};
        const Rows<G> r8 = {&G::color_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex};
        const Rows<G> r9 = {&G::transparency};
        const Rows<G> r10 = {&G::transparency_tex_mult};
        const Rows<G> r11 = {&G::transparency_tex};
        const Rows<G> r12 = {kBase};
        // The three multipliers that old records hold in this order.
        const Rows<G> oldMults = {&G::transparency_tex_mult, &G::glossiness_tex_mult,
                                  &G::ior_tex_mult};
        const Rows<G> v2Paths = {path(&G::transparency_tex), path(&G::glossiness_tex),
                                 path(&G::ior_tex)};

        LayerLayout<G> s;
        s.currentVersion = 6;
        s.records = {
            {},
            join<G>({r1, r2, r3}),
            join<G>({r1, r2, r3, oldMults, v2Paths}),
            join<G>({r1, r2, r3, oldMults, v2Paths, r5, r6, r7, {path(&G::translucency_tex)}}),
            join<G>({r1, r2, r3, oldMults, r5, r6, r7,
                     {&G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex}}),
            join<G>({r1, r2, r3, r4, r5, r6, r7, r8, r9, r10, r11}),
            join<G>({r1, r2, r3, r4, r5, r6, r7, r8, r9, r10, r11, r12}),
        };
        s.slots = {
            {&G::transparency_tex, u"transparency_texture"},
            {&G::color_tex, u"color_texture"},
            {&G::glossiness_tex, u"glossy_texture"},
            {&G::ior_tex, u"ior_texture"},
            {&G::translucency_tex, u"translucency_texture"},
        };
        s.params = {
            {"color", &G::color},
            {"transparency", &G::transparency},
            {"fog_color", &G::fog_color},
            {"translucency", &G::translucency},
            {"affect_shadows", asFlag(&G::affect_shadows)},
            {"affect_alpha", asFlag(&G::affect_alpha)},
            {"translucency_on", asFlag(&G::translucency_on)},
            {"ior", &G::ior},
            {"fog_color_mult", &G::fog_color_mult},
            {"glossiness", &G::glossiness},
            {"glossiness_tex_mult", &G::glossiness_tex_mult},
            {"ior_tex_mult", &G::ior_tex_mult},
            {"translucency_tex_mult", &G::translucency_tex_mult},
            {"scatter_coeff", &G::scatter_coeff},
            {"scatter_direction", &G::scatter_direction},
            {"thickness", &G::thickness},
            {"transparency_tex_mult", &G::transparency_tex_mult},
            {"cutoff", &G::cutoff},
            {"color_tex_mult", &G::color_tex_mult},
            {"subdivs", &G::subdivs},
            {"transparency_tex", &G::transparency_tex},
            {"color_tex", &G::color_tex},
            {"glossiness_tex", &G::glossiness_tex},
            {"ior_texture", &G::ior_tex},
            {"translucency_tex", &G::translucency_tex},
        };
        s.fresnelTarget = &G::transparency_tex;
        return s;
    }();
    return table;
}

// ---- Phong_BRDF, Blinn_BRDF ------------------------------------------------------------

const LayerLayout<BaseGlossy_BRDF>& glossyTable() {
    typedef BaseGlossy_BRDF P;
    static const LayerLayout<P> table = [] {
        // The head that all old records share, with the Fresnel pair inside.
        const Rows<P> head = {&P::color, &P::reflection, &P::hilightGlossiness,
                              &P::reflectionGlossiness, kFresnelIor, &P::cutoff, &P::subdivs,
                              kFresnelSwitch, &P::back_side, &P::depth_value};
        const Rows<P> oldMults = {&P::color_tex_mult, &P::hilightGlossiness_tex_mult,
                                  &P::reflectionGlossiness_tex_mult};
        const Rows<P> paths = {path(&P::color_tex), path(&P::hilightGlossiness_tex),
                               path(&P::reflectionGlossiness_tex)};
        const Rows<P> members = {&P::color_tex, &P::hilightGlossiness_tex,
                                 &P::reflectionGlossiness_tex};
        const Rows<P> anisotropy = {&P::anisotropy, &P::anisotropy_rotation};

        LayerLayout<P> s;
        s.currentVersion = 6;
        s.records = {
            {},
            join<P>({head, {kFresnelRule}}),
            join<P>({head, oldMults, paths, {kFresnelRule}}),
            join<P>({head, oldMults, paths, anisotropy, {kFresnelRule}}),
            join<P>({head, oldMults, members, anisotropy, {kFresnelRule}}),
            join<P>({head, oldMults, members, anisotropy, {kBase}, {kFresnelRule}}),
            {&P::color, &P::reflection,
             &P::hilightGlossiness, &P::reflectionGlossiness, &P::cutoff,
             &P::subdivs, &P::back_side, &P::depth_value,
             &P::color_tex_mult, &P::hilightGlossiness_tex_mult,
             &P::reflectionGlossiness_tex_mult, &P::transparency_tex_mult,
             &P::color_tex, &P::hilightGlossiness_tex, &P::reflectionGlossiness_tex,
             &P::transparency_tex,
             &P::anisotropy, &P::anisotropy_rotation,
             kBase},
        };
        s.slots = {
            {&P::color_tex, u"color_texture"},
            {&P::hilightGlossiness_tex, u"hilight_glossiness_texture"},
            {&P::reflectionGlossiness_tex, u"reflection_glossiness_texture"},
            {&P::transparency_tex, u"transparency_texture"},
        };
        s.params = {
            {"color", &P::color},
            fromReflection("transparency", &P::reflection),
            {"hilightGlossiness", &P::hilightGlossiness},
            {"reflectionGlossiness", &P::reflectionGlossiness},
            {"cutoff", &P::cutoff},
            {"subdivs", &P::subdivs},
            {"back_side", &P::back_side},
            {"color_tex_mult", &P::color_tex_mult},
            {"hilightGlossiness_tex_mult", &P::hilightGlossiness_tex_mult},
            {"reflectionGlossiness_tex_mult", &P::reflectionGlossiness_tex_mult},
            {"transparency_tex_mult", &P::transparency_tex_mult},
            {"anisotropy", &P::anisotropy},
            {"anisotropy_rotation", &P::anisotropy_rotation},
            {"color_tex", &P::color_tex},
            {"hilightGlossiness_tex", &P::hilightGlossiness_tex},
            {"reflectionGlossiness_tex", &P::reflectionGlossiness_tex},
            {"transparency_tex", &P::transparency_tex},
        };
        s.fresnelTarget = &P::transparency_tex;
        return s;
    }();
    return table;
}

// ---- Mirror_BRDF -----------------------------------------------------------------------

const LayerLayout<Mirror_BRDF>& mirrorTable() {
    typedef Mirror_BRDF M;
    static const LayerLayout<M> table = [] {
        // Version 1 up to `mirror_value`, with the Fresnel pair inside.
        const Rows<M> head = {&M::color, &M::reflection, &M::transparency_tex_mult, kFresnelIor,
                              &M::cutoff, kFresnelSwitch, &M::mirror_value};
        const Rows<M> members = {&M::color_tex_mult, &M::transparency_tex, &M::color_tex};

        LayerLayout<M> s;
        s.currentVersion = 5;
        s.records = {
            {},
            join<M>({head, {path(&M::transparency_tex)}, {kFresnelRule}}),
            join<M>({head, {path(&M::transparency_tex), &M::color_tex_mult, path(&M::color_tex)},
                     {kFresnelRule}}),
            join<M>({head, members, {kFresnelRule}}),
            join<M>({head, members, {kFresnelRule}, {kBase}}),
            {&M::color, &M::reflection, &M::transparency_tex_mult, &M::cutoff, &M::mirror_value,
             &M::color_tex_mult, &M::transparency_tex, &M::color_tex, kBase},
        };
        s.slots = {
            {&M::transparency_tex, u"transparency_texture"},
            {&M::color_tex, u"color_texture"},
        };
        s.params = {
            {"color", &M::color},
            fromReflection("transparency", &M::reflection),
            {"color_tex_mult", &M::color_tex_mult},
            {"transparency_tex_mult", &M::transparency_tex_mult},
            {"cutoff", &M::cutoff},
            {"transparency_tex", &M::transparency_tex},
            {"color_tex", &M::color_tex},
        };
        s.fresnelTarget = &M::transparency_tex;
        return s;
    }();
    return table;
}

// ---- Diffuse_BRDF ----------------------------------------------------------------------

const LayerLayout<Diffuse_BRDF>& diffuseTable() {
    typedef Diffuse_BRDF D;
    static const LayerLayout<D> table = [] {
        const Rows<D> head = {&D::color, &D::transparency, &D::color_tex_mult,
                              &D::transparency_tex_mult};
        const Rows<D> members = {&D::color_tex, &D::transparency_tex};

        LayerLayout<D> s;
        s.currentVersion = 4;
        s.records = {
            {},
            join<D>({head, {path(&D::color_tex), path(&D::transparency_tex)}}),
            join<D>({head, members}),
            join<D>({head, members, {kBase}}),
            join<D>({head, members, {kBase}, {&D::use_color_tex_alpha_as_transparency}}),
        };
        s.slots = {
            {&D::color_tex, u"color_texture"},
            {&D::transparency_tex, u"transparency_texture"},
        };
        s.params = {
            {"color", &D::color},
            {"transparency", &D::transparency},
            {"color_tex_mult", &D::color_tex_mult},
            {"transparency_tex_mult", &D::transparency_tex_mult},
            {"color_tex", &D::color_tex},
            {"transparency_tex", &D::transparency_tex},
            {"use_color_tex_alpha_as_transparency", &D::use_color_tex_alpha_as_transparency},
        };
        s.fresnelTarget = &D::transparency_tex;
        return s;
    }();
    return table;
}

// ---- Light_BRDF ------------------------------------------------------------------------

const LayerLayout<Light_BRDF>& lightTable() {
    typedef Light_BRDF E;
    static const LayerLayout<E> table = [] {
        const Rows<E> head = {&E::color, &E::transparency, &E::intensity, &E::light_value,
                              &E::color_tex_mult, &E::transparency_tex_mult};
        const Rows<E> members = {&E::color_tex, &E::transparency_tex};

        LayerLayout<E> s;
        s.currentVersion = 5;
        s.records = {
            {},
            {&E::color, &E::intensity, &E::transparency_tex_mult, path(&E::transparency_tex)},
            join<E>({head, {path(&E::color_tex), path(&E::transparency_tex)}}),
            join<E>({head, members}),
            join<E>({head, members, {kBase}}),
            join<E>({head, members, {kBase}, {&E::doubleSided}}),
        };
        s.slots = {
            {&E::color_tex, u"color_texture"},
            {&E::transparency_tex, u"transp_texture"},
        };
        s.params = {
            {"color", &E::color},
            {"transparency", &E::transparency},
            {"intensity", &E::intensity},
            {"transparency_tex_mult", &E::transparency_tex_mult},
            {"color_tex_mult", &E::color_tex_mult},
            {"doubleSided", asFlag(&E::doubleSided)},
            {"color_tex", &E::color_tex},
            {"transparency_tex", &E::transparency_tex},
        };
        s.fresnelTarget = &E::transparency_tex;
        return s;
    }();
    return table;
}

const int kBaseRecordVersion = 4;

}  // namespace

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

// ---- Glass_BRDF ------------------------------------------------------------------------

Glass_BRDF::Glass_BRDF() { reset(); }

void Glass_BRDF::reset() {
    Base_BRDF::reset();
    color = Color(1, 1, 1);
    transparency = Color(0, 0, 0);
    fog_color = Color(1, 1, 1);
    translucency = Color(1, 1, 1);
    ior = 1.55f;
    ior_second = 1.55f;
    cutoff = 0.001f;
    fog_color_mult = 1;
    glossiness = 1;
    color_tex_mult = 1;
    transparency_tex_mult = 1;
    glossiness_tex_mult = 1;
    ior_tex_mult = 1;
    translucency_tex_mult = 1;
    thickness = 1000;
    scatter_coeff = 0;
    scatter_direction = 1;
    subdivs = 8;
    depth_value = 5;
    affect_shadows = 0;
    affect_alpha = 0;
    translucency_on = 0;
    color_tex.reset();
    transparency_tex.reset();
    glossiness_tex.reset();
    ior_tex.reset();
    translucency_tex.reset();
}

bool Glass_BRDF::save(QuickArchive& ar) const { return saveRows(*this, ar, glassTable()); }

bool Glass_BRDF::load(QuickArchive& ar) {
    Base_BRDF::reset();
    return loadRows(*this, ar, glassTable(), false);
}

void Glass_BRDF::finishClone() { cloneSlots(*this, glassTable()); }

bool Glass_BRDF::sameContent(const Glass_BRDF& o) const { return fieldsEqual(*this, o, glassTable()); }

void Glass_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLayer(*this, writer, url, glassTable());
}

// ---- Phong_BRDF, Blinn_BRDF ------------------------------------------------------------

void BaseGlossy_BRDF::reset() {
    Base_BRDF::reset();
    color = Color(1, 1, 1);
    reflection = Color(1, 1, 1);
    hilightGlossiness = 1;
    reflectionGlossiness = 1;
    cutoff = 0.01f;
    hilightGlossiness_tex_mult = 1;
    reflectionGlossiness_tex_mult = 1;
    color_tex_mult = 1;
    transparency_tex_mult = 1;
    anisotropy = 0;
    anisotropy_rotation = 0;
    subdivs = 8;
    depth_value = 5;
    back_side = 0;
    hilightGlossiness_tex.reset();
    reflectionGlossiness_tex.reset();
    color_tex.reset();
    transparency_tex = createTexture(1);
}

bool BaseGlossy_BRDF::save(QuickArchive& ar) const { return saveRows(*this, ar, glossyTable()); }

bool BaseGlossy_BRDF::load(QuickArchive& ar) {
    reset();
    return loadRows(*this, ar, glossyTable(), true);
}

void BaseGlossy_BRDF::finishClone() { cloneSlots(*this, glossyTable()); }

bool BaseGlossy_BRDF::sameContent(const BaseGlossy_BRDF& o) const { return fieldsEqual(*this, o, glossyTable()); }

void BaseGlossy_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLayer(*this, writer, url, glossyTable());
}

Phong_BRDF::Phong_BRDF() { BaseGlossy_BRDF::reset(); }

Blinn_BRDF::Blinn_BRDF() { BaseGlossy_BRDF::reset(); }

// ---- Mirror_BRDF -----------------------------------------------------------------------

Mirror_BRDF::Mirror_BRDF() { reset(); }

void Mirror_BRDF::reset() {
    Base_BRDF::reset();
    color = Color(1, 1, 1);
    reflection = Color(1, 1, 1);
    transparency_tex_mult = 1;
    color_tex_mult = 1;
    cutoff = 0.01f;
    mirror_value = 1;
    transparency_tex = createTexture(1);
    color_tex.reset();
}

bool Mirror_BRDF::save(QuickArchive& ar) const { return saveRows(*this, ar, mirrorTable()); }

bool Mirror_BRDF::load(QuickArchive& ar) {
    reset();
    return loadRows(*this, ar, mirrorTable(), true);
}

void Mirror_BRDF::finishClone() { cloneSlots(*this, mirrorTable()); }

bool Mirror_BRDF::sameContent(const Mirror_BRDF& o) const { return fieldsEqual(*this, o, mirrorTable()); }

void Mirror_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLayer(*this, writer, url, mirrorTable());
}

// ---- Diffuse_BRDF ----------------------------------------------------------------------

Diffuse_BRDF::Diffuse_BRDF() { reset(); }

void Diffuse_BRDF::reset() {
    Base_BRDF::reset();
    color = Color(0.5f, 0.5f, 0.5f);
    transparency = Color(0, 0, 0);
    color_tex_mult = 1;
    transparency_tex_mult = 1;
    color_tex.reset();
    transparency_tex.reset();
    use_color_tex_alpha_as_transparency = false;
}

bool Diffuse_BRDF::save(QuickArchive& ar) const { return saveRows(*this, ar, diffuseTable()); }

bool Diffuse_BRDF::load(QuickArchive& ar) {
    reset();
    return loadRows(*this, ar, diffuseTable(), false);
}

void Diffuse_BRDF::finishClone() { cloneSlots(*this, diffuseTable()); }

bool Diffuse_BRDF::sameContent(const Diffuse_BRDF& o) const { return fieldsEqual(*this, o, diffuseTable()); }

void Diffuse_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLayer(*this, writer, url, diffuseTable());
}

// ---- Light_BRDF ------------------------------------------------------------------------

Light_BRDF::Light_BRDF() { reset(); }

void Light_BRDF::reset() {
    Base_BRDF::reset();
    color = Color(1, 1, 1);
    transparency = Color(0, 0, 0);
    intensity = 1;
    light_value = 1;
    transparency_tex_mult = 1;
    color_tex_mult = 1;
    transparency_tex.reset();
    color_tex.reset();
    doubleSided = 1;
}

bool Light_BRDF::save(QuickArchive& ar) const { return saveRows(*this, ar, lightTable()); }

bool Light_BRDF::load(QuickArchive& ar) {
    reset();
    return loadRows(*this, ar, lightTable(), false);
}

void Light_BRDF::finishClone() { cloneSlots(*this, lightTable()); }

bool Light_BRDF::sameContent(const Light_BRDF& o) const { return fieldsEqual(*this, o, lightTable()); }

void Light_BRDF::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeLayer(*this, writer, url, lightTable());
}

}  // namespace OrvaneLumoCore
