// Render options files: one through the library's own save, and one of an
// old record version laid by hand, as an older writer left it.
#include <cstdint>
#include <fstream>
#include <string>
#include <vector>

#include "Samples.h"
#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
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

    // The archive's primitives are the byte forms of the record; the member
    // records of params and frame data are those that their save writes.
    QuickArchive ar(static_cast<std::size_t>(1));
    ar.writeUInt(0x00040001u);
    params.save(ar);
    OrvaneFrameData().save(ar);
    ar.writeUInt(0x00010000u);                      // stamp, version 1
    ar.writeInt(0);
    ar.writeInt(0);
    ar.writeInt(0);
    ar.writeWString(u"Frame %frame | %time");
    const std::uint8_t font[60] = {0};
    ar.putRaw(font, sizeof font);                   // font description without a length
    ar.writeByte(false);                            // no bg texture
    ar.writeByte(false);                            // no gi texture
    ar.writeColor(Color(0.1f, 0.1f, 0.2f));
    ar.writeColor(Color(0.8f, 0.9f, 1.0f));
    for (std::int32_t v : {1, 1, 2, 480, 640})      // use_gi, use_bg, filter kernel (shown
        ar.writeInt(v);                             // as 1), image height and width
    for (std::int32_t v : {0, 0, 1, 0, 0, 1})       // override fov, viewport; aspect locks;
        ar.writeInt(v);                             // raw file; save render
    ar.writeInt(1);                                 // focal distance from camera
    ar.writeInt(0);                                 // progress window
    for (float v : {60.0f, 1.2f, 0.8f, 1.0f, 1.0f}) // fov; gi, bg colour; gi, bg texture
        ar.writeFloat(v);                           // multipliers
    for (float v : {1.5f, 1.0f, 1.3333f, 10.0f, 5000.0f})  // filter size, pixel and image
        ar.writeFloat(v);                                  // aspect, z-depth black, white
    ar.writeInt(1);                                 // z-depth clamp
    for (std::uint32_t v : {2u, 117u, 131u})        // channels behind the defaults
        ar.writeLength(v);
    ar.writeWString(u"C:\\out\\old.png");
    for (int k = 0; k < 9; ++k) ar.writeWString(u"");  // the other nine paths
    ar.writeColor(Color(0.5f, 0.5f, 0.5f));         // override colour
    ar.writeInt(1);                                 // batch render

    std::vector<char> bytes(static_cast<std::size_t>(ar.getWritePosition()));
    ar.getRaw(bytes.data(), bytes.size());
    std::ofstream out(path, std::ios::binary);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    return static_cast<bool>(out);
}

}  // namespace

void addOptionSamples(std::vector<Sample>& list) {
    list.push_back({"render_settings.orvopt", writeRenderSettings});
    list.push_back({"old_settings_v4.luopt", writeVersion4});
}

}  // namespace samples
