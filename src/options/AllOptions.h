#pragma once
// The whole render options document: every render setting of one scene, with
// the environment textures, the physical camera and the output paths. An
// options file holds exactly one record of it.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "animation/Camera.h"
#include "options/OptionRecords.h"
#include "options/OrvaneOptionsBase.h"
#include "persistence/FieldRows.h"
#include "textures/BaseTexture.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class AllOptions : public OrvaneOptionsBase {
public:
    // The record's tag has 1 in its low half, unlike every other record.
    static constexpr std::uint32_t kTagLowHalf = 1;
    static constexpr int kVersion = 23;
    // A path field keeps at most this many characters.
    static constexpr std::size_t kMaxPathLength = 2047;

    AllOptions();

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    // Defaults of a document: the groups' own defaults, four parameters that
    // differ from a bare OrvaneParams, the channels 126 and 125, no textures
    // and empty paths.
    void reset() override;
    // The 22 settings blocks of the document, each in an Assets element of its
    // own, under `url`.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    // How many settings blocks writeXml writes: every one, always.
    static std::size_t documentBlockCount();
    // The record's table; its rows name the blocks and parameters that show them.
    static RowSpan<RecordRow<AllOptions>> record();
    std::u16string getPluginName() const override { return u"AllOptions"; }

    // Name of a render channel number (100 to 133), or null for another number.
    static const char16_t* channelName(std::int32_t channel);

    // A parameter of the document that holds a file path or a texture: its
    // block's name, its own name and the field (one of the two pointers is
    // set). The pointers are into this object.
    struct DocumentField {
        const char16_t* block;
        const char* parameter;
        const std::u16string* path;
        const TexturePtr* texture;
    };
    // Every such parameter, in document order.
    std::vector<DocumentField> pathAndTextureFields() const;

    OrvaneParams params;
    OrvaneFrameData frameData;
    OrvaneLFBStampInfo stampInfo;

    Color environment_bg_color;
    Color environment_gi_color;
    Color options_mtl_override_color;
    Color environment_reflect_color;
    Color environment_refract_color;

    // Environment textures; each may be empty. A copy shares them.
    TexturePtr bgTexture;
    TexturePtr giTexture;
    TexturePtr reflectTexture;
    TexturePtr refractTexture;

    // Render channel numbers, in order; see channelName.
    std::vector<std::int32_t> renderChannels;

    std::int32_t filterKernel;  // SettingsImageFilter type, with 1 and 2 exchanged in the XML
    std::int32_t output_img_height;
    std::int32_t output_img_width;
    LumoUtils::Bool32 camera_override_fov;
    LumoUtils::Bool32 output_override_viewport;
    LumoUtils::Bool32 output_img_imageAspectLocked;
    LumoUtils::Bool32 output_img_pixelAspectLocked;
    LumoUtils::Bool32 output_img_rawFile;
    LumoUtils::Bool32 output_save_render;
    LumoUtils::Bool32 environment_use_gi;
    LumoUtils::Bool32 environment_use_bg;
    LumoUtils::Bool32 focalDistFromCamera;  // SettingsCameraDof override_focal_dist, inverted
    std::int32_t options_show_progress_window;
    LumoUtils::Bool32 physicalCameraOn;
    LumoUtils::Bool32 overrideFocalLength;
    float camera_fov;
    // Each environment multiplier exists for the colour and for the texture;
    // the XML shows the texture's when the texture is there.
    float giColorMult;
    float bgColorMult;
    float giTextureMult;
    float bgTextureMult;
    float filterSize;
    float output_img_pixelAspect;
    float output_img_imageAspect;
    float renderChannels_zdepth_black;
    float renderChannels_zdepth_white;
    LumoUtils::Bool32 renderChannels_zdepth_clamp;
    std::int32_t options_batch_render;
    LumoUtils::Bool32 colorMapping_gamma_correct_rgb;
    LumoUtils::Bool32 colorMapping_gamma_correct_ldr_textures;
    LumoUtils::Bool32 output_do_animation;
    std::int32_t output_frame_rate;
    float output_frames_per_second;
    float reflectColorMult;
    float refractColorMult;
    float reflectTextureMult;
    float refractTextureMult;
    LumoUtils::Bool32 environment_use_reflect;
    LumoUtils::Bool32 environment_use_refract;
    LumoUtils::Bool32 drOn;
    // Carried from record to record; `reset` leaves them alone.
    float keptFloat1 = 0;
    float keptFloat2 = 0;
    float colorMapping_input_gamma;
    std::int32_t keptInt1;
    LumoUtils::Bool32 drAssetColl;
    std::int32_t drMode;
    std::u16string dr_folder;
    std::int32_t keptInt2;
    LumoUtils::Bool32 specifyFilmWidth;

    PhysicalCamera physicalCamera;

    // Paths, at most kMaxPathLength characters each.
    std::u16string output_img_file;
    std::u16string output_luimg_file;
    std::u16string irradianceMap_file;
    std::u16string irradianceMap_auto_save_file;
    std::u16string lightCache_file;
    std::u16string lightCache_auto_save_file;
    std::u16string photonMap_file;
    std::u16string photonMap_auto_save_file;
    std::u16string caustics_file;
    std::u16string caustics_auto_save_file;
};

}  // namespace OrvaneLumoCore
