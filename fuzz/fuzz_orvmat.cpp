// Material library bytes to document: the container and every material
// record, then the document the module returns, or the text it falls back
// to. Nothing may crash, hang, leak or exhaust memory.
#include <cstddef>
#include <cstdint>

#include "module/OrvMatFile.h"
#include "persistence/QuickArchive.h"

using namespace OrvaneLumoCore;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    OrvMatFile file;
    if (file.load(data, size)) {
        file.documentXml();
    } else {
        utf8ToWide(reinterpret_cast<const char*>(data), size);
    }
    return 0;
}
