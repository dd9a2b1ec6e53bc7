#include "persistence/OrvMatFile.h"

#include <cstdint>
#include <fstream>
#include <istream>
#include <ostream>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

namespace {

// Versions 1 and 2: the stream is everything behind the header.
std::string readRest(std::istream& in) {
    const std::streampos start = in.tellg();
    in.seekg(0, std::ios::end);
    const std::streampos end = in.tellg();
    in.seekg(start);
    std::string body;
    if (start < 0 || end <= start) return body;
    body.resize(static_cast<std::size_t>(end - start));
    in.read(&body[0], static_cast<std::streamsize>(body.size()));
    body.resize(static_cast<std::size_t>(in.gcount()));
    return body;
}

// The file offset of byte `at` of the material stream: behind the header,
// and behind the block count in version 3. In version 1 each CR LF pair of
// the body stands for one byte of the stream.
std::uint64_t fileOffset(std::uint64_t at, int version, const std::string& textModeBody) {
    if (version == 3) return 12 + at;
    if (version != 1) return 8 + at;
    const std::uint64_t n = textModeBody.size();
    std::uint64_t raw = 0, seen = 0;
    for (; seen < at && raw < n; ++seen)
        raw += (textModeBody[raw] == '\r' && raw + 1 < n && textModeBody[raw + 1] == '\n') ? 2 : 1;
    return 8 + raw + (at - seen);
}

}  // namespace

// Version 1 files went through a text-mode write: each CR LF pair becomes LF,
// in one pass from left to right (CR CR LF turns into CR LF).
std::string undoTextMode(const std::string& body) {
    std::string out;
    out.reserve(body.size());
    for (std::size_t i = 0; i < body.size(); ++i) {
        if (body[i] == '\r' && i + 1 < body.size() && body[i + 1] == '\n') {
            out.push_back('\n');
            ++i;
        } else {
            out.push_back(body[i]);
        }
    }
    return out;
}

bool OrvMatFile::load(std::istream& in) {
    loadNote = LoadNote();
    std::uint32_t header[2] = {0, 0};
    in.read(reinterpret_cast<char*>(header), 8);
    if (in.gcount() != 8)
        return loadNote.fail(LoadRule::BadHeader, 0, 0, "file shorter than its 8-byte header");
    const std::uint32_t tag = header[0];
    const std::uint32_t count = header[1];
    if (count == 0) return loadNote.fail(LoadRule::BadHeader, 4, 0, "material count is 0");
    if ((tag & 0xFFFF) != 0)
        return loadNote.fail(LoadRule::BadHeader, 0, tag, "version tag with a low half");

    QuickArchive ar(static_cast<std::size_t>(1));
    std::string textModeBody;  // version 1 only
    switch (tag >> 16) {
        case 3:
            if (!ar.loadBlocks(in)) return loadNote.fail(LoadRule::BadHeader, 8, 0, "no blocks");
            break;
        case 2: {
            const std::string body = readRest(in);
            ar = QuickArchive(body.data(), body.size());
            break;
        }
        case 1: {
            textModeBody = readRest(in);
            const std::string body = undoTextMode(textModeBody);
            ar = QuickArchive(body.data(), body.size());
            break;
        }
        default:
            return loadNote.fail(LoadRule::BadHeader, 0, tag, "unknown container version tag");
    }

    // Every material takes at least its four-byte tag: a larger count can't
    // be real.
    if (count > ar.bytesLeft()) return loadNote.fail(LoadRule::CountTooLarge, 4, count);
    std::vector<MaterialPtr> loaded;
    for (std::uint32_t i = 0; i < count; ++i) {
        const std::uint64_t at = ar.getReadPosition();
        std::uint32_t type = 0xFFFFFFFFu;
        ar.readUInt(type);
        MaterialPtr material = createMember(ar, at, type, &createMaterial);
        if (!material || !loadRecord(ar, *material, type)) {
            loadNote = ar.trace.note;
            for (std::uint64_t* offset : {&loadNote.offset, &loadNote.reached, &loadNote.record.start})
                *offset = fileOffset(*offset, tag >> 16, textModeBody);
            return false;
        }
        loaded.push_back(material);
    }
    materials.swap(loaded);
    return true;
}

bool OrvMatFile::save(std::ostream& out) {
    if (materials.empty()) return false;
    QuickArchive ar(static_cast<std::size_t>(1));
    for (const MaterialPtr& material : materials) {
        if (!material) return false;
        ar.writeInt(static_cast<std::int32_t>(material->getType()));
        if (!material->save(ar)) return false;
    }
    const std::uint32_t header[2] = {0x30000u, static_cast<std::uint32_t>(materials.size())};
    out.write(reinterpret_cast<const char*>(header), 8);
    return ar.saveBlocks(out);
}

bool OrvMatFile::load(const std::u16string& path) {
    std::ifstream file;
    platform::openForReading(file, path);
    if (!file.is_open()) {
        loadNote = LoadNote();
        return loadNote.fail(LoadRule::CannotOpen, 0);
    }
    return load(static_cast<std::istream&>(file));
}

bool OrvMatFile::save(const std::u16string& path) {
    std::ofstream file;
    platform::openForWriting(file, path);
    if (!file.is_open()) return false;
    return save(static_cast<std::ostream&>(file));
}

bool OrvMatFile::getMaterial(std::size_t index, MaterialPtr& material) const {
    if (index >= materials.size()) return false;
    material = materials[index];
    return true;
}

}  // namespace OrvaneLumoCore
