#include "options/OptionRecords.h"

#include <algorithm>
#include <cstring>

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
// defaults are those of a document; OrvaneParams::reset differs in four.

typedef LumoParams P;
typedef RowsOf<P> PR;

const RecordRow<P> kParamsRows[] = {
    PR::b32(&P::imageFilter_on, 1, 1),                               // 1
    PR::i32(&P::imageSampler_type, 2, 1),
    PR::i32(&P::imageSampler_fixed_subdivs, 1, 1),
    PR::i32(&P::imageSampler_dmc_minSubdivs, 1, 1),
    PR::i32(&P::imageSampler_dmc_maxSubdivs, 4, 1),                  // 5
    PR::f32(&P::imageSampler_dmc_threshold, 0.01, 1),
    PR::i32(&P::imageSampler_subdivision_minRate, -1, 1),
    PR::i32(&P::imageSampler_subdivision_maxRate, 2, 1),
    PR::f32(&P::imageSampler_subdivision_threshold, 0.1, 1),
    PR::b32(&P::imageSampler_subdivision_jitter, 1, 1),              // 10
    PR::b32(&P::imageSampler_subdivision_edges, 1, 1),
    PR::i32(&P::kept12, 0, 1),
    PR::b32(&P::imageSampler_subdivision_normals, 0, 1),
    PR::f32(&P::imageSampler_subdivision_normals_threshold, 0.1, 1),
    PR::i32(&P::kept15, 0, 1),                                       // 15
    PR::f32(&P::kept16, 0, 1),
    PR::i32(&P::camera_type, 0, 1),
    PR::b32(&P::cameraDof_on, 0, 1),
    PR::i32(&P::cameraDof_subdivs, 6, 1),
    PR::f32(&P::cameraDof_center_bias, 0, 1),                        // 20
    PR::b32(&P::cameraDof_sides_on, 0, 1),
    PR::i32(&P::cameraDof_sides_num, 5, 1),
    PR::f32(&P::cameraDof_anisotropy, 0, 1),
    PR::b32(&P::motionBlur_on, 0, 1),
    PR::i32(&P::motionBlur_geom_samples, 2, 1),                      // 25
    PR::i32(&P::kept26, 0, 1),
    PR::i32(&P::kept27, 6, 1),
    PR::i32(&P::motionBlur_subdivs, 6, 1),
    PR::f32(&P::kept29, 0, 1),
    PR::i32(&P::kept30, 0, 1),                                       // 30
    PR::i32(&P::kept31, 0, 1),
    PR::i32(&P::kept32, 0, 1),
    PR::f32(&P::kept33, 0, 1),
    PR::i32(&P::motionBlur_low_samples, 1, 1),
    PR::f32(&P::motionBlur_duration, 1, 1),                          // 35
    PR::f32(&P::motionBlur_interval_center, 0.5, 1),
    PR::i32(&P::kept37, 0, 1),
    PR::f32(&P::motionBlur_bias, 0, 1),
    PR::b32(&P::gi_on, 0, 1),
    PR::b32(&P::gi_refract_caustics, 1, 1),                          // 40
    PR::b32(&P::gi_reflect_caustics, 0, 1),
    PR::f32(&P::gi_saturation, 1, 1),
    PR::f32(&P::gi_contrast, 1, 1),
    PR::f32(&P::gi_contrast_base, 0.5, 1),
    PR::i32(&P::gi_primary_engine, 0, 1),                            // 45
    PR::f32(&P::gi_primary_multiplier, 1, 1),
    PR::i32(&P::gi_secondary_engine, 2, 1),
    PR::f32(&P::gi_secondary_multiplier, 1, 1),
    PR::i32(&P::dmcGI_subdivs, 8, 1),
    PR::i32(&P::dmcGI_depth, 3, 1),                                  // 50
    PR::b32(&P::gi_save_maps_per_frame, 0, 1),
    PR::i32(&P::irradianceMap_min_rate, -3, 1),
    PR::i32(&P::irradianceMap_max_rate, 0, 1),
    PR::i32(&P::irradianceMap_subdivs, 50, 1),
    PR::i32(&P::irradianceMap_interp_samples, 20, 1),                // 55
    PR::i32(&P::irradianceMap_calc_interp_samples, 15, 1),
    PR::f32(&P::irradianceMap_color_threshold, 0.3, 1),
    PR::f32(&P::irradianceMap_normal_threshold, 0.1, 1),
    PR::f32(&P::irradianceMap_distance_threshold, 0.1, 1),
    PR::b32(&P::irradianceMap_show_samples, 0, 1),                   // 60
    PR::i32(&P::irradianceMap_interpolation_mode, 1, 1),
    PR::i32(&P::irradianceMap_mode, 0, 1),
    PR::b32(&P::irradianceMap_dont_delete, 1, 1),
    PR::b32(&P::irradianceMap_randomize_samples, 1, 1),
    PR::b32(&P::irradianceMap_show_calc_phase, 1, 1),                // 65
    PR::b32(&P::irradianceMap_show_direct_light, 0, 1),
    PR::b32(&P::irradianceMap_multipass, 1, 1),
    PR::b32(&P::irradianceMap_auto_save, 0, 1),
    PR::narrowText(&P::imKeptPath1, 1),
    PR::i32(&P::irradianceMap_lookup_mode, 3, 1),                    // 70
    PR::b32(&P::irradianceMap_check_sample_visibility, 0, 1),
    PR::i32(&P::kept72, 0, 1),
    PR::narrowText(&P::imKeptPath2, 1),
    PR::b32(&P::irradianceMap_detail_enhancement, 0, 5),
    PR::f32(&P::irradianceMap_detail_radius, 60, 5),                 // 75
    PR::f32(&P::irradianceMap_detail_subdivs_mult, 0.3, 5),
    PR::i32(&P::irradianceMap_detail_scale, 0, 5),
    PR::droppedF32(1, 4),  // versions 1 to 4 hold one f32 in place of rows 74 to 77
    PR::i32(&P::photonMap_bounces, 10, 1),
    PR::f32(&P::photonMap_search_distance, 20, 1),
    PR::i32(&P::photonMap_max_photons, 30, 1),                       // 80
    PR::b32(&P::photonMap_prefilter, 0, 1),
    PR::i32(&P::photonMap_prefilter_samples, 10, 1),
    PR::i32(&P::photonMap_mode, 0, 1),
    PR::f32(&P::photonMap_multiplier, 1, 1),
    PR::b32(&P::photonMap_auto_search_distance, 1, 1),               // 85
    PR::b32(&P::photonMap_convex_hull_estimate, 0, 1),
    PR::b32(&P::photonMap_dont_delete, 1, 1),
    PR::b32(&P::photonMap_auto_save, 0, 1),
    PR::narrowText(&P::pmKeptPath1, 1),
    PR::f32(&P::photonMap_retrace_corners, 0, 1),                    // 90
    PR::i32(&P::photonMap_retrace_bounces, 10, 1),
    PR::b32(&P::photonMap_store_direct_light, 1, 1),
    PR::f32(&P::photonMap_max_density, 0, 1),
    PR::narrowText(&P::pmKeptPath2, 1),
    PR::i32(&P::lightCache_subdivs, 1000, 1),                        // 95
    PR::f32(&P::lightCache_sample_size, 0.02, 1),
    PR::i32(&P::lightCache_filter_type, 1, 1),
    PR::f32(&P::lightCache_filter_size, 0.06, 1),
    PR::i32(&P::lightCache_depth, 100, 1),
    PR::b32(&P::lightCache_show_calc_phase, 1, 1),                   // 100
    PR::b32(&P::lightCache_store_direct_light, 1, 1),
    PR::i32(&P::lightCache_world_scale, 0, 1),
    PR::i32(&P::lightCache_mode, 0, 1),
    PR::narrowText(&P::lcKeptPath1, 1),
    PR::b32(&P::lightCache_dont_delete, 1, 1),                       // 105
    PR::b32(&P::lightCache_auto_save, 0, 1),
    PR::narrowText(&P::lcKeptPath2, 1),
    PR::i32(&P::lightCache_filter_samples, 5, 1),
    PR::b32(&P::lightCache_prefilter, 0, 1),
    PR::i32(&P::lightCache_prefilter_samples, 10, 1),                // 110
    PR::b32(&P::lightCache_use_for_glossy_rays, 0, 1),
    PR::i32(&P::lightCache_num_passes, 8, 1),
    PR::b32(&P::lightCache_adaptive_sampling, 0, 1),
    PR::b32(&P::caustics_on, 0, 1),
    PR::f32(&P::caustics_search_distance, 20, 1),                    // 115
    PR::i32(&P::caustics_max_photons, 50, 1),
    PR::f32(&P::caustics_multiplier, 1, 1),
    PR::f32(&P::caustics_max_density, 0, 1),
    PR::i32(&P::caustics_mode, 0, 1),
    PR::b32(&P::caustics_dont_delete, 1, 1),                         // 120
    PR::b32(&P::caustics_auto_save, 0, 1),
    PR::narrowText(&P::causticsKeptPath1, 1),
    PR::narrowText(&P::causticsKeptPath2, 1),
    PR::i32(&P::raycaster_maxLevels, 60, 1),
    PR::f32(&P::raycaster_minLeafSize, 0, 1),                        // 125
    PR::f32(&P::raycaster_faceLevelCoef, 2, 1),
    PR::i32(&P::raycaster_dynMemLimit, 400, 1),
    PR::i32(&P::regionsGenerator_xc, 48, 1),
    PR::i32(&P::regionsGenerator_yc, 48, 1),
    PR::i32(&P::regionsGenerator_xymeans, 0, 1),                     // 130
    PR::i32(&P::regionsGenerator_seqtype, 4, 1),
    PR::i32(&P::regionsGenerator_reverse, 0, 1),
    PR::constI32(0, 1),
    PR::b32(&P::dmcSampler_time_dependent, 1, 1),
    PR::constF32(1.0f, 1),                                           // 135
    PR::f32(&P::dmcSampler_adaptive_amount, 0.85, 1),
    PR::f32(&P::dmcSampler_adaptive_threshold, 0.01, 1),
    PR::i32(&P::dmcSampler_adaptive_min_samples, 16, 1),
    PR::f32(&P::dmcSampler_subdivs_mult, 1, 1),
    PR::forcedI32(&P::dmcSampler_path_sampler_type, 2, 2),           // 140
    PR::i32(&P::colorMapping_type, 0, 1),
    PR::b32(&P::colorMapping_affect_background, 1, 1),
    PR::b32(&P::colorMapping_clamp_output, 0, 1),
    PR::b32(&P::colorMapping_subpixel_mapping, 0, 3),
    PR::f32(&P::colorMapping_gamma, 1, 4),                           // 145
    PR::b32(&P::options_geom_displacement, 1, 1),
    PR::b32(&P::options_light_doLights, 1, 1),
    PR::b32(&P::options_light_doShadows, 1, 1),
    PR::b32(&P::options_light_doDefaultLights, 1, 1),
    PR::b32(&P::options_light_onlyGI, 0, 1),                         // 150
    PR::b32(&P::options_light_doHiddenLights, 1, 1),
    PR::b32(&P::options_mtl_reflectionRefraction, 1, 1),
    PR::b32(&P::options_mtl_limitDepth, 1, 1),
    PR::i32(&P::options_mtl_maxDepth, 2, 1),
    PR::b32(&P::options_mtl_doMaps, 1, 1),                           // 155
    PR::b32(&P::options_mtl_filterMaps, 1, 1),
    PR::i32(&P::options_mtl_transpMaxLevels, 50, 1),
    PR::f32(&P::options_mtl_transpCutoff, 0.001, 1),
    PR::b32(&P::options_mtl_glossy, 1, 1),
    PR::b32(&P::options_gi_dontRenderImage, 0, 1),                   // 160
    PR::b32(&P::options_mtl_override_on, 0, 1),
    PR::f32(&P::options_ray_bias, 0, 1),
    PR::i32(&P::kept163, 1, 1),
    PR::b32(&P::options_misc_lowThreadPriority, 0, 1),
    PR::b32(&P::defaultDisplacement_override_on, 1, 1),              // 165
    PR::f32(&P::defaultDisplacement_edgeLength, 4, 1),
    PR::b32(&P::defaultDisplacement_viewDependent, 1, 1),
    PR::i32(&P::defaultDisplacement_maxSubdivs, 256, 1),
    PR::b32(&P::defaultDisplacement_tightBounds, 1, 1),
    PR::f32(&P::defaultDisplacement_amount, 1, 1),                   // 170
    PR::b32(&P::defaultDisplacement_relative, 0, 1),
    PR::i32(&P::kept172, 0, 1),
    PR::i32(&P::kept173, 16, 1),
};

