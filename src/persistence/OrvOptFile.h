#pragma once
// The render options file: the archive bytes of one AllOptions record, with
// no header of its own.
#include <string>

#include "persistence/LoadNote.h"

namespace OrvaneLumoCore {

class AllOptions;

class OrvOptFile {
public:
    OrvOptFile() = default;
    virtual ~OrvOptFile() = default;

    // Writes the record in whole blocks of 4096 bytes.
    virtual bool save(AllOptions& options, const std::u16string& path);
    // Reads a file of any size of at least one byte.
    virtual bool load(AllOptions& options, const std::u16string& path);

    // The file at `path` as an "orvopt" document, or, if it doesn't load,
    // its text; the empty string if it can't be opened.
    std::u16string getXml(std::u16string path);

    // Why the last load failed.
    LoadNote loadNote;
};

}  // namespace OrvaneLumoCore
