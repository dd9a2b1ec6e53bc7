#pragma once
// The UVW generators and the texture that shows one. Their defaults are their
// member initialisers; the records are written by hand, since old versions
// hold parts of the components inside the record. A generator keeps each
// placement twice: as a stored transform and as its components. The
// components are the source; syncTransforms recomputes the transforms from
// them before XML is written, so a transform read from a file never reaches
// the XML on its own.
#include <cstdint>
#include <string>

#include "animation/TransformComponents.h"
#include "persistence/FamilyOf.h"
#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"
#include "textures/TableTextureOf.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// The 3x3 part composed from components, in f32: A B C with
//   A = (fx,0,0), (0,cos x,sin x), (0,-sin x,cos x)
//   B = (cos y,0,-sin y), (0,fy,0), (sin y,0,cos y)
//   C = (cos z,sin z,0), (-sin z,cos z,0), (0,0,fz)
// given by columns (the order of Matrix::m), angles in degrees turned into
// radians by the f32 factor 0.017453292, and f = scale, negated where the
// axis is mirrored.
Matrix composeMatrix(const TransformComponents& c);
// The composed 3x3 part and the components' offsets.
Transform composeTransform(const TransformComponents& c);

// Channel mapping: a transform of the uvw channel and one of the texture.
class GenChannelUVW : public FamilyOf<GenChannelUVW, 4, BaseUVW> {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void syncTransforms() override;
    bool sameContent(const GenChannelUVW& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"UVWGenChannel"; }

    Transform uvwTransform;
    Transform texTransform;
    TransformComponents uvwComponents;
    TransformComponents texComponents;
    std::int32_t wrap_u = 0;
    std::int32_t wrap_v = 0;
    std::int32_t uvw_channel = 1;
};

// Environment mapping; `mapping_type` indexes kMappingTypeLabels.
class GenEnvironmentUVW : public FamilyOf<GenEnvironmentUVW, 3, BaseUVW> {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void syncTransforms() override;
    bool sameContent(const GenEnvironmentUVW& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"UVWGenEnvironment"; }

    std::int32_t mapping_type = 2;
    Matrix uvw_matrix;
    TransformComponents uvwComponents;
};

extern const char16_t* const kMappingTypeLabels[4];

// The label of a mapping type; empty for a value outside the table, which a
// record may hold since it isn't checked on reading.
std::u16string mappingTypeLabel(std::int32_t mappingType);

// A generator with one placement; planar world and object mapping differ only
// in tag and plugin name.
class GenPlacementUVW : public BaseUVW {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void syncTransforms() override;
    bool sameContent(const GenPlacementUVW& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;

    Transform uvwTransform;
    TransformComponents uvwComponents;

protected:
    GenPlacementUVW() = default;
};

class GenPlanarWorldUVW : public FamilyOf<GenPlanarWorldUVW, 0, GenPlacementUVW> {
public:
    std::u16string getPluginName() const override { return u"UVWGenPlanarWorld"; }
};

class GenObjectUVW : public FamilyOf<GenObjectUVW, 1, GenPlacementUVW> {
public:
    std::u16string getPluginName() const override { return u"UVWGenObject"; }
};

// A texture that only shows its generator.
class UVWTexture : public TableTextureOf<UVWTexture, 2> {
public:
    UVWTexture() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"TexUVW"; }

    UVWPtr uvw;  // required: save fails without it
};

extern template class TableTextureOf<UVWTexture, 2>;

}  // namespace OrvaneLumoCore
