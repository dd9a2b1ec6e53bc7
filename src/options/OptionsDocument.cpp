// The options document: 22 settings blocks, each described once as a table of
// parameters (name, form, source, label, user data mark) in the order in which
// they are written. Every block and every parameter is always written.
#include <cstddef>
#include <cstdint>

#include <boost/any.hpp>

#include "options/AllOptions.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

namespace {

typedef LumoUtils::LumoParams P;
typedef LumoUtils::LumoFrameData F;
typedef AllOptions D;
typedef PhysicalCamera C;

enum class Form : std::uint8_t {
    Integer,
    Bool,  // a 32-bit field; any value but 0 is 1
    Float,
    Color,
    FileName,  // `string` with the file browser handler, escaped
    Texture,   // `plugin` reference to an environment texture
    Channels,  // `list` of channel names
};

// What a source gives for one parameter.
struct Value {
    double number = 0;
    Color color;
    const std::u16string* text = nullptr;
    const TexturePtr* texture = nullptr;
    const char* slot = nullptr;  // url word of the texture's slot

    static Value of(std::int32_t v) { Value r; r.number = v; return r; }
    static Value of(float v) { Value r; r.number = v; return r; }
    static Value of(bool v) { Value r; r.number = v ? 1 : 0; return r; }
    static Value of(const Color& c) { Value r; r.color = c; return r; }
    static Value of(const std::u16string& s) { Value r; r.text = &s; return r; }
    // An animated field shows its value at time 0.
    static Value of(const AnimatedReal& a) { return of(a.getValue(0.0)); }
};

typedef Value (*Source)(const AllOptions&);

// Sources: a field of the params, the frame data, the document or the camera.
template <auto M> Value par(const AllOptions& o) { return Value::of(o.params.*M); }
template <auto M> Value frm(const AllOptions& o) { return Value::of(o.frameData.*M); }
template <auto M> Value doc(const AllOptions& o) { return Value::of(o.*M); }
template <auto M> Value cam(const AllOptions& o) { return Value::of(o.physicalCamera.*M); }

// The stored filter kernels 1 and 2 change places in the document.
Value filterType(const AllOptions& o) {
    const std::int32_t k = o.filterKernel;
    return Value::of(k == 1 ? 2 : k == 2 ? 1 : k);
}

// The document asks whether the focal distance is overridden; the record
// stores whether it comes from the camera.
Value overrideFocalDist(const AllOptions& o) {
    return Value::of(static_cast<std::int32_t>(o.focalDistFromCamera == 0 ? 1 : 0));
}

template <TexturePtr D::*Tex>
Value texture(const AllOptions& o, const char* slot) {
    Value r;
    r.texture = &(o.*Tex);
    r.slot = slot;
    return r;
}
Value bgTex(const AllOptions& o) { return texture<&D::bgTexture>(o, "bg_texture"); }
Value giTex(const AllOptions& o) { return texture<&D::giTexture>(o, "gi_texture"); }
Value reflectTex(const AllOptions& o) { return texture<&D::reflectTexture>(o, "reflect_texture"); }
Value refractTex(const AllOptions& o) { return texture<&D::refractTexture>(o, "refract_texture"); }

// The texture's multiplier when the texture is there, else the colour's.
template <TexturePtr D::*Tex, float D::*TexMult, float D::*ColorMult>
Value envMult(const AllOptions& o) {
    return Value::of(o.*Tex ? o.*TexMult : o.*ColorMult);
}

Value channels(const AllOptions&) { return Value(); }

constexpr bool kUserData = true;

struct Param {
    const char* name;
    Form form;
    Source source;
    const char* label = "";  // empty: the writer shows the name
    bool userData = false;
};

const Param kImageSampler[] = {
    {"type", Form::Integer, par<&P::imageSampler_type>},
    {"fixed_subdivs", Form::Integer, par<&P::imageSampler_fixed_subdivs>},
    {"dmc_minSubdivs", Form::Integer, par<&P::imageSampler_dmc_minSubdivs>},
    {"dmc_maxSubdivs", Form::Integer, par<&P::imageSampler_dmc_maxSubdivs>},
    {"dmc_threshold", Form::Float, par<&P::imageSampler_dmc_threshold>},
    {"subdivision_minRate", Form::Integer, par<&P::imageSampler_subdivision_minRate>},
    {"subdivision_maxRate", Form::Integer, par<&P::imageSampler_subdivision_maxRate>},
    {"subdivision_jitter", Form::Bool, par<&P::imageSampler_subdivision_jitter>},
    {"subdivision_threshold", Form::Float, par<&P::imageSampler_subdivision_threshold>},
    {"subdivision_edges", Form::Bool, par<&P::imageSampler_subdivision_edges>},
    {"subdivision_normals", Form::Bool, par<&P::imageSampler_subdivision_normals>},
    {"subdivision_normals_threshold", Form::Float, par<&P::imageSampler_subdivision_normals_threshold>},
};

const Param kImageFilter[] = {
    {"on", Form::Bool, par<&P::imageFilter_on>},
    {"type", Form::Integer, filterType},
    {"size", Form::Float, doc<&D::filterSize>},
};

const Param kCamera[] = {
    {"type", Form::Integer, par<&P::camera_type>},
    {"height", Form::Float, frm<&F::camera_height>},
    {"dist", Form::Float, frm<&F::camera_dist>},
    {"fov", Form::Float, doc<&D::camera_fov>},
    {"auto_fit", Form::Bool, frm<&F::camera_auto_fit>},
    {"curve", Form::Float, frm<&F::camera_curve>},
    {"override_fov", Form::Bool, doc<&D::camera_override_fov>, "", kUserData},
};

const Param kCameraDof[] = {
    {"override_focal_dist", Form::Bool, overrideFocalDist, "", kUserData},
    {"on", Form::Bool, par<&P::cameraDof_on>},
    {"aperture", Form::Float, frm<&F::cameraDof_aperture>},
    {"center_bias", Form::Float, par<&P::cameraDof_center_bias>},
    {"focal_dist", Form::Float, frm<&F::cameraDof_focal_dist>},
    {"sides_on", Form::Bool, par<&P::cameraDof_sides_on>},
    {"sides_num", Form::Integer, par<&P::cameraDof_sides_num>},
    {"rotation", Form::Float, frm<&F::cameraDof_rotation>},
    {"anisotropy", Form::Float, par<&P::cameraDof_anisotropy>},
    {"subdivs", Form::Integer, par<&P::cameraDof_subdivs>},
};

const Param kMotionBlur[] = {
    {"on", Form::Bool, par<&P::motionBlur_on>},
    {"geom_samples", Form::Integer, par<&P::motionBlur_geom_samples>},
    {"low_samples", Form::Integer, par<&P::motionBlur_low_samples>},
    {"duration", Form::Float, par<&P::motionBlur_duration>},
    {"subdivs", Form::Integer, par<&P::motionBlur_subdivs>},
    {"bias", Form::Float, par<&P::motionBlur_bias>},
    {"interval_center", Form::Float, par<&P::motionBlur_interval_center>},
};

const Param kGI[] = {
    {"on", Form::Bool, par<&P::gi_on>},
    {"refract_caustics", Form::Bool, par<&P::gi_refract_caustics>},
    {"reflect_caustics", Form::Bool, par<&P::gi_reflect_caustics>},
    {"saturation", Form::Float, par<&P::gi_saturation>},
    {"contrast", Form::Float, par<&P::gi_contrast>},
    {"contrast_base", Form::Float, par<&P::gi_contrast_base>},
    {"primary_engine", Form::Integer, par<&P::gi_primary_engine>},
    {"primary_multiplier", Form::Float, par<&P::gi_primary_multiplier>},
    {"secondary_engine", Form::Integer, par<&P::gi_secondary_engine>},
    {"secondary_multiplier", Form::Float, par<&P::gi_secondary_multiplier>},
    {"save_maps_per_frame", Form::Bool, par<&P::gi_save_maps_per_frame>},
};

const Param kIrradianceMap[] = {
    {"min_rate", Form::Integer, par<&P::irradianceMap_min_rate>},
    {"max_rate", Form::Integer, par<&P::irradianceMap_max_rate>},
    {"subdivs", Form::Integer, par<&P::irradianceMap_subdivs>},
    {"interp_samples", Form::Integer, par<&P::irradianceMap_interp_samples>},
    {"calc_interp_samples", Form::Integer, par<&P::irradianceMap_calc_interp_samples>},
    {"interp_frames", Form::Integer, par<&P::irradianceMap_interp_frames>},
    {"color_threshold", Form::Float, par<&P::irradianceMap_color_threshold>},
    {"normal_threshold", Form::Float, par<&P::irradianceMap_normal_threshold>},
    {"distance_threshold", Form::Float, par<&P::irradianceMap_distance_threshold>},
    {"detail_enhancement", Form::Bool, par<&P::irradianceMap_detail_enhancement>},
    {"detail_radius", Form::Float, par<&P::irradianceMap_detail_radius>},
    {"detail_subdivs_mult", Form::Float, par<&P::irradianceMap_detail_subdivs_mult>},
    {"detail_scale", Form::Integer, par<&P::irradianceMap_detail_scale>},
    {"randomize_samples", Form::Bool, par<&P::irradianceMap_randomize_samples>},
    {"interpolation_mode", Form::Integer, par<&P::irradianceMap_interpolation_mode>},
    {"lookup_mode", Form::Integer, par<&P::irradianceMap_lookup_mode>},
    {"mode", Form::Integer, par<&P::irradianceMap_mode>},
    {"dont_delete", Form::Bool, par<&P::irradianceMap_dont_delete>},
    {"file", Form::FileName, doc<&D::irradianceMap_file>},
    {"show_samples", Form::Bool, par<&P::irradianceMap_show_samples>},
    {"show_calc_phase", Form::Bool, par<&P::irradianceMap_show_calc_phase>},
    {"show_direct_light", Form::Bool, par<&P::irradianceMap_show_direct_light>},
    {"multiple_views", Form::Bool, par<&P::irradianceMap_multiple_views>},
    {"multipass", Form::Bool, par<&P::irradianceMap_multipass>},
    {"check_sample_visibility", Form::Bool, par<&P::irradianceMap_check_sample_visibility>},
    {"auto_save", Form::Bool, par<&P::irradianceMap_auto_save>},
    {"auto_save_file", Form::FileName, doc<&D::irradianceMap_auto_save_file>},
};

const Param kPhotonMap[] = {
    {"bounces", Form::Integer, par<&P::photonMap_bounces>},
    {"max_photons", Form::Integer, par<&P::photonMap_max_photons>},
    {"prefilter", Form::Bool, par<&P::photonMap_prefilter>},
    {"prefilter_samples", Form::Integer, par<&P::photonMap_prefilter_samples>},
    {"mode", Form::Integer, par<&P::photonMap_mode>},
    {"file", Form::FileName, doc<&D::photonMap_file>},
    {"auto_search_distance", Form::Bool, par<&P::photonMap_auto_search_distance>},
    {"search_distance", Form::Float, par<&P::photonMap_search_distance>},
    {"convex_hull_estimate", Form::Bool, par<&P::photonMap_convex_hull_estimate>},
    {"dont_delete", Form::Bool, par<&P::photonMap_dont_delete>},
    {"auto_save", Form::Bool, par<&P::photonMap_auto_save>},
    {"auto_save_file", Form::FileName, doc<&D::photonMap_auto_save_file>},
    {"store_direct_light", Form::Bool, par<&P::photonMap_store_direct_light>},
    {"multiplier", Form::Float, par<&P::photonMap_multiplier>},
    {"max_density", Form::Float, par<&P::photonMap_max_density>},
    {"retrace_corners", Form::Float, par<&P::photonMap_retrace_corners>},
    {"retrace_bounces", Form::Integer, par<&P::photonMap_retrace_bounces>},
    {"show_calc_phase", Form::Bool, par<&P::photonMap_show_calc_phase>},
    {"search_distance_toggle", Form::Bool, par<&P::photonMap_auto_search_distance>, "", kUserData},
};

const Param kLightCache[] = {
    {"subdivs", Form::Integer, par<&P::lightCache_subdivs>},
    {"sample_size", Form::Float, par<&P::lightCache_sample_size>},
    {"filter_type", Form::Integer, par<&P::lightCache_filter_type>},
    {"filter_samples", Form::Integer, par<&P::lightCache_filter_samples>},
    {"filter_size", Form::Float, par<&P::lightCache_filter_size>},
    {"prefilter", Form::Bool, par<&P::lightCache_prefilter>},
    {"prefilter_samples", Form::Integer, par<&P::lightCache_prefilter_samples>},
    {"depth", Form::Integer, par<&P::lightCache_depth>},
    {"show_calc_phase", Form::Bool, par<&P::lightCache_show_calc_phase>},
    {"store_direct_light", Form::Bool, par<&P::lightCache_store_direct_light>},
    {"world_scale", Form::Integer, par<&P::lightCache_world_scale>},
    {"mode", Form::Integer, par<&P::lightCache_mode>},
    {"file", Form::FileName, doc<&D::lightCache_file>},
    {"dont_delete", Form::Bool, par<&P::lightCache_dont_delete>},
    {"auto_save", Form::Bool, par<&P::lightCache_auto_save>},
    {"auto_save_file", Form::FileName, doc<&D::lightCache_auto_save_file>},
    {"num_passes", Form::Integer, par<&P::lightCache_num_passes>},
    {"use_for_glossy_rays", Form::Bool, par<&P::lightCache_use_for_glossy_rays>},
    {"adaptive_sampling", Form::Bool, par<&P::lightCache_adaptive_sampling>},
    {"multiple_views", Form::Bool, par<&P::lightCache_multiple_views>},
    {"min_paths_per_sample", Form::Integer, par<&P::lightCache_min_paths_per_sample>},
    {"adaptive_dirs_only", Form::Bool, par<&P::lightCache_adaptive_dirs_only>},
};

const Param kCaustics[] = {
    {"on", Form::Bool, par<&P::caustics_on>},
    {"max_photons", Form::Integer, par<&P::caustics_max_photons>},
    {"search_distance", Form::Float, par<&P::caustics_search_distance>},
    {"max_density", Form::Float, par<&P::caustics_max_density>},
    {"multiplier", Form::Float, par<&P::caustics_multiplier>},
    {"mode", Form::Integer, par<&P::caustics_mode>},
    {"file", Form::FileName, doc<&D::caustics_file>},
    {"dont_delete", Form::Bool, par<&P::caustics_dont_delete>},
    {"auto_save", Form::Bool, par<&P::caustics_auto_save>},
    {"auto_save_file", Form::FileName, doc<&D::caustics_auto_save_file>},
    {"show_calc_phase", Form::Bool, par<&P::caustics_show_calc_phase>},
};

const Param kRaycaster[] = {
    {"maxLevels", Form::Integer, par<&P::raycaster_maxLevels>},
    {"minLeafSize", Form::Float, par<&P::raycaster_minLeafSize>},
    {"faceLevelCoef", Form::Float, par<&P::raycaster_faceLevelCoef>},
    {"dynMemLimit", Form::Integer, par<&P::raycaster_dynMemLimit>},
    {"optLevel", Form::Integer, par<&P::raycaster_optLevel>},
};

const Param kRegionsGenerator[] = {
    {"xc", Form::Integer, par<&P::regionsGenerator_xc>},
    {"yc", Form::Integer, par<&P::regionsGenerator_yc>},
    {"xymeans", Form::Integer, par<&P::regionsGenerator_xymeans>},
    {"seqtype", Form::Integer, par<&P::regionsGenerator_seqtype>},
    {"reverse", Form::Integer, par<&P::regionsGenerator_reverse>},
};

const Param kDMCGI[] = {
    {"subdivs", Form::Integer, par<&P::dmcGI_subdivs>},
    {"depth", Form::Integer, par<&P::dmcGI_depth>},
};

const Param kDMCSampler[] = {
    {"time_dependent", Form::Bool, par<&P::dmcSampler_time_dependent>},
    {"adaptive_amount", Form::Float, par<&P::dmcSampler_adaptive_amount>},
    {"adaptive_threshold", Form::Float, par<&P::dmcSampler_adaptive_threshold>},
    {"adaptive_min_samples", Form::Integer, par<&P::dmcSampler_adaptive_min_samples>},
    {"subdivs_mult", Form::Float, par<&P::dmcSampler_subdivs_mult>},
    {"path_sampler_type", Form::Integer, par<&P::dmcSampler_path_sampler_type>},
};

const Param kColorMapping[] = {
    {"gamma_correct_rgb", Form::Bool, doc<&D::colorMapping_gamma_correct_rgb>, "", kUserData},
    {"gamma_correct_ldr_textures", Form::Bool, doc<&D::colorMapping_gamma_correct_ldr_textures>, "",
     kUserData},
    {"input_gamma", Form::Float, doc<&D::colorMapping_input_gamma>, "", kUserData},
    {"type", Form::Integer, par<&P::colorMapping_type>},
    {"affect_background", Form::Bool, par<&P::colorMapping_affect_background>},
    {"dark_mult", Form::Float, frm<&F::colorMapping_dark_mult>},
    {"bright_mult", Form::Float, frm<&F::colorMapping_bright_mult>},
    {"gamma", Form::Float, par<&P::colorMapping_gamma>},
    {"subpixel_mapping", Form::Bool, par<&P::colorMapping_subpixel_mapping>},
    {"clamp_output", Form::Bool, par<&P::colorMapping_clamp_output>},
    {"clamp_level", Form::Float, par<&P::colorMapping_clamp_level>},
    {"adaptation_only", Form::Bool, par<&P::colorMapping_adaptation_only>},
    {"linearWorkflow", Form::Bool, par<&P::colorMapping_linearWorkflow>},
};

const Param kRenderChannels[] = {
    {"zdepth_clamp", Form::Bool, doc<&D::renderChannels_zdepth_clamp>},
    {"zdepth_black", Form::Float, doc<&D::renderChannels_zdepth_black>},
    {"zdepth_white", Form::Float, doc<&D::renderChannels_zdepth_white>},
    {"channel_names", Form::Channels, channels, "LFB Channels"},
};

const Param kOptions[] = {
    {"geom_displacement", Form::Bool, par<&P::options_geom_displacement>},
    {"geom_doHidden", Form::Bool, par<&P::options_geom_doHidden>},
    {"light_doLights", Form::Bool, par<&P::options_light_doLights>},
    {"light_doDefaultLights", Form::Bool, par<&P::options_light_doDefaultLights>},
    {"light_doHiddenLights", Form::Bool, par<&P::options_light_doHiddenLights>},
    {"light_doShadows", Form::Bool, par<&P::options_light_doShadows>},
    {"light_onlyGI", Form::Bool, par<&P::options_light_onlyGI>},
    {"gi_dontRenderImage", Form::Bool, par<&P::options_gi_dontRenderImage>},
    {"mtl_reflectionRefraction", Form::Bool, par<&P::options_mtl_reflectionRefraction>},
    {"mtl_limitDepth", Form::Bool, par<&P::options_mtl_limitDepth>},
    {"mtl_maxDepth", Form::Integer, par<&P::options_mtl_maxDepth>},
    {"mtl_doMaps", Form::Bool, par<&P::options_mtl_doMaps>},
    {"mtl_filterMaps", Form::Bool, par<&P::options_mtl_filterMaps>},
    {"mtl_filterMapsForSecondaryRays", Form::Bool, par<&P::options_mtl_filterMapsForSecondaryRays>},
    {"mtl_transpMaxLevels", Form::Integer, par<&P::options_mtl_transpMaxLevels>},
    {"mtl_transpCutoff", Form::Float, par<&P::options_mtl_transpCutoff>},
    {"mtl_override_on", Form::Bool, par<&P::options_mtl_override_on>},
    {"mtl_glossy", Form::Bool, par<&P::options_mtl_glossy>},
    {"geom_backfaceCull", Form::Bool, par<&P::options_geom_backfaceCull>},
    {"ray_bias", Form::Float, par<&P::options_ray_bias>},
    {"misc_lowThreadPriority", Form::Bool, par<&P::options_misc_lowThreadPriority>},
    {"show_progress_window", Form::Integer, doc<&D::options_show_progress_window>},
    {"batch_render", Form::Integer, doc<&D::options_batch_render>},
    {"mtl_override_color", Form::Color, doc<&D::options_mtl_override_color>},
};

const Param kDefaultDisplacement[] = {
    {"override_on", Form::Bool, par<&P::defaultDisplacement_override_on>},
    {"edgeLength", Form::Float, par<&P::defaultDisplacement_edgeLength>},
    {"viewDependent", Form::Bool, par<&P::defaultDisplacement_viewDependent>},
    {"maxSubdivs", Form::Integer, par<&P::defaultDisplacement_maxSubdivs>},
    {"tightBounds", Form::Bool, par<&P::defaultDisplacement_tightBounds>},
    {"amount", Form::Float, par<&P::defaultDisplacement_amount>},
    {"relative", Form::Bool, par<&P::defaultDisplacement_relative>},
};

// The textures' Assets stand ahead of this block's Asset (see writeBlock).
const Param kEnvironment[] = {
    {"use_bg", Form::Bool, doc<&D::environment_use_bg>},
    {"bg_color", Form::Color, doc<&D::environment_bg_color>},
    {"bg_tex", Form::Texture, bgTex},
    {"bg_mult", Form::Float, envMult<&D::bgTexture, &D::bgTextureMult, &D::bgColorMult>},
    {"use_gi", Form::Bool, doc<&D::environment_use_gi>},
    {"gi_color", Form::Color, doc<&D::environment_gi_color>},
    {"gi_tex", Form::Texture, giTex},
    {"gi_mult", Form::Float, envMult<&D::giTexture, &D::giTextureMult, &D::giColorMult>},
    {"use_reflect", Form::Bool, doc<&D::environment_use_reflect>},
    {"reflect_color", Form::Color, doc<&D::environment_reflect_color>},
    {"reflect_tex", Form::Texture, reflectTex},
    {"reflect_mult", Form::Float,
     envMult<&D::reflectTexture, &D::reflectTextureMult, &D::reflectColorMult>},
    {"use_refract", Form::Bool, doc<&D::environment_use_refract>},
    {"refract_color", Form::Color, doc<&D::environment_refract_color>},
    {"refract_tex", Form::Texture, refractTex},
    {"refract_mult", Form::Float,
     envMult<&D::refractTexture, &D::refractTextureMult, &D::refractColorMult>},
};

const Param kOutput[] = {
    {"img_width", Form::Integer, doc<&D::output_img_width>},
    {"img_height", Form::Integer, doc<&D::output_img_height>},
    {"img_pixelAspect", Form::Float, doc<&D::output_img_pixelAspect>},
    {"img_imageAspect", Form::Float, doc<&D::output_img_imageAspect>},
    {"img_file", Form::FileName, doc<&D::output_img_file>},
    {"img_rawFile", Form::Bool, doc<&D::output_img_rawFile>},
    {"frames_per_second", Form::Float, doc<&D::output_frames_per_second>},
    {"rgn_left", Form::Float, frm<&F::output_rgn_left>},
    {"rgn_width", Form::Float, frm<&F::output_rgn_width>},
    {"rgn_top", Form::Float, frm<&F::output_rgn_top>},
    {"rgn_height", Form::Float, frm<&F::output_rgn_height>},
    {"bmp_width", Form::Integer, frm<&F::output_bmp_width>},
    {"bmp_height", Form::Integer, frm<&F::output_bmp_height>},
    {"r_left", Form::Integer, frm<&F::output_r_left>},
    {"r_width", Form::Integer, frm<&F::output_r_width>},
    {"r_top", Form::Integer, frm<&F::output_r_top>},
    {"r_height", Form::Integer, frm<&F::output_r_height>},
    {"luimg_file", Form::FileName, doc<&D::output_luimg_file>, "LuImage Output File", kUserData},
    {"override_viewport", Form::Bool, doc<&D::output_override_viewport>, "Override Viewport",
     kUserData},
    {"do_animation", Form::Bool, doc<&D::output_do_animation>, "", kUserData},
    {"save_render", Form::Bool, doc<&D::output_save_render>, "", kUserData},
    {"frame_rate", Form::Integer, doc<&D::output_frame_rate>, "", kUserData},
    {"img_imageAspectLocked", Form::Bool, doc<&D::output_img_imageAspectLocked>, "", kUserData},
    {"img_pixelAspectLocked", Form::Bool, doc<&D::output_img_pixelAspectLocked>},
};

const Param kCameraPhysical[] = {
    {"on", Form::Bool, doc<&D::physicalCameraOn>},
    {"type", Form::Integer, cam<&C::type>},
    {"film_width", Form::Float, cam<&C::film_width>},
    {"focal_length", Form::Float, cam<&C::focal_length>},
    {"zoom_factor", Form::Float, cam<&C::zoom_factor>},
    {"distortion", Form::Float, cam<&C::distortion>},
    {"f_number", Form::Float, cam<&C::f_number>},
    {"lens_shift", Form::Float, cam<&C::lens_shift>},
    {"shutter_speed", Form::Float, cam<&C::shutter_speed>},
    {"shutter_angle", Form::Float, cam<&C::shutter_angle>},
    {"shutter_offset", Form::Float, cam<&C::shutter_offset>},
    {"latency", Form::Float, cam<&C::latency>},
    {"ISO", Form::Float, cam<&C::ISO>},
    {"specify_focus", Form::Bool, cam<&C::specify_focus>},
    {"focus_distance", Form::Float, cam<&C::focus_distance>},
    {"targeted", Form::Bool, cam<&C::targeted>},
    {"target_distance", Form::Float, cam<&C::target_distance>},
    {"dof_display_threshold", Form::Float, cam<&C::dof_display_threshold>},
    {"exposure", Form::Bool, cam<&C::exposure>},
    {"white_balance", Form::Color, cam<&C::white_balance>},
    {"vignetting", Form::Bool, cam<&C::vignetting>},
    {"blades_enable", Form::Bool, cam<&C::blades_enable>},
    {"blades_num", Form::Integer, cam<&C::blades_num>},
    {"blades_rotation", Form::Float, cam<&C::blades_rotation>},
    {"center_bias", Form::Float, cam<&C::center_bias>},
    {"anisotropy", Form::Float, cam<&C::anisotropy>},
    {"use_dof", Form::Bool, cam<&C::use_dof>},
    {"use_moblur", Form::Bool, cam<&C::use_moblur>},
    {"subdivs", Form::Integer, cam<&C::subdivs>},
    {"specify_film_width", Form::Bool, doc<&D::specifyFilmWidth>, "", kUserData},
    {"override_focal_length", Form::Bool, doc<&D::overrideFocalLength>, "", kUserData},
};

const Param kDR[] = {
    {"on", Form::Bool, doc<&D::drOn>},
    {"asset_coll", Form::Bool, doc<&D::drAssetColl>},
    {"mode", Form::Integer, doc<&D::drMode>},
    {"folder", Form::FileName, doc<&D::dr_folder>},
};

struct Block {
    const char16_t* name;
    const Param* params;
    std::size_t count;
};

template <std::size_t N>
constexpr Block block(const char16_t* name, const Param (&params)[N]) {
    return Block{name, params, N};
}

const Block kBlocks[] = {
    block(u"SettingsImageSampler", kImageSampler),
    block(u"SettingsImageFilter", kImageFilter),
    block(u"SettingsCamera", kCamera),
    block(u"SettingsCameraDof", kCameraDof),
    block(u"SettingsMotionBlur", kMotionBlur),
    block(u"SettingsGI", kGI),
    block(u"SettingsIrradianceMap", kIrradianceMap),
    block(u"SettingsPhotonMap", kPhotonMap),
    block(u"SettingsLightCache", kLightCache),
    block(u"SettingsCaustics", kCaustics),
    block(u"SettingsRaycaster", kRaycaster),
    block(u"SettingsRegionsGenerator", kRegionsGenerator),
    block(u"SettingsDMCGI", kDMCGI),
    block(u"SettingsDMCSampler", kDMCSampler),
    block(u"SettingsColorMapping", kColorMapping),
    block(u"SettingsRenderChannels", kRenderChannels),
    block(u"SettingsOptions", kOptions),
    block(u"SettingsDefaultDisplacement", kDefaultDisplacement),
    block(u"SettingsEnvironment", kEnvironment),
    block(u"SettingsOutput", kOutput),
    block(u"CameraPhysical", kCameraPhysical),
    block(u"SettingsDR", kDR),
};

std::u16string slotUrl(const std::u16string& blockUrl, const Value& v) {
    std::u16string url = blockUrl;
    url += u'/';
    WriterText(v.slot).appendTo(url);
    return url;
}

void writeParam(AssetXmlWriter& w, const AllOptions& o, const Param& p,
                const std::u16string& blockUrl) {
    const Value v = p.source(o);
    switch (p.form) {
    case Form::Integer:
        w.writeInteger(p.name, static_cast<std::int32_t>(v.number), p.label, p.userData);
        break;
    case Form::Bool: w.writeBool(p.name, v.number != 0, p.label, p.userData); break;
    case Form::Float:
        w.writeFloat(p.name, static_cast<float>(v.number), p.label, p.userData);
        break;
    case Form::Color: w.writeColor(p.name, v.color, p.label); break;
    case Form::FileName: w.writeFileName(p.name, *v.text, p.label, p.userData); break;
    case Form::Texture:
        w.writePluginRef(p.name, boost::any(*v.texture), slotUrl(blockUrl, v), p.label);
        break;
    case Form::Channels:
        w.openList(p.name, "string", p.label);
        for (std::int32_t channel : o.renderChannels)
            if (const char16_t* name = AllOptions::channelName(channel)) w.writeListEntry(name);
        w.closeList();
        break;
    }
}

// One block in an Assets element of its own: first the Assets of the
// textures that the block refers to, then the block's Asset.
void writeBlock(AssetXmlWriter& w, const AllOptions& o, const Block& b, const std::u16string& url,
                const std::u16string& assetType) {
    const std::u16string blockUrl = url + u"/" + b.name;
    w.openAssets();
    for (std::size_t k = 0; k < b.count; ++k) {
        if (b.params[k].form != Form::Texture) continue;
        const Value v = b.params[k].source(o);
        if (*v.texture) (*v.texture)->writeXml(w, slotUrl(blockUrl, v));
    }
    writeAsset(w, blockUrl, assetType, b.name, [&] {
        for (std::size_t k = 0; k < b.count; ++k) writeParam(w, o, b.params[k], blockUrl);
    });
    w.closeAssets();
}

}  // namespace

void AllOptions::writeXml(AssetXmlWriter& writer, std::u16string url) {
    const std::u16string assetType = getAssetType();
    for (const Block& b : kBlocks) writeBlock(writer, *this, b, url, assetType);
}

}  // namespace OrvaneLumoCore
