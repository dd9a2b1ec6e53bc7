#include "options/OptionRecords.h"

#include <algorithm>
#include <cstring>

#include "options/DocumentBlocks.h"
#include "persistence/QuickArchive.h"
#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

using LumoUtils::LumoFrameData;
using LumoUtils::LumoParams;

namespace {

// ---- OrvaneParams ------------------------------------------------------------------
//
// Row numbers in the comments are the field's place in the record. The
// defaults are those of a document; OrvaneParams::reset differs in four. The
// options document shows the fields in its blocks (options/DocumentBlocks.h).

typedef LumoParams P;
typedef RowsOf<P> PR;

const RecordRow<P> kParamsRows[] = {
    PR::b32(&P::imageFilter_on, 1, 1).shownIn(block::ImageFilter, "on", 1).asFlag(),  // 1
    PR::i32(&P::imageSampler_type, 2, 1).shownIn(block::ImageSampler, "type", 1),
    PR::i32(&P::imageSampler_fixed_subdivs, 1, 1).shownIn(block::ImageSampler, "fixed_subdivs", 2),
    PR::i32(&P::imageSampler_dmc_minSubdivs, 1, 1).shownIn(block::ImageSampler, "dmc_minSubdivs", 3),
    PR::i32(&P::imageSampler_dmc_maxSubdivs, 4, 1).shownIn(block::ImageSampler, "dmc_maxSubdivs", 4),  // 5
    PR::f32(&P::imageSampler_dmc_threshold, 0.01, 1).shownIn(block::ImageSampler, "dmc_threshold", 5),
    PR::i32(&P::imageSampler_subdivision_minRate, -1, 1)
        .shownIn(block::ImageSampler, "subdivision_minRate", 6),
    PR::i32(&P::imageSampler_subdivision_maxRate, 2, 1)
        .shownIn(block::ImageSampler, "subdivision_maxRate", 7),
    PR::f32(&P::imageSampler_subdivision_threshold, 0.1, 1)
        .shownIn(block::ImageSampler, "subdivision_threshold", 9),
    PR::b32(&P::imageSampler_subdivision_jitter, 1, 1)  // 10
        .shownIn(block::ImageSampler, "subdivision_jitter", 8).asFlag(),
    PR::b32(&P::imageSampler_subdivision_edges, 1, 1)
        .shownIn(block::ImageSampler, "subdivision_edges", 10).asFlag(),
    PR::i32(&P::kept12, 0, 1),
    PR::b32(&P::imageSampler_subdivision_normals, 0, 1)
        .shownIn(block::ImageSampler, "subdivision_normals", 11).asFlag(),
    PR::f32(&P::imageSampler_subdivision_normals_threshold, 0.1, 1)
        .shownIn(block::ImageSampler, "subdivision_normals_threshold", 12),
    PR::i32(&P::kept15, 0, 1),  // 15
    PR::f32(&P::kept16, 0, 1),
    PR::i32(&P::camera_type, 0, 1).shownIn(block::Camera, "type", 1),
    PR::b32(&P::cameraDof_on, 0, 1).shownIn(block::CameraDof, "on", 2).asFlag(),
    PR::i32(&P::cameraDof_subdivs, 6, 1).shownIn(block::CameraDof, "subdivs", 10),
    PR::f32(&P::cameraDof_center_bias, 0, 1).shownIn(block::CameraDof, "center_bias", 4),  // 20
    PR::b32(&P::cameraDof_sides_on, 0, 1).shownIn(block::CameraDof, "sides_on", 6).asFlag(),
    PR::i32(&P::cameraDof_sides_num, 5, 1).shownIn(block::CameraDof, "sides_num", 7),
    PR::f32(&P::cameraDof_anisotropy, 0, 1).shownIn(block::CameraDof, "anisotropy", 9),
    PR::b32(&P::motionBlur_on, 0, 1).shownIn(block::MotionBlur, "on", 1).asFlag(),
    PR::i32(&P::motionBlur_geom_samples, 2, 1).shownIn(block::MotionBlur, "geom_samples", 2),  // 25
    PR::i32(&P::kept26, 0, 1),
    PR::i32(&P::kept27, 6, 1),
    PR::i32(&P::motionBlur_subdivs, 6, 1).shownIn(block::MotionBlur, "subdivs", 5),
    PR::f32(&P::kept29, 0, 1),
    PR::i32(&P::kept30, 0, 1),  // 30
    PR::i32(&P::kept31, 0, 1),
    PR::i32(&P::kept32, 0, 1),
    PR::f32(&P::kept33, 0, 1),
    PR::i32(&P::motionBlur_low_samples, 1, 1).shownIn(block::MotionBlur, "low_samples", 3),
    PR::f32(&P::motionBlur_duration, 1, 1).shownIn(block::MotionBlur, "duration", 4),  // 35
    PR::f32(&P::motionBlur_interval_center, 0.5, 1).shownIn(block::MotionBlur, "interval_center", 7),
    PR::i32(&P::kept37, 0, 1),
    PR::f32(&P::motionBlur_bias, 0, 1).shownIn(block::MotionBlur, "bias", 6),
    PR::b32(&P::gi_on, 0, 1).shownIn(block::GI, "on", 1).asFlag(),
    PR::b32(&P::gi_refract_caustics, 1, 1).shownIn(block::GI, "refract_caustics", 2).asFlag(),  // 40
    PR::b32(&P::gi_reflect_caustics, 0, 1).shownIn(block::GI, "reflect_caustics", 3).asFlag(),
    PR::f32(&P::gi_saturation, 1, 1).shownIn(block::GI, "saturation", 4),
    PR::f32(&P::gi_contrast, 1, 1).shownIn(block::GI, "contrast", 5),
    PR::f32(&P::gi_contrast_base, 0.5, 1).shownIn(block::GI, "contrast_base", 6),
    PR::i32(&P::gi_primary_engine, 0, 1).shownIn(block::GI, "primary_engine", 7),  // 45
    PR::f32(&P::gi_primary_multiplier, 1, 1).shownIn(block::GI, "primary_multiplier", 8),
    PR::i32(&P::gi_secondary_engine, 2, 1).shownIn(block::GI, "secondary_engine", 9),
    PR::f32(&P::gi_secondary_multiplier, 1, 1).shownIn(block::GI, "secondary_multiplier", 10),
    PR::i32(&P::dmcGI_subdivs, 8, 1).shownIn(block::DMCGI, "subdivs", 1),
    PR::i32(&P::dmcGI_depth, 3, 1).shownIn(block::DMCGI, "depth", 2),  // 50
    PR::b32(&P::gi_save_maps_per_frame, 0, 1).shownIn(block::GI, "save_maps_per_frame", 11).asFlag(),
    PR::i32(&P::irradianceMap_min_rate, -3, 1).shownIn(block::IrradianceMap, "min_rate", 1),
    PR::i32(&P::irradianceMap_max_rate, 0, 1).shownIn(block::IrradianceMap, "max_rate", 2),
    PR::i32(&P::irradianceMap_subdivs, 50, 1).shownIn(block::IrradianceMap, "subdivs", 3),
    PR::i32(&P::irradianceMap_interp_samples, 20, 1)  // 55
        .shownIn(block::IrradianceMap, "interp_samples", 4),
    PR::i32(&P::irradianceMap_calc_interp_samples, 15, 1)
        .shownIn(block::IrradianceMap, "calc_interp_samples", 5),
    PR::f32(&P::irradianceMap_color_threshold, 0.3, 1).shownIn(block::IrradianceMap, "color_threshold", 7),
    PR::f32(&P::irradianceMap_normal_threshold, 0.1, 1).shownIn(block::IrradianceMap, "normal_threshold", 8),
    PR::f32(&P::irradianceMap_distance_threshold, 0.1, 1)
        .shownIn(block::IrradianceMap, "distance_threshold", 9),
    PR::b32(&P::irradianceMap_show_samples, 0, 1)  // 60
        .shownIn(block::IrradianceMap, "show_samples", 20).asFlag(),
    PR::i32(&P::irradianceMap_interpolation_mode, 1, 1)
        .shownIn(block::IrradianceMap, "interpolation_mode", 15),
    PR::i32(&P::irradianceMap_mode, 0, 1).shownIn(block::IrradianceMap, "mode", 17),
    PR::b32(&P::irradianceMap_dont_delete, 1, 1).shownIn(block::IrradianceMap, "dont_delete", 18).asFlag(),
    PR::b32(&P::irradianceMap_randomize_samples, 1, 1)
        .shownIn(block::IrradianceMap, "randomize_samples", 14).asFlag(),
    PR::b32(&P::irradianceMap_show_calc_phase, 1, 1)  // 65
        .shownIn(block::IrradianceMap, "show_calc_phase", 21).asFlag(),
    PR::b32(&P::irradianceMap_show_direct_light, 0, 1)
        .shownIn(block::IrradianceMap, "show_direct_light", 22).asFlag(),
    PR::b32(&P::irradianceMap_multipass, 1, 1).shownIn(block::IrradianceMap, "multipass", 24).asFlag(),
    PR::b32(&P::irradianceMap_auto_save, 0, 1).shownIn(block::IrradianceMap, "auto_save", 26).asFlag(),
    PR::narrowText(&P::imKeptPath1, 1),
    PR::i32(&P::irradianceMap_lookup_mode, 3, 1).shownIn(block::IrradianceMap, "lookup_mode", 16),  // 70
    PR::b32(&P::irradianceMap_check_sample_visibility, 0, 1)
        .shownIn(block::IrradianceMap, "check_sample_visibility", 25).asFlag(),
    PR::i32(&P::kept72, 0, 1),
    PR::narrowText(&P::imKeptPath2, 1),
    PR::b32(&P::irradianceMap_detail_enhancement, 0, 5)
        .shownIn(block::IrradianceMap, "detail_enhancement", 10).asFlag(),
    PR::f32(&P::irradianceMap_detail_radius, 60, 5).shownIn(block::IrradianceMap, "detail_radius", 11),  // 75
    PR::f32(&P::irradianceMap_detail_subdivs_mult, 0.3, 5)
        .shownIn(block::IrradianceMap, "detail_subdivs_mult", 12),
    PR::i32(&P::irradianceMap_detail_scale, 0, 5).shownIn(block::IrradianceMap, "detail_scale", 13),
    PR::droppedF32(1, 4),  // versions 1 to 4 hold one f32 in place of rows 74 to 77
    PR::i32(&P::photonMap_bounces, 10, 1).shownIn(block::PhotonMap, "bounces", 1),
    PR::f32(&P::photonMap_search_distance, 20, 1).shownIn(block::PhotonMap, "search_distance", 8),
    PR::i32(&P::photonMap_max_photons, 30, 1).shownIn(block::PhotonMap, "max_photons", 2),  // 80
    PR::b32(&P::photonMap_prefilter, 0, 1).shownIn(block::PhotonMap, "prefilter", 3).asFlag(),
    PR::i32(&P::photonMap_prefilter_samples, 10, 1).shownIn(block::PhotonMap, "prefilter_samples", 4),
    PR::i32(&P::photonMap_mode, 0, 1).shownIn(block::PhotonMap, "mode", 5),
    PR::f32(&P::photonMap_multiplier, 1, 1).shownIn(block::PhotonMap, "multiplier", 14),
    PR::b32(&P::photonMap_auto_search_distance, 1, 1)  // 85
        .shownIn(block::PhotonMap, "auto_search_distance", 7).asFlag(),
    PR::b32(&P::photonMap_convex_hull_estimate, 0, 1)
        .shownIn(block::PhotonMap, "convex_hull_estimate", 9).asFlag(),
    PR::b32(&P::photonMap_dont_delete, 1, 1).shownIn(block::PhotonMap, "dont_delete", 10).asFlag(),
    PR::b32(&P::photonMap_auto_save, 0, 1).shownIn(block::PhotonMap, "auto_save", 11).asFlag(),
    PR::narrowText(&P::pmKeptPath1, 1),
    PR::f32(&P::photonMap_retrace_corners, 0, 1).shownIn(block::PhotonMap, "retrace_corners", 16),  // 90
    PR::i32(&P::photonMap_retrace_bounces, 10, 1).shownIn(block::PhotonMap, "retrace_bounces", 17),
    PR::b32(&P::photonMap_store_direct_light, 1, 1)
        .shownIn(block::PhotonMap, "store_direct_light", 13).asFlag(),
    PR::f32(&P::photonMap_max_density, 0, 1).shownIn(block::PhotonMap, "max_density", 15),
    PR::narrowText(&P::pmKeptPath2, 1),
    PR::i32(&P::lightCache_subdivs, 1000, 1).shownIn(block::LightCache, "subdivs", 1),  // 95
    PR::f32(&P::lightCache_sample_size, 0.02, 1).shownIn(block::LightCache, "sample_size", 2),
    PR::i32(&P::lightCache_filter_type, 1, 1).shownIn(block::LightCache, "filter_type", 3),
    PR::f32(&P::lightCache_filter_size, 0.06, 1).shownIn(block::LightCache, "filter_size", 5),
    PR::i32(&P::lightCache_depth, 100, 1).shownIn(block::LightCache, "depth", 8),
    PR::b32(&P::lightCache_show_calc_phase, 1, 1)  // 100
        .shownIn(block::LightCache, "show_calc_phase", 9).asFlag(),
    PR::b32(&P::lightCache_store_direct_light, 1, 1)
        .shownIn(block::LightCache, "store_direct_light", 10).asFlag(),
    PR::i32(&P::lightCache_world_scale, 0, 1).shownIn(block::LightCache, "world_scale", 11),
    PR::i32(&P::lightCache_mode, 0, 1).shownIn(block::LightCache, "mode", 12),
    PR::narrowText(&P::lcKeptPath1, 1),
    PR::b32(&P::lightCache_dont_delete, 1, 1).shownIn(block::LightCache, "dont_delete", 14).asFlag(),  // 105
    PR::b32(&P::lightCache_auto_save, 0, 1).shownIn(block::LightCache, "auto_save", 15).asFlag(),
    PR::narrowText(&P::lcKeptPath2, 1),
    PR::i32(&P::lightCache_filter_samples, 5, 1).shownIn(block::LightCache, "filter_samples", 4),
    PR::b32(&P::lightCache_prefilter, 0, 1).shownIn(block::LightCache, "prefilter", 6).asFlag(),
    PR::i32(&P::lightCache_prefilter_samples, 10, 1)  // 110
        .shownIn(block::LightCache, "prefilter_samples", 7),
    PR::b32(&P::lightCache_use_for_glossy_rays, 0, 1)
        .shownIn(block::LightCache, "use_for_glossy_rays", 18).asFlag(),
    PR::i32(&P::lightCache_num_passes, 8, 1).shownIn(block::LightCache, "num_passes", 17),
    PR::b32(&P::lightCache_adaptive_sampling, 0, 1)
        .shownIn(block::LightCache, "adaptive_sampling", 19).asFlag(),
    PR::b32(&P::caustics_on, 0, 1).shownIn(block::Caustics, "on", 1).asFlag(),
    PR::f32(&P::caustics_search_distance, 20, 1).shownIn(block::Caustics, "search_distance", 3),  // 115
    PR::i32(&P::caustics_max_photons, 50, 1).shownIn(block::Caustics, "max_photons", 2),
    PR::f32(&P::caustics_multiplier, 1, 1).shownIn(block::Caustics, "multiplier", 5),
    PR::f32(&P::caustics_max_density, 0, 1).shownIn(block::Caustics, "max_density", 4),
    PR::i32(&P::caustics_mode, 0, 1).shownIn(block::Caustics, "mode", 6),
    PR::b32(&P::caustics_dont_delete, 1, 1).shownIn(block::Caustics, "dont_delete", 8).asFlag(),  // 120
    PR::b32(&P::caustics_auto_save, 0, 1).shownIn(block::Caustics, "auto_save", 9).asFlag(),
    PR::narrowText(&P::causticsKeptPath1, 1),
    PR::narrowText(&P::causticsKeptPath2, 1),
    PR::i32(&P::raycaster_maxLevels, 60, 1).shownIn(block::Raycaster, "maxLevels", 1),
    PR::f32(&P::raycaster_minLeafSize, 0, 1).shownIn(block::Raycaster, "minLeafSize", 2),  // 125
    PR::f32(&P::raycaster_faceLevelCoef, 2, 1).shownIn(block::Raycaster, "faceLevelCoef", 3),
    PR::i32(&P::raycaster_dynMemLimit, 400, 1).shownIn(block::Raycaster, "dynMemLimit", 4),
    PR::i32(&P::regionsGenerator_xc, 48, 1).shownIn(block::RegionsGenerator, "xc", 1),
    PR::i32(&P::regionsGenerator_yc, 48, 1).shownIn(block::RegionsGenerator, "yc", 2),
    PR::i32(&P::regionsGenerator_xymeans, 0, 1).shownIn(block::RegionsGenerator, "xymeans", 3),  // 130
    PR::i32(&P::regionsGenerator_seqtype, 4, 1).shownIn(block::RegionsGenerator, "seqtype", 4),
    PR::i32(&P::regionsGenerator_reverse, 0, 1).shownIn(block::RegionsGenerator, "reverse", 5),
    PR::constI32(0, 1),
    PR::b32(&P::dmcSampler_time_dependent, 1, 1).shownIn(block::DMCSampler, "time_dependent", 1).asFlag(),
    PR::constF32(1.0f, 1),  // 135
    PR::f32(&P::dmcSampler_adaptive_amount, 0.85, 1).shownIn(block::DMCSampler, "adaptive_amount", 2),
    PR::f32(&P::dmcSampler_adaptive_threshold, 0.01, 1).shownIn(block::DMCSampler, "adaptive_threshold", 3),
    PR::i32(&P::dmcSampler_adaptive_min_samples, 16, 1).shownIn(block::DMCSampler, "adaptive_min_samples", 4),
    PR::f32(&P::dmcSampler_subdivs_mult, 1, 1).shownIn(block::DMCSampler, "subdivs_mult", 5),
    PR::forcedI32(&P::dmcSampler_path_sampler_type, 2, 2)  // 140
        .shownIn(block::DMCSampler, "path_sampler_type", 6),
    PR::i32(&P::colorMapping_type, 0, 1).shownIn(block::ColorMapping, "type", 4),
    PR::b32(&P::colorMapping_affect_background, 1, 1)
        .shownIn(block::ColorMapping, "affect_background", 5).asFlag(),
    PR::b32(&P::colorMapping_clamp_output, 0, 1).shownIn(block::ColorMapping, "clamp_output", 10).asFlag(),
    PR::b32(&P::colorMapping_subpixel_mapping, 0, 3)
        .shownIn(block::ColorMapping, "subpixel_mapping", 9).asFlag(),
    PR::f32(&P::colorMapping_gamma, 1, 4).shownIn(block::ColorMapping, "gamma", 8),  // 145
    PR::b32(&P::options_geom_displacement, 1, 1).shownIn(block::Options, "geom_displacement", 1).asFlag(),
    PR::b32(&P::options_light_doLights, 1, 1).shownIn(block::Options, "light_doLights", 3).asFlag(),
    PR::b32(&P::options_light_doShadows, 1, 1).shownIn(block::Options, "light_doShadows", 6).asFlag(),
    PR::b32(&P::options_light_doDefaultLights, 1, 1)
        .shownIn(block::Options, "light_doDefaultLights", 4).asFlag(),
    PR::b32(&P::options_light_onlyGI, 0, 1).shownIn(block::Options, "light_onlyGI", 7).asFlag(),  // 150
    PR::b32(&P::options_light_doHiddenLights, 1, 1)
        .shownIn(block::Options, "light_doHiddenLights", 5).asFlag(),
    PR::b32(&P::options_mtl_reflectionRefraction, 1, 1)
        .shownIn(block::Options, "mtl_reflectionRefraction", 9).asFlag(),
    PR::b32(&P::options_mtl_limitDepth, 1, 1).shownIn(block::Options, "mtl_limitDepth", 10).asFlag(),
    PR::i32(&P::options_mtl_maxDepth, 2, 1).shownIn(block::Options, "mtl_maxDepth", 11),
    PR::b32(&P::options_mtl_doMaps, 1, 1).shownIn(block::Options, "mtl_doMaps", 12).asFlag(),  // 155
    PR::b32(&P::options_mtl_filterMaps, 1, 1).shownIn(block::Options, "mtl_filterMaps", 13).asFlag(),
    PR::i32(&P::options_mtl_transpMaxLevels, 50, 1).shownIn(block::Options, "mtl_transpMaxLevels", 15),
    PR::f32(&P::options_mtl_transpCutoff, 0.001, 1).shownIn(block::Options, "mtl_transpCutoff", 16),
    PR::b32(&P::options_mtl_glossy, 1, 1).shownIn(block::Options, "mtl_glossy", 18).asFlag(),
    PR::b32(&P::options_gi_dontRenderImage, 0, 1)  // 160
        .shownIn(block::Options, "gi_dontRenderImage", 8).asFlag(),
    PR::b32(&P::options_mtl_override_on, 0, 1).shownIn(block::Options, "mtl_override_on", 17).asFlag(),
    PR::f32(&P::options_ray_bias, 0, 1).shownIn(block::Options, "ray_bias", 20),
    PR::i32(&P::kept163, 1, 1),
    PR::b32(&P::options_misc_lowThreadPriority, 0, 1)
        .shownIn(block::Options, "misc_lowThreadPriority", 21).asFlag(),
    PR::b32(&P::defaultDisplacement_override_on, 1, 1)  // 165
        .shownIn(block::DefaultDisplacement, "override_on", 1).asFlag(),
    PR::f32(&P::defaultDisplacement_edgeLength, 4, 1).shownIn(block::DefaultDisplacement, "edgeLength", 2),
    PR::b32(&P::defaultDisplacement_viewDependent, 1, 1)
        .shownIn(block::DefaultDisplacement, "viewDependent", 3).asFlag(),
    PR::i32(&P::defaultDisplacement_maxSubdivs, 256, 1).shownIn(block::DefaultDisplacement, "maxSubdivs", 4),
    PR::b32(&P::defaultDisplacement_tightBounds, 1, 1)
        .shownIn(block::DefaultDisplacement, "tightBounds", 5).asFlag(),
    PR::f32(&P::defaultDisplacement_amount, 1, 1).shownIn(block::DefaultDisplacement, "amount", 6),  // 170
    PR::b32(&P::defaultDisplacement_relative, 0, 1)
        .shownIn(block::DefaultDisplacement, "relative", 7).asFlag(),
    PR::i32(&P::kept172, 0, 1),
    PR::i32(&P::kept173, 16, 1),
    // Fields that no record holds.
    PR::unstored(&P::irradianceMap_interp_frames, 2).shownIn(block::IrradianceMap, "interp_frames", 6),
    PR::unstored(&P::irradianceMap_multiple_views, 0)
        .shownIn(block::IrradianceMap, "multiple_views", 23).asFlag(),
    PR::unstored(&P::photonMap_show_calc_phase, 0).shownIn(block::PhotonMap, "show_calc_phase", 18).asFlag(),
    PR::unstored(&P::lightCache_multiple_views, 0).shownIn(block::LightCache, "multiple_views", 20).asFlag(),
    PR::unstored(&P::lightCache_min_paths_per_sample, 16)
        .shownIn(block::LightCache, "min_paths_per_sample", 21),
    PR::unstored(&P::lightCache_adaptive_dirs_only, 0)
        .shownIn(block::LightCache, "adaptive_dirs_only", 22).asFlag(),
    PR::unstored(&P::caustics_show_calc_phase, 0).shownIn(block::Caustics, "show_calc_phase", 11).asFlag(),
    PR::unstored(&P::raycaster_optLevel, 0).shownIn(block::Raycaster, "optLevel", 5),
    PR::unstored(&P::colorMapping_clamp_level, 1).shownIn(block::ColorMapping, "clamp_level", 11),
    PR::unstored(&P::colorMapping_adaptation_only, 0)
        .shownIn(block::ColorMapping, "adaptation_only", 12).asFlag(),
    PR::unstored(&P::colorMapping_linearWorkflow, 0)
        .shownIn(block::ColorMapping, "linearWorkflow", 13).asFlag(),
    PR::unstored(&P::options_geom_doHidden, 1).shownIn(block::Options, "geom_doHidden", 2).asFlag(),
    PR::unstored(&P::options_mtl_filterMapsForSecondaryRays, 1)
        .shownIn(block::Options, "mtl_filterMapsForSecondaryRays", 14).asFlag(),
    PR::unstored(&P::options_geom_backfaceCull, 0).shownIn(block::Options, "geom_backfaceCull", 19).asFlag(),
    // A field that the XML shows twice.
    RecordRow<P>::shownAgain(&P::photonMap_auto_search_distance, nullptr)
        .shownIn(block::PhotonMap, "search_distance_toggle", 19).asFlag().userData(),
};

// ---- OrvaneFrameData ------------------------------------------------------------------

typedef LumoFrameData F;
typedef RowsOf<F> FR;

// A row shown without a block is a parameter of the FrameData asset, in
// table order; one with a block is a setting of the options document.
const RecordRow<F> kFrameRows[] = {
    FR::f64(&F::t, 0).shownAs("t"),  // 1
    FR::f64(&F::frameStart, 0).shownAs("frameStart"),
    FR::f64(&F::frameEnd, 1).shownAs("frameEnd"),
    FR::i32(&F::currentFrame, 0).shownAs("currentFrame"),
    FR::transformD(&F::worldToCam).shownAs("worldToCam"),  // 5
    FR::transformD(&F::camToWorld).shownAs("camToWorld"),
    FR::f32(&F::fov, 0).shownAs("fov"),
    FR::f32(&F::nearRange, 0).shownAs("nearRange"),
    FR::f32(&F::farRange, 0).shownAs("farRange"),
    FR::f32(&F::cameraDof_focal_dist, 200).shownIn(block::CameraDof, "focal_dist", 5),  // 10
    FR::f32(&F::cameraDof_aperture, 0.1).shownIn(block::CameraDof, "aperture", 3),
    FR::f32(&F::cameraDof_rotation, 0).shownIn(block::CameraDof, "rotation", 8),
    FR::i32(&F::clippingPlanes, 0).shownAs("clippingPlanes"),
    FR::f32(&F::clipNear, 0).shownAs("clipNear"),
    FR::f32(&F::clipFar, 0).shownAs("clipFar"),  // 15
    FR::i32(&F::projType, 0).shownAs("projType"),
    FR::f32(&F::zoomFractor, 1).shownAs("zoomFractor"),
    FR::i32(&F::infiniteProj, 0).shownAs("infiniteProj"),
    FR::f32(&F::camera_height, 400).shownIn(block::Camera, "height", 2),
    FR::b32(&F::camera_auto_fit, 1).shownIn(block::Camera, "auto_fit", 5).asFlag(),  // 20
    FR::f32(&F::camera_dist, 2).shownIn(block::Camera, "dist", 3),
    FR::f32(&F::camera_curve, 1).shownIn(block::Camera, "curve", 6),
    FR::i32(&F::orthoAdjustToScene, 0).shownAs("orthoAdjustToScene"),
    FR::color(&F::ambient, Color()).shownAs("ambient"),
    FR::color(&F::background, Color()).shownAs("background"),  // 25
    FR::color(&F::globalLightLevel, Color()).shownAs("globalLightLevel"),
    FR::color(&F::lumoGIBackground, Color()).shownAs("lumoGIBackground"),
    FR::color(&F::lumoRRBackground, Color()).shownAs("lumoRRBackground"),
    FR::color(&F::lumoRefractBackground, Color()).shownAs("lumoRefractBackground"),
    FR::f32(&F::output_rgn_left, 0).shownIn(block::Output, "rgn_left", 8),  // 30
    FR::f32(&F::output_rgn_width, 0).shownIn(block::Output, "rgn_width", 9),
    FR::f32(&F::output_rgn_top, 0).shownIn(block::Output, "rgn_top", 10),
    FR::f32(&F::output_rgn_height, 0).shownIn(block::Output, "rgn_height", 11),
    FR::i32(&F::keptFrame34, 0),
    FR::i32(&F::keptFrame35, 0),  // 35
    FR::i32(&F::output_bmp_width, 0).shownIn(block::Output, "bmp_width", 12),
    FR::i32(&F::output_bmp_height, 0).shownIn(block::Output, "bmp_height", 13),
    FR::i32(&F::output_r_left, 0).shownIn(block::Output, "r_left", 14),
    FR::i32(&F::output_r_width, 0).shownIn(block::Output, "r_width", 15),
    FR::i32(&F::output_r_top, 0).shownIn(block::Output, "r_top", 16),  // 40
    FR::i32(&F::output_r_height, 0).shownIn(block::Output, "r_height", 17),
    FR::f32(&F::devAspect, 1).shownAs("devAspect"),
    FR::i32(&F::fieldMask, 3).shownAs("fieldMask"),
    FR::i32(&F::fieldOrder, 0).shownAs("fieldOrder"),
    FR::i32(&F::firstField, 0).shownAs("firstField"),  // 45
    FR::f32(&F::colorMapping_dark_mult, 1).shownIn(block::ColorMapping, "dark_mult", 6),
    FR::f32(&F::colorMapping_bright_mult, 1).shownIn(block::ColorMapping, "bright_mult", 7),
};

// The table of each table group and the versions its load reads.
template <class Fields>
struct TableOf;

template <>
struct TableOf<LumoParams> {
    static constexpr const auto& rows = kParamsRows;
    static constexpr int oldest = 1, newest = OrvaneParams::kVersion;
};

template <>
struct TableOf<LumoFrameData> {
    static constexpr const auto& rows = kFrameRows;
    static constexpr int oldest = OrvaneFrameData::kVersion, newest = OrvaneFrameData::kVersion;
};

}  // namespace

