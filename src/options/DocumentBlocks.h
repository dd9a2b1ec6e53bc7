#pragma once
// The settings blocks of the options document, each an Asset of its own. The
// record tables of the document and of the groups it holds name, on each row
// that a block shows, the block, the parameter and its place there.
namespace OrvaneLumoCore {
namespace block {

// In the order in which the document writes them, from 1.
enum DocumentBlock : int {
    ImageSampler = 1,
    ImageFilter,
    Camera,
    CameraDof,
    MotionBlur,
    GI,
    IrradianceMap,
    PhotonMap,
    LightCache,
    Caustics,
    Raycaster,
    RegionsGenerator,
    DMCGI,
    DMCSampler,
    ColorMapping,
    RenderChannels,
    Options,
    DefaultDisplacement,
    Environment,
    Output,
    CameraPhysical,
    DR,
    kCount = DR  // the last block, and so the number of blocks
};

// The Asset's name of a block.
inline const char16_t* nameOf(int block) {
    static const char16_t* const kNames[] = {
        u"SettingsImageSampler",
        u"SettingsImageFilter",
        u"SettingsCamera",
        u"SettingsCameraDof",
        u"SettingsMotionBlur",
        u"SettingsGI",
        u"SettingsIrradianceMap",
        u"SettingsPhotonMap",
        u"SettingsLightCache",
        u"SettingsCaustics",
        u"SettingsRaycaster",
        u"SettingsRegionsGenerator",
        u"SettingsDMCGI",
        u"SettingsDMCSampler",
        u"SettingsColorMapping",
        u"SettingsRenderChannels",
        u"SettingsOptions",
        u"SettingsDefaultDisplacement",
        u"SettingsEnvironment",
        u"SettingsOutput",
        u"CameraPhysical",
        u"SettingsDR",
    };
    static_assert(sizeof kNames / sizeof kNames[0] == kCount, "a name for every block");
    return kNames[block - 1];
}

}  // namespace block

// Parameters of the document in a form of their own (the rows' `shownBy`).
enum DocumentForm : int {
    kFilterTypeForm = 1,   // the filter kernel, with 1 and 2 exchanged
    kInvertedFlagForm,     // a flag shown inverted
    kChannelListForm,      // the render channels as a list of names
    kEnvironmentMultForm,  // + the slot (bg, gi, reflect, refract): the texture's multiplier or the colour's
};

}  // namespace OrvaneLumoCore
