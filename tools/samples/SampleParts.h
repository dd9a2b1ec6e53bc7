#pragma once
// Pieces that several sample files build with: a library saved through the
// library's own container, a constant colour texture, and the hand-laid
// bytes of old records and containers.
#include <cstdint>
#include <initializer_list>
#include <string>
#include <vector>

#include "materials/BaseMaterial.h"
#include "persistence/QuickArchive.h"
#include "textures/BaseTexture.h"

namespace samples {

// Saves `materials` as a library at `path` (UTF-8).
bool saveLibrary(const std::vector<OrvaneLumoCore::MaterialPtr>& materials, const std::string& path);

// An AColorTexture of the colour.
OrvaneLumoCore::TexturePtr constantColor(float r, float g, float b, float a = 1);

// Rows of an old record: each value as an i32, or as an f32.
void writeInts(OrvaneLumoCore::QuickArchive& ar, std::initializer_list<std::int32_t> values);
void writeFloats(OrvaneLumoCore::QuickArchive& ar, std::initializer_list<float> values);

// A container of version 1 or 2 holding `count` materials: the header, then
// the material stream that `ar` holds, directly behind it. Version 1 files
// were written in text mode, which turned each line feed into a carriage
// return and a line feed; the reader undoes that.
bool writeOldContainer(const std::string& path, std::uint32_t version, std::uint32_t count,
                       OrvaneLumoCore::QuickArchive& ar);

}  // namespace samples