// ---- the table groups ------------------------------------------------------------------

template <class Fields>
bool TableOptions<Fields>::save(QuickArchive& ar) const {
    writeVersion(ar, TableOf<Fields>::newest);
    writeFields(ar, static_cast<const Fields&>(*this), TableOf<Fields>::rows, TableOf<Fields>::newest);
    return true;
}

template <class Fields>
bool TableOptions<Fields>::load(QuickArchive& ar) {
    reset();
    const int version = readVersion(ar, TableOf<Fields>::oldest, TableOf<Fields>::newest);
    if (version < 0) return false;
    readFields(ar, static_cast<Fields&>(*this), TableOf<Fields>::rows, version);
    return true;
}

template <class Fields>
void TableOptions<Fields>::reset() {
    resetFields(static_cast<Fields&>(*this), TableOf<Fields>::rows);
}

template <class Fields>
RowSpan<RecordRow<Fields>> TableOptions<Fields>::record() {
    return rowSpan(TableOf<Fields>::rows);
}

template class TableOptions<LumoParams>;
template class TableOptions<LumoFrameData>;

// ---- OrvaneParams ----------------------------------------------------------------------

void OrvaneParams::reset() {
    resetFields(static_cast<LumoParams&>(*this), kParamsRows);
    // A bare parameter set differs from a document's defaults in four fields.
    imageFilter_on = 0;
    imageSampler_type = 0;
    options_mtl_limitDepth = 0;
    caustics_search_distance = 1e18f;
}

