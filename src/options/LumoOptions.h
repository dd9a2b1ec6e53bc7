#pragma once
// The renderer's plain option structures. The option classes of the model
// derive from them and add the records; the structures themselves know
// nothing of archives or XML.
//
// Field names of settings are the XML group and parameter they feed
// ("imageSampler_dmc_threshold" is `dmc_threshold` of SettingsImageSampler);
// fields named `kept...` reach no XML and are only carried through records.
#include <cstdint>
#include <cstring>
#include <string>

#include "values/Types.h"

namespace LumoUtils {

// Base of the renderer's plugin-like structures. Nothing here uses it as a
// plugin; it only has to be a polymorphic base.
class PluginBase {
public:
    virtual ~PluginBase() = default;
};

// A 32-bit flag as records hold it: any value but 0 means true. Kept as the
// whole integer so that a record reads back exactly as it was stored.
typedef std::int32_t Bool32;

struct LumoParams {
    // image filter and sampler
    Bool32 imageFilter_on;
    std::int32_t imageSampler_type;
    std::int32_t imageSampler_fixed_subdivs;
    std::int32_t imageSampler_dmc_minSubdivs;
    std::int32_t imageSampler_dmc_maxSubdivs;
    float imageSampler_dmc_threshold;
    std::int32_t imageSampler_subdivision_minRate;
    std::int32_t imageSampler_subdivision_maxRate;
    float imageSampler_subdivision_threshold;
    Bool32 imageSampler_subdivision_jitter;
    Bool32 imageSampler_subdivision_edges;
    std::int32_t kept12;
    Bool32 imageSampler_subdivision_normals;
    float imageSampler_subdivision_normals_threshold;
    std::int32_t kept15;
    float kept16;

    // camera, depth of field, motion blur
    std::int32_t camera_type;
    Bool32 cameraDof_on;
    std::int32_t cameraDof_subdivs;
    float cameraDof_center_bias;
    Bool32 cameraDof_sides_on;
    std::int32_t cameraDof_sides_num;
    float cameraDof_anisotropy;
    Bool32 motionBlur_on;
    std::int32_t motionBlur_geom_samples;
    std::int32_t kept26;
    std::int32_t kept27;
    std::int32_t motionBlur_subdivs;
    float kept29;
    std::int32_t kept30;
    std::int32_t kept31;
    std::int32_t kept32;
    float kept33;
    std::int32_t motionBlur_low_samples;
    float motionBlur_duration;
    float motionBlur_interval_center;
    std::int32_t kept37;
    float motionBlur_bias;

    // global illumination
    Bool32 gi_on;
    Bool32 gi_refract_caustics;
    Bool32 gi_reflect_caustics;
    float gi_saturation;
    float gi_contrast;
    float gi_contrast_base;
    std::int32_t gi_primary_engine;
    float gi_primary_multiplier;
    std::int32_t gi_secondary_engine;
    float gi_secondary_multiplier;
    std::int32_t dmcGI_subdivs;
    std::int32_t dmcGI_depth;
    Bool32 gi_save_maps_per_frame;

    // irradiance map
    std::int32_t irradianceMap_min_rate;
    std::int32_t irradianceMap_max_rate;
    std::int32_t irradianceMap_subdivs;
    std::int32_t irradianceMap_interp_samples;
    std::int32_t irradianceMap_calc_interp_samples;
    float irradianceMap_color_threshold;
    float irradianceMap_normal_threshold;
    float irradianceMap_distance_threshold;
    Bool32 irradianceMap_show_samples;
    std::int32_t irradianceMap_interpolation_mode;
    std::int32_t irradianceMap_mode;
    Bool32 irradianceMap_dont_delete;
    Bool32 irradianceMap_randomize_samples;
    Bool32 irradianceMap_show_calc_phase;
    Bool32 irradianceMap_show_direct_light;
    Bool32 irradianceMap_multipass;
    Bool32 irradianceMap_auto_save;
    std::string imKeptPath1;
    std::int32_t irradianceMap_lookup_mode;
    Bool32 irradianceMap_check_sample_visibility;
    std::int32_t kept72;
    std::string imKeptPath2;
    Bool32 irradianceMap_detail_enhancement;
    float irradianceMap_detail_radius;
    float irradianceMap_detail_subdivs_mult;
    std::int32_t irradianceMap_detail_scale;

