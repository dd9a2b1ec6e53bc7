#pragma once
// The physical camera (lens, shutter and film of a real camera) and the render
// view (an animated camera transform and the image size).
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "animation/Animated.h"
#include "animation/BaseCamera.h"
#include "persistence/FieldRows.h"
#include "persistence/Serializable.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class PhysicalCamera : public BaseCamera {
public:
    static constexpr std::uint32_t kType = 0;

    PhysicalCamera();
    ~PhysicalCamera() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    std::uint32_t getType() const override { return kType; }
    boost::shared_ptr<BaseCamera> clone() const override;
    void reset() override;

    // The camera's settings are written by the options document; the camera
    // itself writes nothing.
    void writeXml(AssetXmlWriter&, std::u16string) override {}
    std::u16string getPluginName() const override { return u"CameraPhysical"; }
    std::u16string getAssetType() const override { return u"settings"; }

    // The record's table. Its shown rows are the parameters of the options
    // document's CameraPhysical block; a hook row stands for an animated value.
    static RowSpan<RecordRow<PhysicalCamera>> record();
    const AnimatedReal& animated(const RecordRow<PhysicalCamera>& row) const;

    bool operator==(const PhysicalCamera& o) const;
    bool operator!=(const PhysicalCamera& o) const { return !(*this == o); }

    std::int32_t type;
    float film_width;
    AnimatedReal focal_length;
    float zoom_factor;
    float distortion;
    float f_number;
    float lens_shift;
    float shutter_speed;
    float shutter_angle;
    float shutter_offset;
    float latency;
    float ISO;
    bool specify_focus;
    AnimatedReal focus_distance;
    bool targeted;
    float target_distance;
    float dof_display_threshold;
    bool exposure;
    Color white_balance;
    bool vignetting;
    bool blades_enable;
    std::int32_t blades_num;
    float blades_rotation;
    float center_bias;
    float anisotropy;
    bool use_dof;
    bool use_moblur;
    std::int32_t subdivs;
};

// A view, saved and loaded on its own; its XML holds only the image size.
class RenderView : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    RenderView();
    ~RenderView() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    virtual void reset();

    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"RenderView"; }
    std::u16string getAssetType() const override { return u"settings"; }

    bool operator==(const RenderView& o) const;
    bool operator!=(const RenderView& o) const { return !(*this == o); }

    AnimatedTransform cameraTransform;
    Rect viewRect1;
    Rect viewRect2;
    AnimatedReal viewAngle;
    AnimatedReal viewReal2;
    AnimatedReal viewReal3;
    std::int32_t img_width;
    std::int32_t img_height;
    AnimatedInt viewState;
};

}  // namespace OrvaneLumoCore
