// Render options file bytes to document: the options record read through a
// file's block source, then the document the module returns, or the text it
// falls back to. Nothing may crash, hang, leak or exhaust memory.
#include <cstddef>
#include <cstdint>

#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
#include "persistence/QuickArchive.h"
#include "platform/File.h"

using namespace OrvaneLumoCore;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    AllOptions options;
    if (OrvOptFile().load(options, platform::MemoryBytes(data, size))) {
        OrvOptFile::documentXml(options);
    } else {
        utf8ToWide(reinterpret_cast<const char*>(data), size);
    }
    return 0;
}