    // photon map
    std::int32_t photonMap_bounces;
    float photonMap_search_distance;
    std::int32_t photonMap_max_photons;
    Bool32 photonMap_prefilter;
    std::int32_t photonMap_prefilter_samples;
    std::int32_t photonMap_mode;
    float photonMap_multiplier;
    Bool32 photonMap_auto_search_distance;
    Bool32 photonMap_convex_hull_estimate;
    Bool32 photonMap_dont_delete;
    Bool32 photonMap_auto_save;
    std::string pmKeptPath1;
    float photonMap_retrace_corners;
    std::int32_t photonMap_retrace_bounces;
    Bool32 photonMap_store_direct_light;
    float photonMap_max_density;
    std::string pmKeptPath2;

    // light cache
    std::int32_t lightCache_subdivs;
    float lightCache_sample_size;
    std::int32_t lightCache_filter_type;
    float lightCache_filter_size;
    std::int32_t lightCache_depth;
    Bool32 lightCache_show_calc_phase;
    Bool32 lightCache_store_direct_light;
    std::int32_t lightCache_world_scale;
    std::int32_t lightCache_mode;
    std::string lcKeptPath1;
    Bool32 lightCache_dont_delete;
    Bool32 lightCache_auto_save;
    std::string lcKeptPath2;
    std::int32_t lightCache_filter_samples;
    Bool32 lightCache_prefilter;
    std::int32_t lightCache_prefilter_samples;
    Bool32 lightCache_use_for_glossy_rays;
    std::int32_t lightCache_num_passes;
    Bool32 lightCache_adaptive_sampling;

    // caustics
    Bool32 caustics_on;
    float caustics_search_distance;
    std::int32_t caustics_max_photons;
    float caustics_multiplier;
    float caustics_max_density;
    std::int32_t caustics_mode;
    Bool32 caustics_dont_delete;
    Bool32 caustics_auto_save;
    std::string causticsKeptPath1;
    std::string causticsKeptPath2;

    // raycaster, regions, DMC sampler
    std::int32_t raycaster_maxLevels;
    float raycaster_minLeafSize;
    float raycaster_faceLevelCoef;
    std::int32_t raycaster_dynMemLimit;
    std::int32_t regionsGenerator_xc;
    std::int32_t regionsGenerator_yc;
    std::int32_t regionsGenerator_xymeans;
    std::int32_t regionsGenerator_seqtype;
    std::int32_t regionsGenerator_reverse;
    Bool32 dmcSampler_time_dependent;
    float dmcSampler_adaptive_amount;
    float dmcSampler_adaptive_threshold;
    std::int32_t dmcSampler_adaptive_min_samples;
    float dmcSampler_subdivs_mult;
    std::int32_t dmcSampler_path_sampler_type;

    // colour mapping
    std::int32_t colorMapping_type;
    Bool32 colorMapping_affect_background;
    Bool32 colorMapping_clamp_output;
    Bool32 colorMapping_subpixel_mapping;
    float colorMapping_gamma;

    // options
    Bool32 options_geom_displacement;
    Bool32 options_light_doLights;
    Bool32 options_light_doShadows;
    Bool32 options_light_doDefaultLights;
    Bool32 options_light_onlyGI;
    Bool32 options_light_doHiddenLights;
    Bool32 options_mtl_reflectionRefraction;
    Bool32 options_mtl_limitDepth;
    std::int32_t options_mtl_maxDepth;
    Bool32 options_mtl_doMaps;
    Bool32 options_mtl_filterMaps;
    std::int32_t options_mtl_transpMaxLevels;
    float options_mtl_transpCutoff;
    Bool32 options_mtl_glossy;
    Bool32 options_gi_dontRenderImage;
    Bool32 options_mtl_override_on;
    float options_ray_bias;
    std::int32_t kept163;
    Bool32 options_misc_lowThreadPriority;

