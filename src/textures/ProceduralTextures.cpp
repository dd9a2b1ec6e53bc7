#include "textures/ProceduralTextures.h"

#include <vector>

#include <boost/make_shared.hpp>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/TextureFrame.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

// A child slot: a generator or a texture field, required (tag, record) or
// optional (present flag, then tag and record). `word` is both the slot's
// url segment and the name of the parameter that refers to it.
template <class C>
struct TextureSlot {
    enum class Presence { Required, Optional };

    constexpr TextureSlot(const char16_t* word_, UVWPtr C::*generator_)
        : word(word_), generator(generator_), texture(nullptr), presence(Presence::Required) {}
    constexpr TextureSlot(const char16_t* word_, TexturePtr C::*texture_,
                          Presence presence_ = Presence::Required)
        : word(word_), generator(nullptr), texture(texture_), presence(presence_) {}

    const char16_t* word;
    UVWPtr C::*generator;
    TexturePtr C::*texture;
    Presence presence;
};

template <class C>
struct ProceduralLayout {
    int newest;  // the version save writes; load reads 1 to newest
    RowSpan<TextureSlot<C>> slots;
    RowSpan<RecordRow<C>> record;  // plain fields, behind the children
    RowSpan<ParamRow<C>> params;   // plain parameters, behind the references
};

