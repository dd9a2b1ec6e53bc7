#include "persistence/OrvOptFile.h"

#include <fstream>
#include <vector>

#include "options/AllOptions.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool OrvOptFile::load(AllOptions& options, const std::u16string& path) {
    loadNote = LoadNote();
    std::ifstream file;
    platform::openForReading(file, path);
    if (!file.is_open()) return loadNote.fail(LoadRule::CannotOpen, 0);
    file.seekg(0, std::ios::end);
    const std::streamoff size = file.tellg();
    file.seekg(0, std::ios::beg);
    if (size < 1) return loadNote.fail(LoadRule::DataEndsEarly, 0);
    std::vector<char> buffer(static_cast<std::size_t>(size));
    file.read(buffer.data(), size);
    if (file.gcount() != size) return loadNote.fail(LoadRule::DataEndsEarly, file.gcount());
    QuickArchive ar(buffer.data(), buffer.size());
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
