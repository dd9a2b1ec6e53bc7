// Files of the right extension that don't load as binary files: the module
// hands them back as their text.
#include <cstdint>
#include <fstream>
#include <string>

#include "Samples.h"

namespace samples {
namespace {

bool writeBytes(const std::string& path, const std::string& bytes) {
    std::ofstream f(path, std::ios::binary | std::ios::trunc);
    f.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    return static_cast<bool>(f);
}

void putU32(std::string& s, std::uint32_t v) {
    for (int i = 0; i < 4; ++i) s.push_back(static_cast<char>(v >> (8 * i)));
}

bool textExport(const std::string& path) {
    return writeBytes(path, "<note>This library was exported as text.</note>\n");
}

// Windows-1252 text (the "\xE9" is not valid UTF-8).
bool ansiNotes(const std::string& path) {
    return writeBytes(path, "Render settings: caf\xE9 preset (Windows-1252 text)\n");
}

// A version 3 library whose one material has a type tag no class has: the
// load fails, and the text of the file ends at its first zero byte.
bool unknownType(const std::string& path) {
    std::string s;
    putU32(s, 0x30000);
    putU32(s, 1);
    putU32(s, 1);   // one block
    putU32(s, 15);  // material type tag without a class
    s.append(4092, '\0');
    return writeBytes(path, s);
}

}  // namespace

void addTextRoadSamples(std::vector<Sample>& list) {
    list.push_back({"text_export.orvmat", &textExport});
    list.push_back({"notes.luopt", &ansiNotes});
    list.push_back({"unknown_type.orvmat", &unknownType});
}

}  // namespace samples
