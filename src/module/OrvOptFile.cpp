#include "module/OrvOptFile.h"

#include <fstream>

#include "options/AllOptions.h"
#include "persistence/FileBlocks.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool OrvOptFile::load(AllOptions& options, const std::u16string& path) {
    platform::RegularFile file;
    if (!openForLoading(file, path, loadNote)) return false;
    return load(options, file);
}

bool OrvOptFile::load(AllOptions& options, const platform::ByteSource& bytes) {
    loadNote = LoadNote();
    if (bytes.size() < 1) return loadNote.fail(LoadRule::DataEndsEarly, 0);
    // The whole file is the archive; its blocks are read as the record
    // reaches them.
    const RangeBlocks blocks(bytes, 0, bytes.size(), RangeBlocks::blocksFor(bytes.size()));
    QuickArchive ar(blocks);
    // The file is the archive: its offsets are the file's.
    const bool loaded = loadRecord(ar, options);
    if (!loaded) loadNote = ar.trace.note;
    return loaded;
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
