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

// Fields that every light of this file but the sphere has, with the same
// defaults in all.
struct SceneLightFields {
    Color color{1, 1, 1};
    Color shadowColor{0, 0, 0};
    float shadowBias = 0.0f;
    float storedFactor = 1.0f;
    std::int32_t photonSubdivs = 500;
    std::int32_t causticSubdivs = 1000;
    std::int32_t storedMode = 3;
    bool enabled = true;
    bool shadows = true;
};

class MayaDirectLight : public LightOf<MayaDirectLight, 0>, public SceneLightFields {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    bool sameContent(const MayaDirectLight& o) const;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"MayaLightDirect"; }

    AnimatedTransform transform;  // identity at time 0
    float intensity = 1.0f;
    float shadowRadius = 0.0f;
    std::int32_t shadowSubdivs = 8;
};

// The further fields that the omni, spot and rectangle lights share.
struct PlacedLightFields : SceneLightFields {
    Transform transform;
    float cutoffThreshold = 0.005f;
    std::int32_t units = 0;
    bool affectDiffuse = true;
    bool affectSpecular = true;
};

// The further fields of the omni and spot lights.
struct PointLightFields : PlacedLightFields {
    float shadowRadius = 0.0f;
    float decay = 0.0f;
    std::int32_t shadowSubdivs = 8;
};

class OmniLight : public TableLightOf<OmniLight, 2>, public PointLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<OmniLight>> record();

    std::u16string getPluginName() const override { return u"LightOmni"; }

    float intensity = 30.0f;
};

class SpotLight : public TableLightOf<SpotLight, 4>, public PointLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<SpotLight>> record();

    // Always on; the consumer reads it as a setting of its own.
    void writeConstantParams(AssetXmlWriter& writer) const;
    std::u16string getPluginName() const override { return u"LightSpot"; }

    float intensity = 50.0f;
    float barnDoorLeft = 20.0f;
    float barnDoorRight = 20.0f;
    float barnDoorTop = 20.0f;
    float barnDoorBottom = 20.0f;
    float coneAngle = 1.0f;
    float penumbraAngle = 0.0f;
    bool barnDoor = false;
};

class RectangleLight : public TableLightOf<RectangleLight, 3>, public PlacedLightFields {
public:
    static constexpr int kRecordVersion = 4;
    static RowSpan<RecordRow<RectangleLight>> record();

    std::u16string getPluginName() const override { return u"LightRectangle"; }

    float intensity = 30.0f;
    float u_size = 1.0f;
    float v_size = 1.0f;
    std::int32_t subdivs = 8;
    bool doubleSided = false;
    bool invisible = false;
    bool lightPortal = false;
    bool noDecay = false;
    bool storeWithIrradianceMap = false;
    bool ignoreLightNormals = true;
    bool affectReflections = true;
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
