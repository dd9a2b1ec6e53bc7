// The options document: 22 settings blocks, each described once as a table of
// XML parameters (xml/ParamRows.h) in the order in which they are written.
// The parameters show fields of four holders: the document's own, its params,
// its frame data and its physical camera. Every block and every parameter is
// always written.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "options/AllOptions.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

namespace {

typedef LumoUtils::LumoParams P;
typedef LumoUtils::LumoFrameData F;
typedef AllOptions D;
typedef PhysicalCamera C;

// A field of the params, the frame data or the camera.
template <auto M> constexpr PartWriter<D> par = fieldOf<&D::params, M>;
template <auto M> constexpr PartWriter<D> frm = fieldOf<&D::frameData, M>;
template <auto M> constexpr PartWriter<D> cam = fieldOf<&D::physicalCamera, M>;

// The four environment slots: the texture, its multiplier and the colour's.
// The XML shows the texture's multiplier when the texture is there.
enum Slot : int { kBg, kGi, kReflect, kRefract };
struct EnvSlot {
    float D::*textureMult;
    float D::*colorMult;
    TexturePtr D::*texture;
};
constexpr EnvSlot kEnvSlots[] = {
    {&D::bgTextureMult, &D::bgColorMult, &D::bgTexture},
    {&D::giTextureMult, &D::giColorMult, &D::giTexture},
    {&D::reflectTextureMult, &D::reflectColorMult, &D::reflectTexture},
    {&D::refractTextureMult, &D::refractColorMult, &D::refractTexture},
};

// Parameters whose value is not a field as it stands (see writeHooked).
enum Hook : int {
    kFilterType = 1,
    kOverrideFocalDist,
    kChannels,
    kFocalLength,
    kFocusDistance,
    kEnvMult,  // + the Slot
};

constexpr bool kUserData = true;

constexpr ParamRow<D> hooked(const char* name, int hook, const char* label = "", bool userData = false) {
    return {name, {}, label, userData, hook};
}

const ParamRow<D> kImageSampler[] = {
    {"type", par<&P::imageSampler_type>},
    {"fixed_subdivs", par<&P::imageSampler_fixed_subdivs>},
    {"dmc_minSubdivs", par<&P::imageSampler_dmc_minSubdivs>},
    {"dmc_maxSubdivs", par<&P::imageSampler_dmc_maxSubdivs>},
    {"dmc_threshold", par<&P::imageSampler_dmc_threshold>},
    {"subdivision_minRate", par<&P::imageSampler_subdivision_minRate>},
    {"subdivision_maxRate", par<&P::imageSampler_subdivision_maxRate>},
    {"subdivision_jitter", asFlag(par<&P::imageSampler_subdivision_jitter>)},
    {"subdivision_threshold", par<&P::imageSampler_subdivision_threshold>},
    {"subdivision_edges", asFlag(par<&P::imageSampler_subdivision_edges>)},
    {"subdivision_normals", asFlag(par<&P::imageSampler_subdivision_normals>)},
    {"subdivision_normals_threshold", par<&P::imageSampler_subdivision_normals_threshold>},
};

const ParamRow<D> kImageFilter[] = {
    {"on", asFlag(par<&P::imageFilter_on>)},
    hooked("type", kFilterType),
    {"size", &D::filterSize},
};

const ParamRow<D> kCamera[] = {
    {"type", par<&P::camera_type>},
    {"height", frm<&F::camera_height>},
    {"dist", frm<&F::camera_dist>},
    {"fov", &D::camera_fov},
    {"auto_fit", asFlag(frm<&F::camera_auto_fit>)},
    {"curve", frm<&F::camera_curve>},
    {"override_fov", asFlag(&D::camera_override_fov), "", kUserData},
};

const ParamRow<D> kCameraDof[] = {
    hooked("override_focal_dist", kOverrideFocalDist, "", kUserData),
    {"on", asFlag(par<&P::cameraDof_on>)},
    {"aperture", frm<&F::cameraDof_aperture>},
    {"center_bias", par<&P::cameraDof_center_bias>},
    {"focal_dist", frm<&F::cameraDof_focal_dist>},
    {"sides_on", asFlag(par<&P::cameraDof_sides_on>)},
    {"sides_num", par<&P::cameraDof_sides_num>},
    {"rotation", frm<&F::cameraDof_rotation>},
    {"anisotropy", par<&P::cameraDof_anisotropy>},
    {"subdivs", par<&P::cameraDof_subdivs>},
};

const ParamRow<D> kMotionBlur[] = {
    {"on", asFlag(par<&P::motionBlur_on>)},
    {"geom_samples", par<&P::motionBlur_geom_samples>},
    {"low_samples", par<&P::motionBlur_low_samples>},
    {"duration", par<&P::motionBlur_duration>},
    {"subdivs", par<&P::motionBlur_subdivs>},
    {"bias", par<&P::motionBlur_bias>},
    {"interval_center", par<&P::motionBlur_interval_center>},
};

const ParamRow<D> kGI[] = {
    {"on", asFlag(par<&P::gi_on>)},
    {"refract_caustics", asFlag(par<&P::gi_refract_caustics>)},
    {"reflect_caustics", asFlag(par<&P::gi_reflect_caustics>)},
    {"saturation", par<&P::gi_saturation>},
    {"contrast", par<&P::gi_contrast>},
    {"contrast_base", par<&P::gi_contrast_base>},
    {"primary_engine", par<&P::gi_primary_engine>},
    {"primary_multiplier", par<&P::gi_primary_multiplier>},
    {"secondary_engine", par<&P::gi_secondary_engine>},
    {"secondary_multiplier", par<&P::gi_secondary_multiplier>},
    {"save_maps_per_frame", asFlag(par<&P::gi_save_maps_per_frame>)},
};

const ParamRow<D> kIrradianceMap[] = {
    {"min_rate", par<&P::irradianceMap_min_rate>},
    {"max_rate", par<&P::irradianceMap_max_rate>},
    {"subdivs", par<&P::irradianceMap_subdivs>},
    {"interp_samples", par<&P::irradianceMap_interp_samples>},
    {"calc_interp_samples", par<&P::irradianceMap_calc_interp_samples>},
    {"interp_frames", par<&P::irradianceMap_interp_frames>},
    {"color_threshold", par<&P::irradianceMap_color_threshold>},
    {"normal_threshold", par<&P::irradianceMap_normal_threshold>},
    {"distance_threshold", par<&P::irradianceMap_distance_threshold>},
    {"detail_enhancement", asFlag(par<&P::irradianceMap_detail_enhancement>)},
    {"detail_radius", par<&P::irradianceMap_detail_radius>},
    {"detail_subdivs_mult", par<&P::irradianceMap_detail_subdivs_mult>},
    {"detail_scale", par<&P::irradianceMap_detail_scale>},
    {"randomize_samples", asFlag(par<&P::irradianceMap_randomize_samples>)},
    {"interpolation_mode", par<&P::irradianceMap_interpolation_mode>},
    {"lookup_mode", par<&P::irradianceMap_lookup_mode>},
    {"mode", par<&P::irradianceMap_mode>},
    {"dont_delete", asFlag(par<&P::irradianceMap_dont_delete>)},
    {"file", FieldRef<D>::path(&D::irradianceMap_file)},
    {"show_samples", asFlag(par<&P::irradianceMap_show_samples>)},
    {"show_calc_phase", asFlag(par<&P::irradianceMap_show_calc_phase>)},
    {"show_direct_light", asFlag(par<&P::irradianceMap_show_direct_light>)},
    {"multiple_views", asFlag(par<&P::irradianceMap_multiple_views>)},
    {"multipass", asFlag(par<&P::irradianceMap_multipass>)},
    {"check_sample_visibility", asFlag(par<&P::irradianceMap_check_sample_visibility>)},
    {"auto_save", asFlag(par<&P::irradianceMap_auto_save>)},
    {"auto_save_file", FieldRef<D>::path(&D::irradianceMap_auto_save_file)},
};

const ParamRow<D> kPhotonMap[] = {
    {"bounces", par<&P::photonMap_bounces>},
    {"max_photons", par<&P::photonMap_max_photons>},
    {"prefilter", asFlag(par<&P::photonMap_prefilter>)},
    {"prefilter_samples", par<&P::photonMap_prefilter_samples>},
    {"mode", par<&P::photonMap_mode>},
    {"file", FieldRef<D>::path(&D::photonMap_file)},
    {"auto_search_distance", asFlag(par<&P::photonMap_auto_search_distance>)},
    {"search_distance", par<&P::photonMap_search_distance>},
    {"convex_hull_estimate", asFlag(par<&P::photonMap_convex_hull_estimate>)},
    {"dont_delete", asFlag(par<&P::photonMap_dont_delete>)},
    {"auto_save", asFlag(par<&P::photonMap_auto_save>)},
    {"auto_save_file", FieldRef<D>::path(&D::photonMap_auto_save_file)},
    {"store_direct_light", asFlag(par<&P::photonMap_store_direct_light>)},
    {"multiplier", par<&P::photonMap_multiplier>},
    {"max_density", par<&P::photonMap_max_density>},
    {"retrace_corners", par<&P::photonMap_retrace_corners>},
    {"retrace_bounces", par<&P::photonMap_retrace_bounces>},
    {"show_calc_phase", asFlag(par<&P::photonMap_show_calc_phase>)},
    {"search_distance_toggle", asFlag(par<&P::photonMap_auto_search_distance>), "", kUserData},
};

const ParamRow<D> kLightCache[] = {
    {"subdivs", par<&P::lightCache_subdivs>},
    {"sample_size", par<&P::lightCache_sample_size>},
    {"filter_type", par<&P::lightCache_filter_type>},
    {"filter_samples", par<&P::lightCache_filter_samples>},
    {"filter_size", par<&P::lightCache_filter_size>},
    {"prefilter", asFlag(par<&P::lightCache_prefilter>)},
    {"prefilter_samples", par<&P::lightCache_prefilter_samples>},
    {"depth", par<&P::lightCache_depth>},
    {"show_calc_phase", asFlag(par<&P::lightCache_show_calc_phase>)},
    {"store_direct_light", asFlag(par<&P::lightCache_store_direct_light>)},
    {"world_scale", par<&P::lightCache_world_scale>},
    {"mode", par<&P::lightCache_mode>},
    {"file", FieldRef<D>::path(&D::lightCache_file)},
    {"dont_delete", asFlag(par<&P::lightCache_dont_delete>)},
    {"auto_save", asFlag(par<&P::lightCache_auto_save>)},
    {"auto_save_file", FieldRef<D>::path(&D::lightCache_auto_save_file)},
    {"num_passes", par<&P::lightCache_num_passes>},
    {"use_for_glossy_rays", asFlag(par<&P::lightCache_use_for_glossy_rays>)},
    {"adaptive_sampling", asFlag(par<&P::lightCache_adaptive_sampling>)},
    {"multiple_views", asFlag(par<&P::lightCache_multiple_views>)},
    {"min_paths_per_sample", par<&P::lightCache_min_paths_per_sample>},
    {"adaptive_dirs_only", asFlag(par<&P::lightCache_adaptive_dirs_only>)},
};

const ParamRow<D> kCaustics[] = {
    {"on", asFlag(par<&P::caustics_on>)},
    {"max_photons", par<&P::caustics_max_photons>},
    {"search_distance", par<&P::caustics_search_distance>},
    {"max_density", par<&P::caustics_max_density>},
    {"multiplier", par<&P::caustics_multiplier>},
    {"mode", par<&P::caustics_mode>},
    {"file", FieldRef<D>::path(&D::caustics_file)},
    {"dont_delete", asFlag(par<&P::caustics_dont_delete>)},
    {"auto_save", asFlag(par<&P::caustics_auto_save>)},
    {"auto_save_file", FieldRef<D>::path(&D::caustics_auto_save_file)},
    {"show_calc_phase", asFlag(par<&P::caustics_show_calc_phase>)},
};

const ParamRow<D> kRaycaster[] = {
    {"maxLevels", par<&P::raycaster_maxLevels>},
    {"minLeafSize", par<&P::raycaster_minLeafSize>},
    {"faceLevelCoef", par<&P::raycaster_faceLevelCoef>},
    {"dynMemLimit", par<&P::raycaster_dynMemLimit>},
    {"optLevel", par<&P::raycaster_optLevel>},
};

const ParamRow<D> kRegionsGenerator[] = {
    {"xc", par<&P::regionsGenerator_xc>},
    {"yc", par<&P::regionsGenerator_yc>},
    {"xymeans", par<&P::regionsGenerator_xymeans>},
    {"seqtype", par<&P::regionsGenerator_seqtype>},
    {"reverse", par<&P::regionsGenerator_reverse>},
};

const ParamRow<D> kDMCGI[] = {
    {"subdivs", par<&P::dmcGI_subdivs>},
    {"depth", par<&P::dmcGI_depth>},
};

const ParamRow<D> kDMCSampler[] = {
    {"time_dependent", asFlag(par<&P::dmcSampler_time_dependent>)},
    {"adaptive_amount", par<&P::dmcSampler_adaptive_amount>},
    {"adaptive_threshold", par<&P::dmcSampler_adaptive_threshold>},
    {"adaptive_min_samples", par<&P::dmcSampler_adaptive_min_samples>},
    {"subdivs_mult", par<&P::dmcSampler_subdivs_mult>},
    {"path_sampler_type", par<&P::dmcSampler_path_sampler_type>},
};

const ParamRow<D> kColorMapping[] = {
    {"gamma_correct_rgb", asFlag(&D::colorMapping_gamma_correct_rgb), "", kUserData},
    {"gamma_correct_ldr_textures", asFlag(&D::colorMapping_gamma_correct_ldr_textures), "", kUserData},
    {"input_gamma", &D::colorMapping_input_gamma, "", kUserData},
    {"type", par<&P::colorMapping_type>},
    {"affect_background", asFlag(par<&P::colorMapping_affect_background>)},
    {"dark_mult", frm<&F::colorMapping_dark_mult>},
    {"bright_mult", frm<&F::colorMapping_bright_mult>},
    {"gamma", par<&P::colorMapping_gamma>},
    {"subpixel_mapping", asFlag(par<&P::colorMapping_subpixel_mapping>)},
    {"clamp_output", asFlag(par<&P::colorMapping_clamp_output>)},
    {"clamp_level", par<&P::colorMapping_clamp_level>},
    {"adaptation_only", asFlag(par<&P::colorMapping_adaptation_only>)},
    {"linearWorkflow", asFlag(par<&P::colorMapping_linearWorkflow>)},
};

const ParamRow<D> kRenderChannels[] = {
    {"zdepth_clamp", asFlag(&D::renderChannels_zdepth_clamp)},
    {"zdepth_black", &D::renderChannels_zdepth_black},
    {"zdepth_white", &D::renderChannels_zdepth_white},
    hooked("channel_names", kChannels, "LFB Channels"),
};

const ParamRow<D> kOptions[] = {
    {"geom_displacement", asFlag(par<&P::options_geom_displacement>)},
    {"geom_doHidden", asFlag(par<&P::options_geom_doHidden>)},
    {"light_doLights", asFlag(par<&P::options_light_doLights>)},
    {"light_doDefaultLights", asFlag(par<&P::options_light_doDefaultLights>)},
    {"light_doHiddenLights", asFlag(par<&P::options_light_doHiddenLights>)},
    {"light_doShadows", asFlag(par<&P::options_light_doShadows>)},
    {"light_onlyGI", asFlag(par<&P::options_light_onlyGI>)},
    {"gi_dontRenderImage", asFlag(par<&P::options_gi_dontRenderImage>)},
    {"mtl_reflectionRefraction", asFlag(par<&P::options_mtl_reflectionRefraction>)},
    {"mtl_limitDepth", asFlag(par<&P::options_mtl_limitDepth>)},
    {"mtl_maxDepth", par<&P::options_mtl_maxDepth>},
    {"mtl_doMaps", asFlag(par<&P::options_mtl_doMaps>)},
    {"mtl_filterMaps", asFlag(par<&P::options_mtl_filterMaps>)},
    {"mtl_filterMapsForSecondaryRays", asFlag(par<&P::options_mtl_filterMapsForSecondaryRays>)},
    {"mtl_transpMaxLevels", par<&P::options_mtl_transpMaxLevels>},
    {"mtl_transpCutoff", par<&P::options_mtl_transpCutoff>},
    {"mtl_override_on", asFlag(par<&P::options_mtl_override_on>)},
    {"mtl_glossy", asFlag(par<&P::options_mtl_glossy>)},
    {"geom_backfaceCull", asFlag(par<&P::options_geom_backfaceCull>)},
    {"ray_bias", par<&P::options_ray_bias>},
    {"misc_lowThreadPriority", asFlag(par<&P::options_misc_lowThreadPriority>)},
    {"show_progress_window", &D::options_show_progress_window},
    {"batch_render", &D::options_batch_render},
    {"mtl_override_color", &D::options_mtl_override_color},
};

const ParamRow<D> kDefaultDisplacement[] = {
    {"override_on", asFlag(par<&P::defaultDisplacement_override_on>)},
    {"edgeLength", par<&P::defaultDisplacement_edgeLength>},
    {"viewDependent", asFlag(par<&P::defaultDisplacement_viewDependent>)},
    {"maxSubdivs", par<&P::defaultDisplacement_maxSubdivs>},
    {"tightBounds", asFlag(par<&P::defaultDisplacement_tightBounds>)},
    {"amount", par<&P::defaultDisplacement_amount>},
    {"relative", asFlag(par<&P::defaultDisplacement_relative>)},
};

// The textures' Assets stand ahead of this block's Asset (see writeBlock).
const ParamRow<D> kEnvironment[] = {
    {"use_bg", asFlag(&D::environment_use_bg)},
    {"bg_color", &D::environment_bg_color},
    {"bg_tex", &D::bgTexture},
    hooked("bg_mult", kEnvMult + kBg),
    {"use_gi", asFlag(&D::environment_use_gi)},
    {"gi_color", &D::environment_gi_color},
    {"gi_tex", &D::giTexture},
    hooked("gi_mult", kEnvMult + kGi),
    {"use_reflect", asFlag(&D::environment_use_reflect)},
    {"reflect_color", &D::environment_reflect_color},
    {"reflect_tex", &D::reflectTexture},
    hooked("reflect_mult", kEnvMult + kReflect),
    {"use_refract", asFlag(&D::environment_use_refract)},
    {"refract_color", &D::environment_refract_color},
    {"refract_tex", &D::refractTexture},
    hooked("refract_mult", kEnvMult + kRefract),
};

const ParamRow<D> kOutput[] = {
    {"img_width", &D::output_img_width},
    {"img_height", &D::output_img_height},
    {"img_pixelAspect", &D::output_img_pixelAspect},
    {"img_imageAspect", &D::output_img_imageAspect},
    {"img_file", FieldRef<D>::path(&D::output_img_file)},
    {"img_rawFile", asFlag(&D::output_img_rawFile)},
    {"frames_per_second", &D::output_frames_per_second},
    {"rgn_left", frm<&F::output_rgn_left>},
    {"rgn_width", frm<&F::output_rgn_width>},
    {"rgn_top", frm<&F::output_rgn_top>},
    {"rgn_height", frm<&F::output_rgn_height>},
    {"bmp_width", frm<&F::output_bmp_width>},
    {"bmp_height", frm<&F::output_bmp_height>},
    {"r_left", frm<&F::output_r_left>},
    {"r_width", frm<&F::output_r_width>},
    {"r_top", frm<&F::output_r_top>},
    {"r_height", frm<&F::output_r_height>},
    {"luimg_file", FieldRef<D>::path(&D::output_luimg_file), "LuImage Output File", kUserData},
    {"override_viewport", asFlag(&D::output_override_viewport), "Override Viewport", kUserData},
    {"do_animation", asFlag(&D::output_do_animation), "", kUserData},
    {"save_render", asFlag(&D::output_save_render), "", kUserData},
    {"frame_rate", &D::output_frame_rate, "", kUserData},
    {"img_imageAspectLocked", asFlag(&D::output_img_imageAspectLocked), "", kUserData},
    {"img_pixelAspectLocked", asFlag(&D::output_img_pixelAspectLocked)},
};

const ParamRow<D> kCameraPhysical[] = {
    {"on", asFlag(&D::physicalCameraOn)},
    {"type", cam<&C::type>},
    {"film_width", cam<&C::film_width>},
    hooked("focal_length", kFocalLength),
    {"zoom_factor", cam<&C::zoom_factor>},
    {"distortion", cam<&C::distortion>},
    {"f_number", cam<&C::f_number>},
    {"lens_shift", cam<&C::lens_shift>},
    {"shutter_speed", cam<&C::shutter_speed>},
    {"shutter_angle", cam<&C::shutter_angle>},
    {"shutter_offset", cam<&C::shutter_offset>},
    {"latency", cam<&C::latency>},
    {"ISO", cam<&C::ISO>},
    {"specify_focus", cam<&C::specify_focus>},
    hooked("focus_distance", kFocusDistance),
    {"targeted", cam<&C::targeted>},
    {"target_distance", cam<&C::target_distance>},
    {"dof_display_threshold", cam<&C::dof_display_threshold>},
    {"exposure", cam<&C::exposure>},
    {"white_balance", cam<&C::white_balance>},
    {"vignetting", cam<&C::vignetting>},
    {"blades_enable", cam<&C::blades_enable>},
    {"blades_num", cam<&C::blades_num>},
    {"blades_rotation", cam<&C::blades_rotation>},
    {"center_bias", cam<&C::center_bias>},
    {"anisotropy", cam<&C::anisotropy>},
    {"use_dof", cam<&C::use_dof>},
    {"use_moblur", cam<&C::use_moblur>},
    {"subdivs", cam<&C::subdivs>},
    {"specify_film_width", asFlag(&D::specifyFilmWidth), "", kUserData},
    {"override_focal_length", asFlag(&D::overrideFocalLength), "", kUserData},
};

const ParamRow<D> kDR[] = {
    {"on", asFlag(&D::drOn)},
    {"asset_coll", asFlag(&D::drAssetColl)},
    {"mode", &D::drMode},
    {"folder", FieldRef<D>::path(&D::dr_folder)},
};

struct Block {
    const char16_t* name;
    const ParamRow<D>* params;
    std::size_t count;