// ---- OrvaneFrameData ------------------------------------------------------------------

typedef LumoFrameData F;
typedef RowsOf<F> FR;

const RecordRow<F> kFrameRows[] = {
    FR::f64(&F::t, 0),                                              // 1
    FR::f64(&F::frameStart, 0),
    FR::f64(&F::frameEnd, 1),
    FR::i32(&F::currentFrame, 0),
    FR::transformD(&F::worldToCam),                                 // 5
    FR::transformD(&F::camToWorld),
    FR::f32(&F::fov, 0),
    FR::f32(&F::nearRange, 0),
    FR::f32(&F::farRange, 0),
    FR::f32(&F::cameraDof_focal_dist, 200),                         // 10
    FR::f32(&F::cameraDof_aperture, 0.1),
    FR::f32(&F::cameraDof_rotation, 0),
    FR::i32(&F::clippingPlanes, 0),
    FR::f32(&F::clipNear, 0),
    FR::f32(&F::clipFar, 0),                                        // 15
    FR::i32(&F::projType, 0),
    FR::f32(&F::zoomFractor, 1),
    FR::i32(&F::infiniteProj, 0),
    FR::f32(&F::camera_height, 400),
    FR::b32(&F::camera_auto_fit, 1),                                // 20
    FR::f32(&F::camera_dist, 2),
    FR::f32(&F::camera_curve, 1),
    FR::i32(&F::orthoAdjustToScene, 0),
    FR::color(&F::ambient, Color()),
    FR::color(&F::background, Color()),                             // 25
    FR::color(&F::globalLightLevel, Color()),
    FR::color(&F::lumoGIBackground, Color()),
    FR::color(&F::lumoRRBackground, Color()),
    FR::color(&F::lumoRefractBackground, Color()),
    FR::f32(&F::output_rgn_left, 0),                                // 30
    FR::f32(&F::output_rgn_width, 0),
    FR::f32(&F::output_rgn_top, 0),
    FR::f32(&F::output_rgn_height, 0),
    FR::i32(&F::keptFrame34, 0),
    FR::i32(&F::keptFrame35, 0),                                    // 35
    FR::i32(&F::output_bmp_width, 0),
    FR::i32(&F::output_bmp_height, 0),
    FR::i32(&F::output_r_left, 0),
    FR::i32(&F::output_r_width, 0),
    FR::i32(&F::output_r_top, 0),                                   // 40
    FR::i32(&F::output_r_height, 0),
    FR::f32(&F::devAspect, 1),
    FR::i32(&F::fieldMask, 3),
    FR::i32(&F::fieldOrder, 0),
    FR::i32(&F::firstField, 0),                                     // 45
    FR::f32(&F::colorMapping_dark_mult, 1),
    FR::f32(&F::colorMapping_bright_mult, 1),
};

