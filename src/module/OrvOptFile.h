#pragma once
// The render options file: the archive bytes of one AllOptions record, with
// no header of its own.
#include <string>

#include "persistence/LoadNote.h"

namespace platform {
class ByteSource;
}

namespace OrvaneLumoCore {

class AllOptions;

class OrvOptFile {
public:
    OrvOptFile() = default;
    virtual ~OrvOptFile() = default;

    // Writes the record in whole blocks of 4096 bytes.
    virtual bool save(AllOptions& options, const std::u16string& path);
    // Reads a file of any size of at least one byte, block by block as the
    // record reaches them.
    virtual bool load(AllOptions& options, const std::u16string& path);
    bool load(AllOptions& options, const platform::ByteSource& bytes);

    // `options` as an "orvopt" document.
    static std::u16string documentXml(AllOptions& options);
    // The file at `path` as an "orvopt" document, or, if it doesn't load,
    // its text; the empty string if it can't be opened.
    std::u16string getXml(std::u16string path);

    // Why the last load failed.
    LoadNote loadNote;
};

}  // namespace OrvaneLumoCore
