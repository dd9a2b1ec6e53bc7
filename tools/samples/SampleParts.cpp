#include "SampleParts.h"

#include <fstream>

#include "module/OrvMatFile.h"
#include "textures/BasicTextures.h"

using namespace OrvaneLumoCore;

namespace samples {

bool saveLibrary(const std::vector<MaterialPtr>& materials, const std::string& path) {
    OrvMatFile file;
    file.materials = materials;
    return file.save(utf8ToWide(path));
}

TexturePtr constantColor(float r, float g, float b, float a) {
    return TexturePtr(new AColorTexture(AColor(r, g, b, a)));
}

void writeInts(QuickArchive& ar, std::initializer_list<std::int32_t> values) {
    for (const std::int32_t v : values) ar.writeInt(v);
}

void writeFloats(QuickArchive& ar, std::initializer_list<float> values) {
    for (const float v : values) ar.writeFloat(v);
}

bool writeOldContainer(const std::string& path, std::uint32_t version, std::uint32_t count, QuickArchive& ar) {
    std::vector<char> stream(static_cast<std::size_t>(ar.getWritePosition()));
    ar.getRaw(stream.data(), stream.size());
    if (version == 1) {
        std::vector<char> crlf;
        for (char c : stream) {
            if (c == '\n') crlf.push_back('\r');
            crlf.push_back(c);
        }
        stream.swap(crlf);
    }
    std::ofstream out(path.c_str(), std::ios::out | std::ios::binary | std::ios::trunc);
    if (!out) return false;
    const std::uint32_t header[2] = {version << 16, count};
    out.write(reinterpret_cast<const char*>(header), sizeof header);
    out.write(stream.data(), static_cast<std::streamsize>(stream.size()));
    return static_cast<bool>(out);
}

}  // namespace samples
