// Feeds arbitrary bytes to both file loaders and, when they load, to the
// XML writers. Nothing may crash, hang or exhaust memory.
#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>

#include "materials/MaterialAssets.h"
#include "options/AllOptions.h"
#include "persistence/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "xml/AssetXmlWriter.h"

using namespace OrvaneLumoCore;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes(reinterpret_cast<const char*>(data), size);

    OrvMatFile file;
    std::istringstream in(bytes);
    if (file.load(in)) {
        std::u16string out;
        AssetXmlWriter writer(out);
        for (const MaterialPtr& m : file.materials) writeMaterialAssets(writer, m);
    }

    AllOptions options;
    QuickArchive ar(bytes.data(), bytes.size());
    if (options.load(ar)) {
        std::u16string out;
        AssetXmlWriter writer(out);
        options.writeXml(writer, std::u16string());
    }
    return 0;
}
