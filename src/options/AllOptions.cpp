#include "options/AllOptions.h"

#include "options/DocumentBlocks.h"
#include "persistence/FieldRows.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"

namespace OrvaneLumoCore {

namespace {

typedef AllOptions D;
typedef RowsOf<D> DR;

// The hook rows: fields that the record's own code reads and writes.
enum DocumentHook {
    kParams,
    kFrameData,
    kStampInfo,
    kCamera,
    kTexture,  // an environment texture: the row's field
    kChannels,
    kPath,
};

constexpr RecordRow<D> path(std::u16string D::*member) {
    return DR::hook(kPath, 0, FieldRef<D>::path(member));
}

// The record in file order. The number behind a builder is the first version
// that holds the field; versions 10 to 15 don't exist.
const RecordRow<D> kDocumentRows[] = {
    DR::hook(kParams, 0),  // 1
    DR::hook(kFrameData, 0),
    DR::hook(kStampInfo, 0),
    DR::hook(kCamera, 5),
    DR::hook(kTexture, 0, &D::bgTexture).shownIn(block::Environment, "bg_tex", 3),  // 5
    DR::hook(kTexture, 0, &D::giTexture).shownIn(block::Environment, "gi_tex", 7),
    DR::color(&D::environment_bg_color, Color(0, 0, 0), 0).shownIn(block::Environment, "bg_color", 2),
    DR::color(&D::environment_gi_color, Color(0.8f, 0.8980392f, 1.0f), 0)
        .shownIn(block::Environment, "gi_color", 6),
    DR::b32(&D::environment_use_gi, 0, 0).shownIn(block::Environment, "use_gi", 5).asFlag(),
    DR::b32(&D::environment_use_bg, 0, 0).shownIn(block::Environment, "use_bg", 1).asFlag(),  // 10
    DR::i32(&D::filterKernel, 5, 0).shownIn(block::ImageFilter, "type", 2).shownBy(kFilterTypeForm),
    DR::i32(&D::output_img_height, 600, 0).shownIn(block::Output, "img_height", 2),
    DR::i32(&D::output_img_width, 800, 0).shownIn(block::Output, "img_width", 1),
    DR::b32(&D::camera_override_fov, 0, 0).shownIn(block::Camera, "override_fov", 7).asFlag().userData(),
    DR::b32(&D::output_override_viewport, 0, 0)  // 15
        .shownIn(block::Output, "override_viewport", 19).asFlag().labelled("Override Viewport", true),
    DR::b32(&D::output_img_imageAspectLocked, 0, 0)
        .shownIn(block::Output, "img_imageAspectLocked", 23).asFlag().userData(),
    DR::b32(&D::output_img_pixelAspectLocked, 0, 0)
        .shownIn(block::Output, "img_pixelAspectLocked", 24).asFlag(),
    DR::b32(&D::output_img_rawFile, 0, 0).shownIn(block::Output, "img_rawFile", 6).asFlag(),
    DR::b32(&D::output_save_render, 0, 0).shownIn(block::Output, "save_render", 21).asFlag().userData(),
    DR::b32(&D::focalDistFromCamera, 1, 2)  // 20
        .shownIn(block::CameraDof, "override_focal_dist", 1).userData().shownBy(kInvertedFlagForm),
    DR::i32(&D::options_show_progress_window, 1, 3).shownIn(block::Options, "show_progress_window", 22),
    DR::b32(&D::physicalCameraOn, 0, 5).shownIn(block::CameraPhysical, "on", 1).asFlag(),
    DR::b32(&D::overrideFocalLength, 0, 6)
        .shownIn(block::CameraPhysical, "override_focal_length", 31).asFlag().userData(),
    DR::f32(&D::camera_fov, 45, 0).shownIn(block::Camera, "fov", 4),
    DR::f32(&D::giColorMult, 1, 0),  // 25
    DR::f32(&D::bgColorMult, 1, 0),
    DR::f32(&D::giTextureMult, 1, 0)
        .shownIn(block::Environment, "gi_mult", 8).shownBy(kEnvironmentMultForm + 1),
    DR::f32(&D::bgTextureMult, 1, 0)
        .shownIn(block::Environment, "bg_mult", 4).shownBy(kEnvironmentMultForm + 0),
    DR::f32(&D::filterSize, 1.5, 0).shownIn(block::ImageFilter, "size", 3),
    DR::f32(&D::output_img_pixelAspect, 1, 0).shownIn(block::Output, "img_pixelAspect", 3),  // 30
    DR::f32(&D::output_img_imageAspect, 1.333, 0).shownIn(block::Output, "img_imageAspect", 4),
    DR::f32(&D::renderChannels_zdepth_black, 0, 4).shownIn(block::RenderChannels, "zdepth_black", 2),
    DR::f32(&D::renderChannels_zdepth_white, 1000, 4).shownIn(block::RenderChannels, "zdepth_white", 3),
    DR::b32(&D::renderChannels_zdepth_clamp, 1, 4).shownIn(block::RenderChannels, "zdepth_clamp", 1).asFlag(),
    DR::hook(kChannels, 0)  // 35
        .shownIn(block::RenderChannels, "channel_names", 4)
        .labelled("LFB Channels")
        .shownBy(kChannelListForm),
    path(&D::output_img_file).shownIn(block::Output, "img_file", 5),
    path(&D::output_luimg_file)
        .shownIn(block::Output, "luimg_file", 18).labelled("LuImage Output File", true),
    path(&D::irradianceMap_file).shownIn(block::IrradianceMap, "file", 19),
    path(&D::irradianceMap_auto_save_file).shownIn(block::IrradianceMap, "auto_save_file", 27),
    path(&D::lightCache_file).shownIn(block::LightCache, "file", 13),  // 40
    path(&D::lightCache_auto_save_file).shownIn(block::LightCache, "auto_save_file", 16),
    path(&D::photonMap_file).shownIn(block::PhotonMap, "file", 6),
    path(&D::photonMap_auto_save_file).shownIn(block::PhotonMap, "auto_save_file", 12),
    path(&D::caustics_file).shownIn(block::Caustics, "file", 7),
    path(&D::caustics_auto_save_file).shownIn(block::Caustics, "auto_save_file", 10),  // 45
    DR::color(&D::options_mtl_override_color, Color(0.5f, 0.5f, 0.5f), 1)
        .shownIn(block::Options, "mtl_override_color", 24),
    DR::i32(&D::options_batch_render, 1, 1).shownIn(block::Options, "batch_render", 23),
    DR::b32(&D::colorMapping_gamma_correct_rgb, 0, 7)
        .shownIn(block::ColorMapping, "gamma_correct_rgb", 1).asFlag().userData(),
    DR::b32(&D::colorMapping_gamma_correct_ldr_textures, 0, 7)
        .shownIn(block::ColorMapping, "gamma_correct_ldr_textures", 2).asFlag().userData(),
    DR::b32(&D::output_do_animation, 0, 8)  // 50
        .shownIn(block::Output, "do_animation", 20).asFlag().userData(),
    DR::i32(&D::output_frame_rate, 0, 8).shownIn(block::Output, "frame_rate", 22).userData(),
    DR::f32(&D::output_frames_per_second, 30, 8).shownIn(block::Output, "frames_per_second", 7),
    DR::color(&D::environment_reflect_color, Color(0, 0, 0), 9)
        .shownIn(block::Environment, "reflect_color", 10),
    DR::color(&D::environment_refract_color, Color(0, 0, 0), 9)
        .shownIn(block::Environment, "refract_color", 14),
    DR::f32(&D::reflectColorMult, 1, 9),  // 55
    DR::f32(&D::refractColorMult, 1, 9),
    DR::f32(&D::reflectTextureMult, 1, 9)
        .shownIn(block::Environment, "reflect_mult", 12).shownBy(kEnvironmentMultForm + 2),
    DR::f32(&D::refractTextureMult, 1, 9)
        .shownIn(block::Environment, "refract_mult", 16).shownBy(kEnvironmentMultForm + 3),
    DR::b32(&D::environment_use_reflect, 0, 9).shownIn(block::Environment, "use_reflect", 9).asFlag(),
    DR::b32(&D::environment_use_refract, 0, 9).shownIn(block::Environment, "use_refract", 13).asFlag(),  // 60
    DR::hook(kTexture, 9, &D::reflectTexture).shownIn(block::Environment, "reflect_tex", 11),
    DR::hook(kTexture, 9, &D::refractTexture).shownIn(block::Environment, "refract_tex", 15),
    DR::b32(&D::drOn, 0, 16).shownIn(block::DR, "on", 1).asFlag(),
    DR::keptF32(&D::keptFloat1, 17),
    DR::keptF32(&D::keptFloat2, 17),  // 65
    DR::f32(&D::colorMapping_input_gamma, 2.2, 18).shownIn(block::ColorMapping, "input_gamma", 3).userData(),
    DR::i32(&D::keptInt1, 1, 19),
    DR::b32(&D::drAssetColl, 1, 20).shownIn(block::DR, "asset_coll", 2).asFlag(),
    DR::i32(&D::drMode, 0, 20).shownIn(block::DR, "mode", 3),
    DR::row(FieldRef<D>::path(&D::dr_folder), 0, 20).shownIn(block::DR, "folder", 4),  // 70
    DR::i32(&D::keptInt2, 0, 22),
    DR::b32(&D::specifyFilmWidth, 0, 23)
        .shownIn(block::CameraPhysical, "specify_film_width", 30).asFlag().userData(),
};

bool isKnownVersion(int version) {
    return (version >= 0 && version <= 9) || (version >= 16 && version <= AllOptions::kVersion);
}

// The text of a path as its buffer holds it: up to the first terminator, at
// most kMaxPathLength characters.
std::u16string pathText(const std::u16string& text) {
    std::u16string::size_type end = text.find(u'\0');
    if (end == std::u16string::npos) end = text.size();
    if (end > AllOptions::kMaxPathLength) end = AllOptions::kMaxPathLength;
    return text.substr(0, end);
}

// The channel list: a count and as many channel numbers. Only 100 to 132 are
// taken; version 0 stored "Normals" as 8; from version 21 on the list
// replaces the defaults instead of following them.
bool readChannels(QuickArchive& ar, int version, std::vector<std::int32_t>& channels) {
    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    if (version >= 21) channels.clear();
    std::uint64_t value = 0;
    for (std::uint64_t k = 0; k < count; ++k) {
        ar.readLength(value);
        std::uint64_t channel = value;
        if (version == 0 && channel == 8) channel = 123;
        if (channel >= 100 && channel <= 132) channels.push_back(static_cast<std::int32_t>(channel));
    }
    return true;
}

void writeChannels(QuickArchive& ar, const std::vector<std::int32_t>& channels) {
    ar.writeLength(channels.size());
    for (std::int32_t channel : channels) ar.writeLength(static_cast<std::uint32_t>(channel));
}

bool loadHookRow(QuickArchive& ar, AllOptions& o, const RecordRow<D>& r, int version) {
    switch (r.hook) {
    case kParams: return loadNested(ar, o.params);
    case kFrameData: return loadNested(ar, o.frameData);
    case kStampInfo: return loadNested(ar, o.stampInfo);
    case kCamera: return loadNested(ar, o.physicalCamera);
    case kTexture: return loadOptionalMember(ar, r.field.get<TexturePtr>(o), createTexture);
    case kChannels: return readChannels(ar, version, o.renderChannels);
    case kPath: {
        std::u16string text;
        ar.readWString(text);
        r.field.get<std::u16string>(o) = pathText(text);
        return true;
    }
    }
    return false;
}

bool saveHookRow(QuickArchive& ar, const AllOptions& o, const RecordRow<D>& r) {
    switch (r.hook) {
    case kParams: return o.params.save(ar);
    case kFrameData: return o.frameData.save(ar);
    case kStampInfo: return o.stampInfo.save(ar);
    case kCamera: return o.physicalCamera.save(ar);
    case kTexture:
        return saveOptionalMember(ar, r.field.get<TexturePtr>(o));
    case kChannels: writeChannels(ar, o.renderChannels); return true;
    case kPath: ar.writeWString(pathText(r.field.get<std::u16string>(o))); return true;
    }
    return false;
}

}  // namespace

AllOptions::AllOptions() { reset(); }

RowSpan<RecordRow<AllOptions>> AllOptions::record() { return rowSpan(kDocumentRows); }

bool AllOptions::save(QuickArchive& ar) const {
    ar.writeUInt(versionTag(kVersion) | kTagLowHalf);
    return writeFields(ar, *this, kDocumentRows, kVersion,
                       [&](const RecordRow<D>& r) { return saveHookRow(ar, *this, r); });
}

bool AllOptions::load(QuickArchive& ar) {
    reset();
    std::uint32_t tag = 0;
    ar.readUInt(tag);
    const int version = static_cast<int>(tag >> 16);
    if ((tag & 0xFFFF) != kTagLowHalf || !isKnownVersion(version)) return false;
    return readFields(ar, *this, kDocumentRows, version,
                      [&](const RecordRow<D>& r) { return loadHookRow(ar, *this, r, version); });
}

void AllOptions::reset() {
    params.reset();
    // A document's defaults differ from a bare parameter set in four fields.
    params.imageFilter_on = 1;
    params.imageSampler_type = 2;
    params.options_mtl_limitDepth = 1;
    params.caustics_search_distance = 20;
    frameData.reset();
    stampInfo.reset();
    renderChannels.clear();
    bgTexture.reset();
    giTexture.reset();
    reflectTexture.reset();
    refractTexture.reset();
    resetFields(*this, kDocumentRows);
    physicalCamera.reset();
    renderChannels.push_back(126);
    renderChannels.push_back(125);
    for (const RecordRow<D>& r : kDocumentRows)
        if (r.use == RowUse::Hook && r.hook == kPath) r.field.get<std::u16string>(*this).clear();
}

const char16_t* AllOptions::channelName(std::int32_t channel) {
    static const char16_t* const kNames[] = {
        u"Atmosphere",        u"Diffuse",           u"Reflection",     u"Refraction",
        u"Self-illumination", u"Shadow",            u"Specular",       u"Lighting",
        u"GI",                u"Caustics",          u"Raw GI",         u"Raw Light",
        u"Raw Shadow",        u"Velocity",          u"RenderID",       u"Material ID",
        u"Node ID",           u"ZDepth",            u"Reflection Filter", u"Raw Reflection",
        u"Refraction Filter", u"Raw Refraction",    u"Real Color",     u"Normals",
        u"Background",        u"Alpha",             u"RGB color",      u"Wire Color",
        u"Matte Shadow",      u"Total Light",       u"Raw Total Light", u"Bump Normal",
        u"Sample Rate",       u"SSS2",
    };
    const std::int32_t first = 100;
    const std::int32_t count = static_cast<std::int32_t>(sizeof kNames / sizeof kNames[0]);
    if (channel < first || channel >= first + count) return nullptr;
    return kNames[channel - first];
}

}  // namespace OrvaneLumoCore
