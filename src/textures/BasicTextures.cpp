#include "textures/BasicTextures.h"

#include <algorithm>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/TextureFrame.h"
#include "textures/TextureRows.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

// The colour that XML shows for a stored complement: max(0, 1 - c) per channel.
Color complement(const Color& c) {
    return Color(std::max(0.0f, 1.0f - c.r), std::max(0.0f, 1.0f - c.g),
                 std::max(0.0f, 1.0f - c.b));
}

}  // namespace

// ---- FresnelTexture ------------------------------------------------------------

typedef FresnelTexture Fr;

// The colours are stored as complements; the XML shows max(0, 1 - c).
enum FresnelForm { kComplement = 1 };

// The complement that a new texture holds for its black colour: 0.25490198.
constexpr float kGrey = 0x1.050506p-2f;

typedef RecordRow<Fr> FrRow;
const FrRow kFresnelRecord[] = {
    FrRow(&Fr::whiteInverse, "white_color").shownBy(kComplement).byDefault(kWhite),
    FrRow(&Fr::blackInverse, "black_color").shownBy(kComplement).byDefault(Color(kGrey, kGrey, kGrey)),
    FrRow(&Fr::fresnel_ior, "fresnel_ior").byDefault(1.55),
    FrRow(&Fr::refract_ior, "refract_ior").byDefault(1.55),
    FrRow(&Fr::black_color_tex_mult, 2, "black_color_tex_mult").byDefault(1),
    FrRow(&Fr::white_color_tex_mult, 2, "white_color_tex_mult").byDefault(1),
    FrRow(&Fr::fresnel_ior_tex_mult, 2, "fresnel_ior_tex_mult").byDefault(1),
    FrRow(&Fr::refract_ior_tex_mult, 2, "refract_ior_tex_mult").byDefault(1),
    // The first texture feeds the black colour and the second the white one,
    // crosswise to the colours above.
    RecordRow<Fr>(&Fr::reflection_tex, 2, "black_color_tex").slot(u"reflection_tex"),
    RecordRow<Fr>(&Fr::refraction_tex, 2, "white_color_tex").slot(u"refraction_tex"),
    {&Fr::fresnel_ior_tex, 2, "fresnel_ior_tex"},
    {&Fr::refract_ior_tex, 2, "refract_ior_tex"},
};

TextureTable<Fr> textureTable(const Fr&) { return {2, rowSpan(kFresnelRecord)}; }

void FresnelTexture::writeOwnForm(AssetXmlWriter& w, const RecordRow<Fr>& row) const {
    w.writeColor(row.xml.name, complement(row.field.get<Color>(*this)));
}

template class TableTextureOf<FresnelTexture, 1>;

// ---- BlendTexture --------------------------------------------------------------
//
// Written by hand: a multiplier is in the record only behind a present texture.

bool BlendTexture::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    if (!saveOptionalMember(ar, color_a)) return false;
    if (color_a) ar.writeFloat(colorAMult);
    if (!saveOptionalMember(ar, color_b)) return false;
    if (color_b) ar.writeFloat(colorBMult);
    ar.writeFloat(blend_amount);
    return true;
}

bool BlendTexture::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, 2);
    if (v < 0) return false;
    if (!loadOptionalMember(ar, color_a, createTexture)) return false;
    if (v >= 2 && color_a) ar.readFloat(colorAMult);
    if (!loadOptionalMember(ar, color_b, createTexture)) return false;
    if (v >= 2 && color_b) ar.readFloat(colorBMult);
    ar.readFloat(blend_amount);
    return true;
}

void BlendTexture::finishClone() {
    color_a = cloneChild(color_a);
    color_b = cloneChild(color_b);
}

bool BlendTexture::sameContent(const BlendTexture& o) const {
    return childrenEqual(color_a, o.color_a) && childrenEqual(color_b, o.color_b) &&
           colorAMult == o.colorAMult && colorBMult == o.colorBMult &&
           blend_amount == o.blend_amount;
}

void BlendTexture::writeXml(AssetXmlWriter& w, std::u16string url) {
    TextureFrame frame(w, *this, url);
    const SlotRef a = frame.slot(color_a, u"color_a");
    const SlotRef b = frame.slot(color_b, u"color_b");
    frame.open();
    frame.writeRef("color_a", a);
    frame.writeRef("color_b", b);
    w.writeFloat("blend_amount", blend_amount);
    frame.close();
}

// ---- InvertTexture -------------------------------------------------------------

// The child's slot is "base_texture", the parameter that refers to it "texture".
const RecordRow<InvertTexture> kInvertRecord[] = {
    required(RecordRow<InvertTexture>(&InvertTexture::texture, "texture").slot(u"base_texture")),
    {&InvertTexture::invert_alpha, "invert_alpha"},
};

TextureTable<InvertTexture> textureTable(const InvertTexture&) { return {1, rowSpan(kInvertRecord)}; }

template class TableTextureOf<InvertTexture, 9>;

// ---- AColorTexture -------------------------------------------------------------

const RecordRow<AColorTexture> kAColorRecord[] = {
    RecordRow<AColorTexture>(&AColorTexture::color, "texture").byDefault(AColor(1, 1, 1, 1)),
};

TextureTable<AColorTexture> textureTable(const AColorTexture&) { return {1, rowSpan(kAColorRecord)}; }

template class TableTextureOf<AColorTexture, 5>;

}  // namespace OrvaneLumoCore
