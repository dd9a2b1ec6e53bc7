#include "options/AllOptions.h"

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
    kBgTexture,
    kGiTexture,
    kReflectTexture,
    kRefractTexture,
    kChannels,
    kPath,
};

constexpr RecordRow<D> path(std::u16string D::*member) { return DR::hook(kPath, 0, member); }

// The record in file order. The number behind a builder is the first version
// that holds the field; versions 10 to 15 don't exist.
const RecordRow<D> kDocumentRows[] = {
    DR::hook(kParams, 0),                                              // 1
    DR::hook(kFrameData, 0),
    DR::hook(kStampInfo, 0),
    DR::hook(kCamera, 5),
    DR::hook(kBgTexture, 0),                                           // 5
    DR::hook(kGiTexture, 0),
    DR::color(&D::environment_bg_color, Color(0, 0, 0), 0),
    DR::color(&D::environment_gi_color, Color(0.8f, 0.8980392f, 1.0f), 0),
    DR::b32(&D::environment_use_gi, 0, 0),
    DR::b32(&D::environment_use_bg, 0, 0),                                // 10
    DR::i32(&D::filterKernel, 5, 0),
    DR::i32(&D::output_img_height, 600, 0),
    DR::i32(&D::output_img_width, 800, 0),
    DR::b32(&D::camera_override_fov, 0, 0),
    DR::b32(&D::output_override_viewport, 0, 0),                          // 15
    DR::b32(&D::output_img_imageAspectLocked, 0, 0),
    DR::b32(&D::output_img_pixelAspectLocked, 0, 0),
    DR::b32(&D::output_img_rawFile, 0, 0),
    DR::b32(&D::output_save_render, 0, 0),
    DR::b32(&D::focalDistFromCamera, 1, 2),                               // 20
    DR::i32(&D::options_show_progress_window, 1, 3),
    DR::b32(&D::physicalCameraOn, 0, 5),
    DR::b32(&D::overrideFocalLength, 0, 6),
    DR::f32(&D::camera_fov, 45, 0),
    DR::f32(&D::giColorMult, 1, 0),                                       // 25
    DR::f32(&D::bgColorMult, 1, 0),
    DR::f32(&D::giTextureMult, 1, 0),
    DR::f32(&D::bgTextureMult, 1, 0),
    DR::f32(&D::filterSize, 1.5, 0),
    DR::f32(&D::output_img_pixelAspect, 1, 0),                            // 30
    DR::f32(&D::output_img_imageAspect, 1.333, 0),
    DR::f32(&D::renderChannels_zdepth_black, 0, 4),
    DR::f32(&D::renderChannels_zdepth_white, 1000, 4),
    DR::b32(&D::renderChannels_zdepth_clamp, 1, 4),
    DR::hook(kChannels, 0),                                            // 35
    path(&D::output_img_file),
    path(&D::output_luimg_file),
    path(&D::irradianceMap_file),
    path(&D::irradianceMap_auto_save_file),
    path(&D::lightCache_file),                                            // 40
    path(&D::lightCache_auto_save_file),
    path(&D::photonMap_file),
    path(&D::photonMap_auto_save_file),
    path(&D::caustics_file),
    path(&D::caustics_auto_save_file),                                    // 45
    DR::color(&D::options_mtl_override_color, Color(0.5f, 0.5f, 0.5f), 1),
    DR::i32(&D::options_batch_render, 1, 1),
    DR::b32(&D::colorMapping_gamma_correct_rgb, 0, 7),
    DR::b32(&D::colorMapping_gamma_correct_ldr_textures, 0, 7),
    DR::b32(&D::output_do_animation, 0, 8),                               // 50
    DR::i32(&D::output_frame_rate, 0, 8),
    DR::f32(&D::output_frames_per_second, 30, 8),
    DR::color(&D::environment_reflect_color, Color(0, 0, 0), 9),
    DR::color(&D::environment_refract_color, Color(0, 0, 0), 9),
    DR::f32(&D::reflectColorMult, 1, 9),                                  // 55
    DR::f32(&D::refractColorMult, 1, 9),
    DR::f32(&D::reflectTextureMult, 1, 9),
    DR::f32(&D::refractTextureMult, 1, 9),
    DR::b32(&D::environment_use_reflect, 0, 9),
    DR::b32(&D::environment_use_refract, 0, 9),                           // 60
    DR::hook(kReflectTexture, 9),
    DR::hook(kRefractTexture, 9),
    DR::b32(&D::drOn, 0, 16),
    DR::keptF32(&D::keptFloat1, 17),
    DR::keptF32(&D::keptFloat2, 17),                                      // 65
    DR::f32(&D::colorMapping_input_gamma, 2.2, 18),
    DR::i32(&D::keptInt1, 1, 19),
    DR::b32(&D::drAssetColl, 1, 20),
    DR::i32(&D::drMode, 0, 20),
    DR::wideText(&D::dr_folder, 20),                                      // 70
    DR::i32(&D::keptInt2, 0, 22),
    DR::b32(&D::specifyFilmWidth, 0, 23),
};

bool isKnownVersion(int version) {
    return (version >= 0 && version <= 9) || (version >= 16 && version <= AllOptions::kVersion);
}

// The environment texture a row stands for.
template <class O>
auto& textureOf(O& o, int which) {
    switch (which) {
    case kBgTexture: return o.bgTexture;
    case kGiTexture: return o.giTexture;
    case kReflectTexture: return o.reflectTexture;
    default: return o.refractTexture;
    }
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
    case kBgTexture:
    case kGiTexture:
    case kReflectTexture:
    case kRefractTexture: return loadOptionalMember(ar, textureOf(o, r.hook), createTexture);
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
    case kBgTexture:
    case kGiTexture:
    case kReflectTexture:
    case kRefractTexture:
        return saveOptionalMember(ar, textureOf(o, r.hook));
    case kChannels: writeChannels(ar, o.renderChannels); return true;
    case kPath: ar.writeWString(pathText(r.field.get<std::u16string>(o))); return true;
    }
    return false;
}

}  // namespace

AllOptions::AllOptions() { reset(); }

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
