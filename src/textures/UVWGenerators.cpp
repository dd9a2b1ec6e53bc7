#include "textures/UVWGenerators.h"

#include <cmath>
#include <cstring>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "textures/TextureFrame.h"
#include "textures/TextureRows.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// ---- composition -----------------------------------------------------------------

namespace {

float degreesToRadians(float degrees) {
    const std::uint32_t bits = 0x3C8EFA35u;  // 0.017453292f
    float factor;
    std::memcpy(&factor, &bits, sizeof factor);
    return degrees * factor;
}

Vector scaled(const Vector& v, float f) { return Vector(v.x * f, v.y * f, v.z * f); }
Vector sum(const Vector& a, const Vector& b) { return Vector(a.x + b.x, a.y + b.y, a.z + b.z); }

// a b, both by columns: column j of the product is a applied to column j of b,
// summed over a's columns from the first to the last.
Matrix product(const Matrix& a, const Matrix& b) {
    Matrix r;
    for (int j = 0; j < 3; ++j) {
        const Vector& col = b.m[j];
        r.m[j] = sum(sum(scaled(a.m[0], col.x), scaled(a.m[1], col.y)), scaled(a.m[2], col.z));
    }
    return r;
}

float axisFactor(const TransformComponents& c, int axis) {
    return c.mirror[axis] != 0 ? -c.scale[axis] : c.scale[axis];
}

}  // namespace

Matrix composeMatrix(const TransformComponents& c) {
    const float x = degreesToRadians(c.rotation.x);
    const float y = degreesToRadians(c.rotation.y);
    const float z = degreesToRadians(c.rotation.z);
    // Cosine and sine in double, rounded once: the C library's
    // single-precision functions differ in the last bit between versions.
    const auto cosine = [](float a) { return static_cast<float>(std::cos(static_cast<double>(a))); };
    const auto sine = [](float a) { return static_cast<float>(std::sin(static_cast<double>(a))); };
    const float cx = cosine(x), sx = sine(x);
    const float cy = cosine(y), sy = sine(y);
    const float cz = cosine(z), sz = sine(z);
    const float fx = axisFactor(c, 0), fy = axisFactor(c, 1), fz = axisFactor(c, 2);
    const Matrix a(Vector(fx, 0, 0), Vector(0, cx, sx), Vector(0, -sx, cx));
    const Matrix b(Vector(cy, 0, -sy), Vector(0, fy, 0), Vector(sy, 0, cy));
    const Matrix cm(Vector(cz, sz, 0), Vector(-sz, cz, 0), Vector(0, 0, fz));
    return product(product(a, b), cm);
}

Transform composeTransform(const TransformComponents& c) {
    return Transform(composeMatrix(c), c.offset);
}

// ---- GenChannelUVW -----------------------------------------------------------------

bool GenChannelUVW::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    ar.writeTransform(uvwTransform);
    ar.writeTransform(texTransform);
    ar.writeInt(wrap_u);
    ar.writeInt(wrap_v);
    ar.writeInt(uvw_channel);
    return uvwComponents.save(ar) && texComponents.save(ar);
}

bool GenChannelUVW::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, 2);
    if (v < 0) return false;
    ar.readTransform(uvwTransform);
    ar.readTransform(texTransform);
    if (v == 1) {
        // The old record holds only the x and y rotation and mirror of the
        // texture placement.
        ar.readFloat(texComponents.rotation.x);
        ar.readFloat(texComponents.rotation.y);
        ar.readInt(texComponents.mirror[0]);
        ar.readInt(texComponents.mirror[1]);
    }
    ar.readInt(wrap_u);
    ar.readInt(wrap_v);
    ar.readInt(uvw_channel);
    if (v == 1) return true;
    return loadNested(ar, uvwComponents) && loadNested(ar, texComponents);
}

void GenChannelUVW::syncTransforms() {
    uvwTransform = composeTransform(uvwComponents);
    texTransform = composeTransform(texComponents);
}

