#include "persistence/OrvOptFile.h"

#include <fstream>
#include <vector>

#include "options/AllOptions.h"
#include "persistence/QuickArchive.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool OrvOptFile::load(AllOptions& options, const std::u16string& path) {
    std::ifstream file;
    platform::openForReading(file, path);
    if (!file.is_open()) return false;
    file.seekg(0, std::ios::end);
    const std::streamoff size = file.tellg();
    file.seekg(0, std::ios::beg);
    if (size < 1) return false;
    std::vector<char> buffer(static_cast<std::size_t>(size));
    file.read(buffer.data(), size);
    if (file.gcount() != size) return false;
    QuickArchive ar(buffer.data(), buffer.size());
    return options.load(ar);
}

bool OrvOptFile::save(AllOptions& options, const std::u16string& path) {
    QuickArchive ar(static_cast<std::size_t>(1));
    if (!options.save(ar)) return false;
    std::ofstream file;
    platform::openForWriting(file, path);
    if (!file.is_open()) return false;
    std::streamoff written = 0;
    for (std::size_t i = 0; i < ar.getBlockCount(); ++i) {
        file.write(ar.getBlock(i)->data(), QuickArchive::kBlockSize);
        written += QuickArchive::kBlockSize;
        if (!file || file.tellp() != written) return false;
    }
    return true;
}

}  // namespace OrvaneLumoCore
