#include "module/Outcome.h"

#include <cstring>

#include "lights/SunIesDome.h"
#include "module/Extension.h"
#include "module/TextFallback.h"
#include "options/AllOptions.h"
#include "persistence/OrvMatFile.h"
#include "persistence/OrvOptFile.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

bool kindOfPath(const std::u16string& path, FileKind& kind) {
    if (hasExtension(path, u"orvmat", u"lumat")) {
        kind = FileKind::Materials;
        return true;
    }
    if (hasExtension(path, u"orvopt", u"luopt")) {
        kind = FileKind::Options;
        return true;
    }
    return false;
}

namespace {

// The settings blocks of an options document: its Assets elements at the
// first level of indentation. The search runs over the bytes of the text with
// memmem, much faster than a search by 16-bit units; a hit must start on a
// unit.
std::size_t countBlocks(const std::u16string& document) {
    static const char16_t kBlockStart[] = u"\n  <Assets>\n";
    const std::size_t patternSize = sizeof kBlockStart - sizeof(char16_t);
    const char* text = reinterpret_cast<const char*>(document.data());
    const std::size_t size = document.size() * sizeof(char16_t);
    std::size_t n = 0;
    for (std::size_t at = 0; at < size;) {
        const void* hit = ::memmem(text + at, size - at, kBlockStart, patternSize);
        if (!hit) break;
        const std::size_t found = static_cast<std::size_t>(static_cast<const char*>(hit) - text);
        if (found % sizeof(char16_t) == 0) ++n;
        at = found + 1;
    }
    return n;
}

}  // namespace

ConversionOutcome convertFile(const std::u16string& path, FileKind kind) {
    ConversionOutcome out;
    resetDocumentSun();
    // The file is opened once, as the containers open it; a path that isn't
    // a regular file is never read.
    platform::RegularFile file;
    if (!file.open(path)) {
        if (file.notRegular())
            out.note.fail(LoadRule::NotRegularFile, 0);
        else
            out.note.fail(LoadRule::CannotOpen, 0, static_cast<std::uint64_t>(file.error()));
        return out;
    }
    out.fileSize = file.size();
    bool loaded = false;
    if (kind == FileKind::Materials) {
        OrvMatFile materials;
        loaded = materials.load(file);
        if (loaded) {
            out.text = materials.documentXml();
            out.items = materials.getMaterialCount();
        } else {
            out.note = materials.loadNote;
        }
    } else {
        OrvOptFile container;
        AllOptions options;
        loaded = container.load(options, file);
        if (loaded) {
            out.text = OrvOptFile::documentXml(options);
            out.items = countBlocks(out.text);
        } else {
            out.note = container.loadNote;
        }
    }
    if (loaded) {
        out.status = FileStatus::Document;
        return out;
    }
    out.status = FileStatus::Text;
    out.text = readFileAsText(path);
    return out;
}

std::string explainOutcome(const ConversionOutcome& outcome, FileKind kind) {
    switch (outcome.status) {
    case FileStatus::Document: {
        const char* what = kind == FileKind::Materials ? (outcome.items == 1 ? " material" : " materials")
                                                       : (outcome.items == 1 ? " block" : " blocks");
        return "document, " + std::to_string(outcome.items) + what + ", " +
               std::to_string(outcome.fileSize) + " bytes";
    }
    case FileStatus::Text: return "text: " + describe(outcome.note);
    case FileStatus::Unreadable: break;
    }
    return "unreadable: " + describe(outcome.note);
}

}  // namespace OrvaneLumoCore
