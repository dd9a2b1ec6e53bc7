#pragma once
// Lights placed in a scene: infinite direct, omni, spot, rectangle and
// sphere lights. Their records carry `storedFactor` and `storedMode`, which
// no XML shows; `save` gives back what `load` read.
#include <cstdint>
#include <string>

#include "animation/Animated.h"
#include "lights/LightFrame.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// Fields that every light of this file but the sphere has; each light's
// table gives their defaults, the same in all.
struct SceneLightFields {
    Color color;
    Color shadowColor;
    float shadowBias;
    float storedFactor;
    std::int32_t photonSubdivs;
    std::int32_t causticSubdivs;
    std::int32_t storedMode;
    bool enabled;
    bool shadows;
};

class MayaDirectLight : public LightOf<MayaDirectLight, 0>, public SceneLightFields {
public:
    MayaDirectLight();  // the table's defaults
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    bool sameContent(const MayaDirectLight& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MayaLightDirect"; }

    AnimatedTransform transform;  // identity at time 0
    float intensity;
    float shadowRadius;
    std::int32_t shadowSubdivs;
};

// The further fields that the omni, spot and rectangle lights share.
struct PlacedLightFields : SceneLightFields {
    Transform transform;
    float cutoffThreshold;
    std::int32_t units;
    bool affectDiffuse;
    bool affectSpecular;
};

// The further fields of the omni and spot lights.
struct PointLightFields : PlacedLightFields {
    float shadowRadius;
    float decay;
    std::int32_t shadowSubdivs;
};

class OmniLight : public TableLightOf<OmniLight, 2>, public PointLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<OmniLight>> record();

    OmniLight() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"LightOmni"; }

    float intensity;
};

class SpotLight : public TableLightOf<SpotLight, 4>, public PointLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<SpotLight>> record();

    SpotLight() { setTableDefaults(); }
    // Always on; the consumer reads it as a setting of its own.
    void writeConstantParams(AssetXmlWriter& writer) const;
    std::u16string getPluginName() const override { return u"LightSpot"; }

    float intensity;
    float barnDoorLeft;
    float barnDoorRight;
    float barnDoorTop;
    float barnDoorBottom;
    float coneAngle;
    float penumbraAngle;
    bool barnDoor;
};

class RectangleLight : public TableLightOf<RectangleLight, 3>, public PlacedLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<RectangleLight>> record();

    RectangleLight() { setTableDefaults(); }
    std::u16string getPluginName() const override { return u"LightRectangle"; }

    float intensity;
    float u_size;
    float v_size;
    std::int32_t subdivs;
    bool doubleSided;
    bool invisible;
    bool lightPortal;
    bool noDecay;
    bool storeWithIrradianceMap;
    bool ignoreLightNormals;
    bool affectReflections;
};

// Carries its settings in the record only: it writes no XML and has no
// plugin name.
class SphereLight : public LightOf<SphereLight, 7> {
public:
    static constexpr int kRealCount = 4;
    static constexpr int kIntCount = 4;
    static constexpr int kFlagCount = 8;
    static constexpr int kVersion1FlagCount = 5;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    bool sameContent(const SphereLight& o) const;

    Color color{1, 1, 1};
    Color shadowColor{0, 0, 0};
    Transform transform;
    // Three groups that the record holds without names.
    float reals[kRealCount] = {0.0f, 0.005f, 1.0f, 1.0f};
    std::int32_t ints[kIntCount] = {500, 1000, 0, 8};
    bool flags[kFlagCount] = {true, true, false, false, false, true, true, true};
};

}  // namespace OrvaneLumoCore
