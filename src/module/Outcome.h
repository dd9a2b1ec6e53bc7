#pragma once
// A conversion that says how it went: the text the module returns for a file,
// whether that text is a document, and, for the text road, why the file did
// not load.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "persistence/LoadNote.h"
#include "xml/XmlOptions.h"

namespace OrvaneLumoCore {

enum class FileKind { Materials, Options };

// The conversion that the path's extension picks, as the module's extension
// test decides it; false for any other extension.
bool kindOfPath(const std::u16string& path, FileKind& kind);

enum class FileStatus {
    Document,    // loaded and written as XML
    Text,        // did not load; the text is the file's text
    Unreadable,  // not a regular file, or it can't be opened
};

// "document", "text" or "unreadable": the status as the command's report
// and the Python module's outcome name it.
const char* statusWord(FileStatus status);

struct ConversionOutcome {
    FileStatus status = FileStatus::Unreadable;
    std::u16string text;        // what the module returns for the path
    std::size_t items = 0;      // materials, or settings blocks, of a document
    std::uint64_t fileSize = 0;
    LoadNote note;              // why a file took the text road or is unreadable
    // The file paths of a document that ConversionOptions::pathRules
    // rewrote: each stored text once with the text written in its place, in
    // the order of the document. Empty for the text road.
    std::vector<RemappedPath> remapped;
};

// Where the document sun starts for a conversion: put back to its start state
// (as for the first file of a fresh process), or as the conversions before
// left it (a version 3 sky record replaces it in place).
enum class SunStart { Fresh, Carried };

// Converts the file at `path`. With SunStart::Fresh (as the command converts
// every file) the result doesn't depend on what was converted before. The
// text is byte for byte what OrvMatFile::getXml or OrvOptFile::getXml returns
// from the same sun; a path that isn't a regular file gives the empty text
// and is never read. Running out of memory (std::bad_alloc, or a container
// asked to grow past its limit) is not thrown: the outcome is Unreadable, the
// empty text and a note of rule OutOfMemory.
ConversionOutcome convertFile(const std::u16string& path, FileKind kind,
                              SunStart sun = SunStart::Fresh);

// What a conversion may do besides the module's text: the XmlOptions
// (wellFormed, pathRules) change only the text of a document; the text road
// stays the file's text.
struct ConversionOptions : XmlOptions {
    SunStart sun = SunStart::Fresh;
};

// The same with options; convertFile(path, kind, sun) is this with the
// default XmlOptions.
ConversionOutcome convertFile(const std::u16string& path, FileKind kind,
                              const ConversionOptions& options);

// One line on an outcome: "document, 3 materials, 12300 bytes" or
// "text: <why>" or "unreadable: <why>".
std::string explainOutcome(const ConversionOutcome& outcome, FileKind kind);

}  // namespace OrvaneLumoCore