namespace {

// ---- RampTexture: one version ----

const TextureSlot<RampTexture> kRampSlots[] = {
    {u"uvwgen", &RampTexture::uvw},
    {u"colors", &RampTexture::colors},
};
const RecordRow<RampTexture> kRampRecord[] = {
    {&RampTexture::positions}, {&RampTexture::u_wave},        {&RampTexture::v_wave},
    {&RampTexture::type},      {&RampTexture::interpolation},
};
// "colors" is one reference and "positions" one float, not lists.
const ParamRow<RampTexture> kRampParams[] = {
    {"positions", &RampTexture::positions},
    {"u_wave", &RampTexture::u_wave},
    {"v_wave", &RampTexture::v_wave},
    {"type", &RampTexture::type},
    {"interpolation", &RampTexture::interpolation},
};

// ---- BulgeTexture: one version ----

const TextureSlot<BulgeTexture> kBulgeSlots[] = {{u"uvwgen", &BulgeTexture::uvw}};
const RecordRow<BulgeTexture> kBulgeRecord[] = {{&BulgeTexture::u_width}, {&BulgeTexture::v_width}};
const ParamRow<BulgeTexture> kBulgeParams[] = {
    {"u_width", &BulgeTexture::u_width},
    {"v_width", &BulgeTexture::v_width},
};

// ---- GridTexture: version 2 adds the multipliers ahead of the widths ----

const TextureSlot<GridTexture> kGridSlots[] = {
    {u"uvwgen", &GridTexture::uvw},
    {u"line_color", &GridTexture::line_color},
    {u"fill_color", &GridTexture::fill_color},
};
const RecordRow<GridTexture> kGridRecord[] = {
    {&GridTexture::lineColorMult, 2},
    {&GridTexture::fillColorMult, 2},
    {&GridTexture::u_width},
    {&GridTexture::v_width},
};
const ParamRow<GridTexture> kGridParams[] = {
    {"u_width", &GridTexture::u_width},
    {"v_width", &GridTexture::v_width},
};

// ---- ClothTexture: version 2 adds `tile` ----

const TextureSlot<ClothTexture> kClothSlots[] = {{u"uvwgen", &ClothTexture::uvw}};
const RecordRow<ClothTexture> kClothRecord[] = {
    {&ClothTexture::gap_color}, {&ClothTexture::u_color}, {&ClothTexture::v_color},
    {&ClothTexture::u_width},   {&ClothTexture::v_width}, {&ClothTexture::tile, 2},
};
// One field drives both directions.
const ParamRow<ClothTexture> kClothParams[] = {
    {"gap_color", &ClothTexture::gap_color},
    {"u_color", &ClothTexture::u_color},
    {"v_color", &ClothTexture::v_color},
    {"u_width", &ClothTexture::u_width},
    {"v_width", &ClothTexture::v_width},
    {"tile_u", &ClothTexture::tile},
    {"tile_v", &ClothTexture::tile},
};

// ---- NoiseTexture: one version ----

typedef TextureSlot<NoiseTexture>::Presence NoisePresence;
const TextureSlot<NoiseTexture> kNoiseSlots[] = {
    {u"uvwgen", &NoiseTexture::uvw},
    {u"color1_tex", &NoiseTexture::color1_tex, NoisePresence::Optional},
    {u"color2_tex", &NoiseTexture::color2_tex, NoisePresence::Optional},
};
const RecordRow<NoiseTexture> kNoiseRecord[] = {
    {&NoiseTexture::color1},          {&NoiseTexture::color2},
    {&NoiseTexture::persistence},     {&NoiseTexture::amplitude_ratio},
    {&NoiseTexture::frequency_ratio}, {&NoiseTexture::frequency1},
    {&NoiseTexture::amplitude1},      {&NoiseTexture::size},
    {&NoiseTexture::mix_ratio},       {&NoiseTexture::bias},
    {&NoiseTexture::color1_tex_mult}, {&NoiseTexture::color2_tex_mult},
    {&NoiseTexture::octaves},         {&NoiseTexture::noiseType},
    {&NoiseTexture::inflection},
};
const ParamRow<NoiseTexture> kNoiseParams[] = {
    {"color1", &NoiseTexture::color1},
    {"color2", &NoiseTexture::color2},
    {"persistence", &NoiseTexture::persistence},
    {"amplitude_ratio", &NoiseTexture::amplitude_ratio},
    {"frequency_ratio", &NoiseTexture::frequency_ratio},
    {"frequency1", &NoiseTexture::frequency1},
    {"amplitude1", &NoiseTexture::amplitude1},
    {"size", &NoiseTexture::size},
    {"mix_ratio", &NoiseTexture::mix_ratio},
    {"bias", &NoiseTexture::bias},
    {"color1_tex_mult", &NoiseTexture::color1_tex_mult},
    {"color2_tex_mult", &NoiseTexture::color2_tex_mult},
    {"octaves", &NoiseTexture::octaves},
    {"noiseType", &NoiseTexture::noiseType},
    {"inflection", &NoiseTexture::inflection},
};

// ---- CheckerTexture: version 2 adds the multipliers behind the flags ----

const TextureSlot<CheckerTexture> kCheckerSlots[] = {
    {u"uvwgen", &CheckerTexture::uvw},
    {u"white_color", &CheckerTexture::white_color},
    {u"black_color", &CheckerTexture::black_color},
};
const RecordRow<CheckerTexture> kCheckerRecord[] = {
    {&CheckerTexture::tile_u},
    {&CheckerTexture::tile_v},
    {&CheckerTexture::whiteColorMult, 2},
    {&CheckerTexture::blackColorMult, 2},
};
const ParamRow<CheckerTexture> kCheckerParams[] = {
    {"tile_u", &CheckerTexture::tile_u},
    {"tile_v", &CheckerTexture::tile_v},
};

template <class C, std::size_t S, std::size_t R, std::size_t P>
ProceduralLayout<C> makeLayout(int newest, const TextureSlot<C> (&slots)[S],
                               const RecordRow<C> (&record)[R], const ParamRow<C> (&params)[P]) {
    return ProceduralLayout<C>{newest, rowSpan(slots), rowSpan(record), rowSpan(params)};
}

// The description of class C.
template <class C>
const ProceduralLayout<C>& layoutOf();

template <>
const ProceduralLayout<RampTexture>& layoutOf<RampTexture>() {
    static const ProceduralLayout<RampTexture> l = makeLayout(1, kRampSlots, kRampRecord, kRampParams);
    return l;
}

template <>
const ProceduralLayout<BulgeTexture>& layoutOf<BulgeTexture>() {
    static const ProceduralLayout<BulgeTexture> l =
        makeLayout(1, kBulgeSlots, kBulgeRecord, kBulgeParams);
    return l;
}

template <>
const ProceduralLayout<GridTexture>& layoutOf<GridTexture>() {
    static const ProceduralLayout<GridTexture> l = makeLayout(2, kGridSlots, kGridRecord, kGridParams);
    return l;
}

template <>
const ProceduralLayout<ClothTexture>& layoutOf<ClothTexture>() {
    static const ProceduralLayout<ClothTexture> l =
        makeLayout(2, kClothSlots, kClothRecord, kClothParams);
    return l;
}

template <>
const ProceduralLayout<NoiseTexture>& layoutOf<NoiseTexture>() {
    static const ProceduralLayout<NoiseTexture> l =
        makeLayout(1, kNoiseSlots, kNoiseRecord, kNoiseParams);
    return l;
}

template <>
const ProceduralLayout<CheckerTexture>& layoutOf<CheckerTexture>() {
    static const ProceduralLayout<CheckerTexture> l =
        makeLayout(2, kCheckerSlots, kCheckerRecord, kCheckerParams);
    return l;
}

}  // namespace

