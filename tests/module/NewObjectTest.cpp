// A new object of every class that the factories make, and of the option records: its defaults are whole (the same
// object whatever the memory it was built in held before) and save as the golden list holds them.
#include <gtest/gtest.h>

#include <cxxabi.h>

#include <cstddef>
#include <cstdlib>
#include <new>
#include <string>
#include <type_traits>
#include <typeinfo>
#include <utility>

#include "animation/Camera.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"
#include "materials/Brdf.h"
#include "options/AllOptions.h"
#include "options/OptionRecords.h"
#include "support/Golden.h"
#include "support/RecordBytes.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/SkyTexture.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

typedef std::vector<std::uint8_t> Bytes;

// The class's name without its namespace.
std::string nameOf(const std::type_info& type) {
    int status = 0;
    char* full = abi::__cxa_demangle(type.name(), nullptr, nullptr, &status);
    std::string name = status == 0 ? full : type.name();
    std::free(full);
    return name.substr(name.rfind(':') == std::string::npos ? 0 : name.rfind(':') + 1);
}

// Whether T holds a UVW generator `uvw`.
template <class T, class = void>
struct HasGenerator : std::false_type {};
template <class T>
struct HasGenerator<T, decltype(void(std::declval<T&>().uvw = UVWPtr()))> : std::true_type {};

// What a new object leaves to chance (a fresh id) set to fixed values, and the children that a save requires given,
// so that every class saves.
template <class T>
void settle(T& o) {
    if constexpr (HasGenerator<T>::value) {
        if (!o.uvw) o.uvw = defaultPlanarUVW();
    }
    if constexpr (std::is_same<T, SunLight>::value) o.id = u"sun-id";
    if constexpr (std::is_same<T, SkyTexture>::value) o.skyId = u"sky-id";
    if constexpr (std::is_same<T, InvertTexture>::value) o.texture = boost::make_shared<AColorTexture>();
    if constexpr (std::is_same<T, RampTexture>::value) o.colors = boost::make_shared<AColorTexture>();
    if constexpr (std::is_same<T, GridTexture>::value) {
        o.line_color = boost::make_shared<AColorTexture>();
        o.fill_color = boost::make_shared<AColorTexture>();
    }
    if constexpr (std::is_same<T, BitmapTexture>::value) o.bitmap = boost::make_shared<BitmapBuffer>();
}

// What a T saves when it is built (default-initialised, as `new T` does: a class without a constructor of its own
// keeps whatever its fields without initialisers find) in memory that holds `fill` in every byte.
template <class T>
Bytes savedWhenBuiltOn(unsigned char fill) {
    alignas(T) unsigned char memory[sizeof(T)];
    // Volatile stores: the compiler may drop plain ones, since the object that the constructor begins holds nothing
    // yet.
    volatile unsigned char* bytes = memory;
    for (std::size_t i = 0; i < sizeof memory; ++i) bytes[i] = fill;
    T* o = new (memory) T;
    settle(*o);
    bool ok = false;
    const Bytes saved = savedBytes(*o, &ok);
    EXPECT_TRUE(ok) << nameOf(typeid(T)) << ": a new object saves";
    o->~T();
    return saved;
}

template <class... T>
struct Classes {};

template <class... T>
std::string newObjects(const char* family, Classes<T...>) {
    std::string out;
    auto one = [&](const std::string& name, const Bytes& zeros, const Bytes& ones) {
        EXPECT_EQ(zeros, ones) << family << " " << name << ": a field that the constructor leaves as it finds it";
        out += std::string(family) + " " + name + "\n" + hexLines(zeros);
    };
    (one(nameOf(typeid(T)), savedWhenBuiltOn<T>(0x00), savedWhenBuiltOn<T>(0xA5)), ...);
    return out;
}

TEST(NewObject, EveryClassStartsFromItsDefaultsWhereverItIsBuilt) {
    std::string out;
    out += newObjects("texture",
                      Classes<BitmapTexture, FresnelTexture, UVWTexture, NoiseTexture, CheckerTexture, AColorTexture,
                              GridTexture, ClothTexture, BulgeTexture, InvertTexture, BlendTexture, RampTexture,
                              SkyTexture>());
    out += newObjects("generator", Classes<GenPlanarWorldUVW, GenObjectUVW, GenEnvironmentUVW, GenChannelUVW>());
    out += newObjects("bitmap", Classes<BitmapBuffer>());
    out += newObjects("light", Classes<MayaDirectLight, OmniLight, RectangleLight, SpotLight, SunLight, IESLight,
                                       SphereLight, DomeLight>());
    out += newObjects("layer", Classes<Glass_BRDF, Diffuse_BRDF, Blinn_BRDF, Phong_BRDF, Mirror_BRDF, Light_BRDF>());
    out += newObjects("camera", Classes<PhysicalCamera>());
    out += newObjects("options", Classes<OrvaneParams, OrvaneFrameData, OrvaneLFBStampInfo, AllOptions>());
    expectGolden("module/golden/new_objects.txt", out);
}

}  // namespace