bool GenChannelUVW::sameContent(const GenChannelUVW& o) const {
    return uvwTransform == o.uvwTransform && texTransform == o.texTransform &&
           uvwComponents == o.uvwComponents && texComponents == o.texComponents &&
           wrap_u == o.wrap_u && wrap_v == o.wrap_v && uvw_channel == o.uvw_channel;
}

void GenChannelUVW::writeXml(AssetXmlWriter& w, std::u16string url) {
    syncTransforms();
    TextureFrame frame(w, *this, url);
    frame.open();
    w.writeComponentTransform("uvw_transform", uvwComponents);
    w.writeTransform("tex_transform", texTransform);
    w.writeInteger("wrap_u", wrap_u);
    w.writeInteger("wrap_v", wrap_v);
    w.writeInteger("uvw_channel", uvw_channel);
    frame.close();
}

// ---- GenEnvironmentUVW -------------------------------------------------------------

const char16_t* const kMappingTypeLabels[4] = {u"angular", u"cubic", u"spherical",
                                               u"mirror_ball"};

std::u16string mappingTypeLabel(std::int32_t mappingType) {
    if (mappingType < 0 || mappingType >= 4) return std::u16string();
    return kMappingTypeLabels[mappingType];
}

bool GenEnvironmentUVW::save(QuickArchive& ar) const {
    writeVersion(ar, 2);
    ar.writeMatrix(uvw_matrix);
    ar.writeInt(mapping_type);
    return uvwComponents.save(ar);
}

bool GenEnvironmentUVW::load(QuickArchive& ar) {
    const int v = resetAndReadVersion(*this, ar, 2);
    if (v < 0) return false;
    ar.readMatrix(uvw_matrix);
    ar.readInt(mapping_type);
    if (v >= 2) return loadNested(ar, uvwComponents);
    // The old record holds z before x, in both pairs.
    ar.readFloat(uvwComponents.rotation.z);
    ar.readFloat(uvwComponents.rotation.x);
    ar.readInt(uvwComponents.mirror[2]);
    ar.readInt(uvwComponents.mirror[0]);
    return true;
}

void GenEnvironmentUVW::syncTransforms() { uvw_matrix = composeMatrix(uvwComponents); }

bool GenEnvironmentUVW::sameContent(const GenEnvironmentUVW& o) const {
    return mapping_type == o.mapping_type && uvw_matrix == o.uvw_matrix &&
           uvwComponents == o.uvwComponents;
}

void GenEnvironmentUVW::writeXml(AssetXmlWriter& w, std::u16string url) {
    syncTransforms();
    TextureFrame frame(w, *this, url);
    frame.open();
    w.writeComponentMatrix("uvw_matrix", uvwComponents);
    w.writeString("mapping_type", mappingTypeLabel(mapping_type));
    frame.close();
}

// ---- GenPlanarWorldUVW, GenObjectUVW ----------------------------------------------

bool GenPlacementUVW::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    ar.writeTransform(uvwTransform);
    return uvwComponents.save(ar);
}

bool GenPlacementUVW::load(QuickArchive& ar) {
    if (resetAndReadVersion(*this, ar, 1) < 0) return false;
    ar.readTransform(uvwTransform);
    return loadNested(ar, uvwComponents);
}

void GenPlacementUVW::syncTransforms() { uvwTransform = composeTransform(uvwComponents); }

bool GenPlacementUVW::sameContent(const GenPlacementUVW& o) const {
    return uvwTransform == o.uvwTransform && uvwComponents == o.uvwComponents;
}

void GenPlacementUVW::writeXml(AssetXmlWriter& w, std::u16string url) {
    syncTransforms();
    TextureFrame frame(w, *this, url);
    frame.open();
    w.writeComponentTransform("uvw_transform", uvwComponents);
    frame.close();
}

// ---- UVWTexture --------------------------------------------------------------------

namespace {
const RecordRow<UVWTexture> kUVWTextureRecord[] = {{&UVWTexture::uvw, "uvwgen"}};
}  // namespace

TextureTable<UVWTexture> textureTable(const UVWTexture&) { return {1, rowSpan(kUVWTextureRecord)}; }

template class TableTextureOf<UVWTexture, 2>;

}  // namespace OrvaneLumoCore