// ---- OrvaneFrameData -------------------------------------------------------------------

void OrvaneFrameData::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeAsset(writer, url + u"/" + getPluginName(), getAssetType(), getPluginName(),
               [&] { writeShownFields(writer, static_cast<const LumoFrameData&>(*this), kFrameRows); });
}

// ---- OrvaneLFBStampInfo ----------------------------------------------------------------

const char* const OrvaneLFBStampInfo::kDefaultText =
    "Lumo Core %lumocore | Render Time %rendertime |";

bool OrvaneLFBStampInfo::save(QuickArchive& ar) const {
    writeVersion(ar, kVersion);
    ar.writeInt(stampFlag);
    ar.writeInt(stampValue1);
    ar.writeInt(stampValue2);
    ar.writeWString(utf8ToWide(text));
    ar.writeBytes(fontDescription, kFontDescriptionSize);
    return true;
}

// Written by hand: the font description is 60 bytes with a length in version
// 2 and without one in version 1.
bool OrvaneLFBStampInfo::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, kVersion);
    reset();
    if (version < 0) return false;
    ar.readInt(stampFlag);
    ar.readInt(stampValue1);
    ar.readInt(stampValue2);
    std::u16string wide;
    ar.readWString(wide);
    text = wideToUtf8(wide);
    if (version == 1) {
        // Version 1: the 60 bytes of the font description, without a length.
        ar.getRaw(fontDescription, kFontDescriptionSize);
    } else {
        // Version 2: a length and the bytes; the first 60 are kept, the rest skipped.
        ar.readBytes(fontDescription, kFontDescriptionSize, false);
    }
    return true;
}

void OrvaneLFBStampInfo::reset() {
    stampFlag = 0;
    stampValue1 = 0;
    stampValue2 = 0;
    text = kDefaultText;
    std::memset(fontDescription, 0, sizeof fontDescription);
}

}  // namespace OrvaneLumoCore