CheckerTexture::CheckerTexture()
    : uvw(defaultPlanarUVW()),
      white_color(new AColorTexture(AColor(1, 1, 1, 1))),
      black_color(new AColorTexture(AColor(0, 0, 0, 1))) {}

// ---- the shared operations ----

template <class D, std::uint32_t Tag>
bool ProceduralTexture<D, Tag>::save(QuickArchive& ar) const {
    const ProceduralLayout<D>& l = layoutOf<D>();
    for (const TextureSlot<D>& s : l.slots) {
        if (s.presence != TextureSlot<D>::Presence::Required) continue;
        if (s.generator ? !(self().*s.generator) : !(self().*s.texture)) return false;
    }
    writeVersion(ar, l.newest);
    for (const TextureSlot<D>& s : l.slots) {
        bool ok;
        if (s.generator)
            ok = saveRequiredMember(ar, self().*s.generator);
        else if (s.presence == TextureSlot<D>::Presence::Optional)
            ok = saveOptionalMember(ar, self().*s.texture);
        else
            ok = saveRequiredMember(ar, self().*s.texture);
        if (!ok) return false;
    }
    writeFields(ar, self(), l.record, l.newest);
    return true;
}

template <class D, std::uint32_t Tag>
bool ProceduralTexture<D, Tag>::load(QuickArchive& ar) {
    this->reset();
    const ProceduralLayout<D>& l = layoutOf<D>();
    const int v = readVersion(ar, 1, l.newest);
    if (v < 0) return false;
    for (const TextureSlot<D>& s : l.slots) {
        bool ok;
        if (s.generator)
            ok = loadRequiredMember(ar, self().*s.generator, createUVW);
        else if (s.presence == TextureSlot<D>::Presence::Optional)
            ok = loadOptionalMember(ar, self().*s.texture, createTexture);
        else
            ok = loadRequiredMember(ar, self().*s.texture, createTexture);
        if (!ok) return false;
    }
    readFields(ar, self(), l.record, v);
    return true;
}

template <class D, std::uint32_t Tag>
void ProceduralTexture<D, Tag>::finishClone() {
    for (const TextureSlot<D>& s : layoutOf<D>().slots) {
        if (s.generator)
            self().*s.generator = cloneChild(self().*s.generator);
        else
            self().*s.texture = cloneChild(self().*s.texture);
    }
}

template <class D, std::uint32_t Tag>
bool ProceduralTexture<D, Tag>::sameContent(const D& o) const {
    const ProceduralLayout<D>& l = layoutOf<D>();
    for (const TextureSlot<D>& s : l.slots) {
        const bool same = s.generator ? childrenEqual(self().*s.generator, o.*s.generator)
                                      : childrenEqual(self().*s.texture, o.*s.texture);
        if (!same) return false;
    }
    return fieldsEqual(self(), o, l.record);
}

template <class D, std::uint32_t Tag>
void ProceduralTexture<D, Tag>::writeXml(AssetXmlWriter& w, std::u16string url) {
    const ProceduralLayout<D>& l = layoutOf<D>();
    TextureFrame frame(w, *this, url);
    std::vector<SlotRef> refs;
    refs.reserve(l.slots.size());
    for (const TextureSlot<D>& s : l.slots) {
        refs.push_back(s.generator ? frame.slot(self().*s.generator, s.word)
                                   : frame.slot(self().*s.texture, s.word));
    }
    frame.open();
    std::size_t n = 0;
    for (const TextureSlot<D>& s : l.slots) frame.writeRef(s.word, refs[n++]);
    writeParams(w, self(), l.params);
    frame.close();
}

template class ProceduralTexture<RampTexture, 11>;
template class ProceduralTexture<BulgeTexture, 8>;
template class ProceduralTexture<GridTexture, 6>;
template class ProceduralTexture<ClothTexture, 7>;
template class ProceduralTexture<NoiseTexture, 3>;
template class ProceduralTexture<CheckerTexture, 4>;

}  // namespace OrvaneLumoCore