// The parameters of the FrameData asset, in order.
const ParamRow<F> kFrameParams[] = {
    {"t", &F::t},
    {"frameStart", &F::frameStart},
    {"frameEnd", &F::frameEnd},
    {"currentFrame", &F::currentFrame},
    {"worldToCam", &F::worldToCam},
    {"camToWorld", &F::camToWorld},
    {"fov", &F::fov},
    {"nearRange", &F::nearRange},
    {"farRange", &F::farRange},
    {"clippingPlanes", &F::clippingPlanes},
    {"clipNear", &F::clipNear},
    {"clipFar", &F::clipFar},
    {"projType", &F::projType},
    {"zoomFractor", &F::zoomFractor},
    {"infiniteProj", &F::infiniteProj},
    {"orthoAdjustToScene", &F::orthoAdjustToScene},
    {"ambient", &F::ambient},
    {"background", &F::background},
    {"globalLightLevel", &F::globalLightLevel},
    {"lumoGIBackground", &F::lumoGIBackground},
    {"lumoRRBackground", &F::lumoRRBackground},
    {"lumoRefractBackground", &F::lumoRefractBackground},
    {"devAspect", &F::devAspect},
    {"fieldMask", &F::fieldMask},
    {"fieldOrder", &F::fieldOrder},
    {"firstField", &F::firstField},
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
    // Fields that no record holds.
    irradianceMap_interp_frames = 2;
    irradianceMap_multiple_views = 0;
    photonMap_show_calc_phase = 0;
    lightCache_adaptive_dirs_only = 0;
    lightCache_min_paths_per_sample = 16;
    lightCache_multiple_views = 0;
    caustics_show_calc_phase = 0;
    raycaster_optLevel = 0;
    colorMapping_adaptation_only = 0;
    colorMapping_clamp_level = 1;
    colorMapping_linearWorkflow = 0;
    options_geom_doHidden = 1;
    options_mtl_filterMapsForSecondaryRays = 1;
    options_geom_backfaceCull = 0;
}

// ---- OrvaneFrameData -------------------------------------------------------------------

void OrvaneFrameData::writeXml(AssetXmlWriter& writer, std::u16string url) {
    writeAsset(writer, url + u"/" + getPluginName(), getAssetType(), getPluginName(),
               [&] { writeParams(writer, static_cast<const LumoFrameData&>(*this), kFrameParams); });
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
