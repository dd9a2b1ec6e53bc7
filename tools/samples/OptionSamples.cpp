// Render options files: one through the library's own save, and one of an
// old record version laid by hand, as an older writer left it.
#include <cstdint>
#include <cstring>
#include <fstream>
#include <string>
#include <vector>

#include "Samples.h"
#include "options/AllOptions.h"
#include "persistence/OrvOptFile.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

// A scene's settings: GI with an irradiance map and a light cache, a
// physical camera, a textured GI environment and a few render channels.
bool writeRenderSettings(const std::string& path) {
    AllOptions o;
    o.params.gi_on = 1;
    o.params.gi_secondary_engine = 3;
    o.params.irradianceMap_min_rate = -4;
    o.params.irradianceMap_auto_save = 1;
    o.params.lightCache_subdivs = 1500;
    o.params.options_mtl_maxDepth = 5;
    o.frameData.output_bmp_width = 1280;
    o.frameData.output_bmp_height = 720;
    o.output_img_width = 1280;
    o.output_img_height = 720;
    o.output_img_imageAspect = 1.7778f;
    o.output_img_file = u"C:\\renders\\kitchen & hall.png";
    o.irradianceMap_auto_save_file = u"C:\\renders\\kitchen.vrmap";
    o.filterKernel = 1;
    o.focalDistFromCamera = 0;
    o.environment_use_gi = 1;
    o.giTexture.reset(new AColorTexture(AColor(0.9f, 0.95f, 1.0f, 1.0f)));
    o.giTextureMult = 1.5f;
    o.renderChannels.push_back(101);
    o.renderChannels.push_back(117);
    o.physicalCameraOn = 1;
    o.physicalCamera.f_number = 5.6f;
    o.physicalCamera.focal_length.setValue(35, 0.0);
    o.physicalCamera.focal_length.setValue(50, 2.0);
    o.dr_folder = u"\\\\farm\\assets";
    return OrvOptFile().save(o, utf8ToWide(path));
}

// Little-endian byte laying for the hand-made record.
class Bytes {
public:
    Bytes& u8(std::uint8_t v) { data.push_back(v); return *this; }
    Bytes& u32(std::uint32_t v) {
        for (int k = 0; k < 4; ++k) data.push_back(static_cast<std::uint8_t>(v >> (8 * k)));
        return *this;
    }
    Bytes& i32(std::int32_t v) { return u32(static_cast<std::uint32_t>(v)); }
    Bytes& f32(float v) {
        std::uint32_t bits;
        std::memcpy(&bits, &v, 4);
        return u32(bits);
    }
    Bytes& color(float r, float g, float b) { return f32(r).f32(g).f32(b); }
    Bytes& wstr(const std::string& utf8) {
        u32(static_cast<std::uint32_t>(utf8.size()));
        data.insert(data.end(), utf8.begin(), utf8.end());
        return *this;
    }
    // The record that a member's save writes.
    template <class T>
    Bytes& record(const T& member) {
        QuickArchive ar(static_cast<std::size_t>(1));
        member.save(ar);
        std::vector<std::uint8_t> bytes(static_cast<std::size_t>(ar.getWritePosition()));
        ar.getRaw(bytes.data(), bytes.size());
        data.insert(data.end(), bytes.begin(), bytes.end());
        return *this;
    }
    std::vector<std::uint8_t> data;
};

// An AllOptions record of version 4, as a writer of that time left it: no
// physical camera, no reflect or refract environment, no animation fields.
// Its stamp record is of version 1, and the channel list follows the
// default channels. Fields of version 4, in order: params, frame data, stamp,
// bg and gi textures, bg and gi colours, use_gi, use_bg, filter kernel, image
// height and width, six flags, focal distance from camera (2), progress
// window (3), fov, four multipliers, filter size, pixel and image aspect,
// z-depth black, white and clamp (4), channels, ten paths, override colour
// and batch render (1).
bool writeVersion4(const std::string& path) {
    OrvaneParams params;  // a bare parameter set, as old writers stored it
    params.imageFilter_on = 1;
    params.imageSampler_type = 1;
    params.options_mtl_limitDepth = 1;
    params.caustics_search_distance = 20;
    params.imageSampler_fixed_subdivs = 2;

    Bytes b;
    b.u32(0x00040001u);
    b.record(params).record(OrvaneFrameData());
    b.u32(0x00010000u).i32(0).i32(0).i32(0).wstr("Frame %frame | %time");
    for (int k = 0; k < 60; ++k) b.u8(0);           // font description, version 1: no length
    b.u8(0).u8(0);                                  // no bg, gi textures
    b.color(0.1f, 0.1f, 0.2f).color(0.8f, 0.9f, 1.0f);
    b.i32(1).i32(1);                                // use_gi, use_bg
    b.i32(2);                                       // filter kernel (shown as 1)
    b.i32(480).i32(640);                            // image height, width
    b.i32(0).i32(0).i32(1).i32(0).i32(0).i32(1);    // fov, viewport, aspect locks, raw, save
    b.i32(1);                                       // focal distance from camera
    b.i32(0);                                       // progress window
    b.f32(60);                                      // fov
    b.f32(1.2f).f32(0.8f).f32(1).f32(1);            // gi, bg colour; gi, bg texture multipliers
    b.f32(1.5f).f32(1).f32(1.3333f);                // filter size, pixel and image aspect
    b.f32(10).f32(5000).i32(1);                     // z-depth black, white, clamp
    b.u32(2).u32(117).u32(131);                     // channels behind the defaults
    b.wstr("C:\\out\\old.png");
    for (int k = 0; k < 9; ++k) b.wstr("");         // the other nine paths
    b.color(0.5f, 0.5f, 0.5f).i32(1);               // override colour, batch render

    std::ofstream out(path, std::ios::binary);
    out.write(reinterpret_cast<const char*>(b.data.data()), static_cast<std::streamsize>(b.data.size()));
    return static_cast<bool>(out);
}

}  // namespace

void addOptionSamples(std::vector<Sample>& list) {
    list.push_back({"render_settings.orvopt", writeRenderSettings});
    list.push_back({"old_settings_v4.luopt", writeVersion4});
}

}  // namespace samples