    // default displacement
    Bool32 defaultDisplacement_override_on;
    float defaultDisplacement_edgeLength;
    Bool32 defaultDisplacement_viewDependent;
    std::int32_t defaultDisplacement_maxSubdivs;
    Bool32 defaultDisplacement_tightBounds;
    float defaultDisplacement_amount;
    Bool32 defaultDisplacement_relative;
    std::int32_t kept172;
    std::int32_t kept173;

    // Settings that no record holds: they keep the value of `reset`.
    std::int32_t irradianceMap_interp_frames;
    Bool32 irradianceMap_multiple_views;
    Bool32 photonMap_show_calc_phase;
    Bool32 lightCache_adaptive_dirs_only;
    std::int32_t lightCache_min_paths_per_sample;
    Bool32 lightCache_multiple_views;
    Bool32 caustics_show_calc_phase;
    std::int32_t raycaster_optLevel;
    Bool32 colorMapping_adaptation_only;
    float colorMapping_clamp_level;
    Bool32 colorMapping_linearWorkflow;
    Bool32 options_geom_doHidden;
    Bool32 options_mtl_filterMapsForSecondaryRays;
    Bool32 options_geom_backfaceCull;
};

using OrvaneLumoCore::TransformD;

struct LumoFrameData : public PluginBase {
    double t;
    double frameStart;
    double frameEnd;
    std::int32_t currentFrame;
    TransformD worldToCam;
    TransformD camToWorld;
    float fov;
    float nearRange;
    float farRange;
    float cameraDof_focal_dist;
    float cameraDof_aperture;
    float cameraDof_rotation;
    std::int32_t clippingPlanes;
    float clipNear;
    float clipFar;
    std::int32_t projType;
    float zoomFractor;
    std::int32_t infiniteProj;
    float camera_height;
    Bool32 camera_auto_fit;
    float camera_dist;
    float camera_curve;
    std::int32_t orthoAdjustToScene;
    OrvaneLumoCore::Color ambient;
    OrvaneLumoCore::Color background;
    OrvaneLumoCore::Color globalLightLevel;
    OrvaneLumoCore::Color lumoGIBackground;
    OrvaneLumoCore::Color lumoRRBackground;
    OrvaneLumoCore::Color lumoRefractBackground;
    float output_rgn_left;
    float output_rgn_width;
    float output_rgn_top;
    float output_rgn_height;
    std::int32_t keptFrame34;
    std::int32_t keptFrame35;
    std::int32_t output_bmp_width;
    std::int32_t output_bmp_height;
    std::int32_t output_r_left;
    std::int32_t output_r_width;
    std::int32_t output_r_top;
    std::int32_t output_r_height;
    float devAspect;
    std::int32_t fieldMask;
    std::int32_t fieldOrder;
    std::int32_t firstField;
    float colorMapping_dark_mult;
    float colorMapping_bright_mult;
};

struct LumoLFBStampInfo {
    static constexpr int kFontNameSize = 100;
    static constexpr int kFontDescriptionSize = 60;

    LumoLFBStampInfo() {
        std::memset(fontName, 0, sizeof fontName);
        std::strcpy(fontName, "Helvetica");
        std::memset(fontDescription, 0, sizeof fontDescription);
    }

    std::int32_t stampFlag = 0;
    std::string text;  // narrow text
    std::int32_t stampValue1 = 0;
    std::int32_t stampValue2 = 0;
    std::int32_t fontSize = 8;
    std::int32_t fontReserved[3] = {0, 0, 0};
    char fontName[kFontNameSize];
    // Opaque to this system: carried from record to record.
    std::uint8_t fontDescription[kFontDescriptionSize];
};

}  // namespace LumoUtils
