#include "persistence/OrvOptFile.h"

#include <fstream>

#include "options/AllOptions.h"
#include "persistence/FileBlocks.h"
#include "persistence/QuickArchive.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool OrvOptFile::load(AllOptions& options, const std::u16string& path) {
    platform::RegularFile file;
    return file.open(path) && load(options, file);
}

bool OrvOptFile::load(AllOptions& options, const platform::ByteSource& bytes) {
    if (bytes.size() < 1) return false;
    // The whole file is the archive; its blocks are read as the record
    // reaches them.
    const RangeBlocks blocks(bytes, 0, bytes.size(), RangeBlocks::blocksFor(bytes.size()));
    QuickArchive ar(blocks);
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