    const ParamRow<D>* begin() const { return params; }
    const ParamRow<D>* end() const { return params + count; }
};

template <std::size_t N>
constexpr Block block(const char16_t* name, const ParamRow<D> (&params)[N]) {
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

bool isTexture(const ParamRow<D>& row) { return row.field.kind() == FieldRef<D>::Kind::Texture; }

// A texture's Asset stands under the block's url, named by its parameter
// spelled out: bg_tex is bg_texture.
std::u16string slotUrl(const std::u16string& blockUrl, const ParamRow<D>& row) {
    std::u16string url = blockUrl;
    url += u'/';
    WriterText(row.name).appendTo(url);
    url += u"ture";
    return url;
}

// An animated field shows its value at time 0.
float atTimeZero(const AnimatedReal& a) { return a.getValue(0.0); }

void writeHooked(AssetXmlWriter& w, const AllOptions& o, const ParamRow<D>& row, const std::u16string& blockUrl) {
    const char* name = row.name;
    const WriterText label(row.label);
    if (isTexture(row)) {
        w.writePluginRef(name, row.field.get<TexturePtr>(o).get(), slotUrl(blockUrl, row), label);
        return;
    }
    switch (row.hook) {
    case kFilterType: {
        // The stored filter kernels 1 and 2 change places in the document.
        const std::int32_t k = o.filterKernel;
        w.writeInteger(name, k == 1 ? 2 : k == 2 ? 1 : k, label, row.isUserData);
        break;
    }
    case kOverrideFocalDist:
        // The document asks whether the focal distance is overridden; the
        // record stores whether it comes from the camera.
        w.writeBool(name, o.focalDistFromCamera == 0, label, row.isUserData);
        break;
    case kChannels:
        w.openList(name, "string", label);
        for (std::int32_t channel : o.renderChannels)
            if (const char16_t* channelName = AllOptions::channelName(channel)) w.writeListEntry(channelName);
        w.closeList();
        break;
    case kFocalLength:
        w.writeFloat(name, atTimeZero(o.physicalCamera.focal_length), label, row.isUserData);
        break;
    case kFocusDistance:
        w.writeFloat(name, atTimeZero(o.physicalCamera.focus_distance), label, row.isUserData);
        break;
    default: {
        const EnvSlot& slot = kEnvSlots[row.hook - kEnvMult];
        w.writeFloat(name, o.*slot.texture ? o.*slot.textureMult : o.*slot.colorMult, label, row.isUserData);
        break;
    }
    }
}

// One block in an Assets element of its own: first the Assets of the
// textures that the block refers to, then the block's Asset.
void writeBlock(AssetXmlWriter& w, const AllOptions& o, const Block& b, const std::u16string& url,
                const std::u16string& assetType) {
    const std::u16string blockUrl = url + u"/" + b.name;
    w.openAssets();
    for (const ParamRow<D>& row : b) {
        if (!isTexture(row)) continue;
        if (const TexturePtr& texture = row.field.get<TexturePtr>(o)) texture->writeXml(w, slotUrl(blockUrl, row));
    }
    writeAsset(w, blockUrl, assetType, b.name,
               [&] { writeParams(w, o, b, [&](const ParamRow<D>& row) { writeHooked(w, o, row, blockUrl); }); });
    w.closeAssets();
}

}  // namespace

std::size_t AllOptions::documentBlockCount() { return sizeof kBlocks / sizeof kBlocks[0]; }

std::vector<AllOptions::DocumentField> AllOptions::pathAndTextureFields() const {
    std::vector<DocumentField> fields;
    for (const Block& b : kBlocks) {
        for (const ParamRow<D>& row : b) {
            if (row.field.part) continue;  // a field of params, frame data or camera: no paths there
            if (row.field.kind() == FieldRef<D>::Kind::Path)
                fields.push_back({b.name, row.name, &row.field.get<std::u16string>(*this), nullptr});
            else if (isTexture(row))
                fields.push_back({b.name, row.name, nullptr, &row.field.get<TexturePtr>(*this)});
        }
    }
    return fields;
}

void AllOptions::writeXml(AssetXmlWriter& writer, std::u16string url) {
    const std::u16string assetType = getAssetType();
    for (const Block& b : kBlocks) writeBlock(writer, *this, b, url, assetType);
}

}  // namespace OrvaneLumoCore
