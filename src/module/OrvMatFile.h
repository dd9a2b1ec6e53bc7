#pragma once
// The material library file: an 8-byte header (version tag, material count)
// and a material stream of `count` pairs of type tag and record. Three
// generations differ only in how the stream follows the header.
#include <cstddef>
#include <iosfwd>
#include <string>
#include <vector>

#include "materials/BaseMaterial.h"
#include "persistence/LoadNote.h"

namespace platform {
class ByteSource;
}

namespace OrvaneLumoCore {

// The body of a version 1 file with each CR LF pair turned back into LF.
std::string undoTextMode(const std::string& body);

class OrvMatFile {
public:
    OrvMatFile() = default;
    virtual ~OrvMatFile() = default;

    virtual bool save(std::ostream& out);
    // Loads the bytes from the stream's position to its end.
    virtual bool load(std::istream& in);
    // The header is read first; the material stream's blocks are read as the
    // materials reach them.
    bool load(const platform::ByteSource& bytes);
    bool load(const void* data, std::size_t size);

    bool load(const std::u16string& path);
    bool save(const std::u16string& path);

    std::size_t getMaterialCount() const { return materials.size(); }
    bool getMaterial(std::size_t index, MaterialPtr& material) const;

    // The loaded materials as an "orvmat" document.
    std::u16string documentXml() const;
    // The file at `path` as an "orvmat" document, or, if it doesn't load,
    // its text; the empty string if it can't be opened.
    std::u16string getXml(std::u16string path);

    std::vector<MaterialPtr> materials;
    // Why the last load failed, with offsets in the file.
    LoadNote loadNote;
};

}  // namespace OrvaneLumoCore
