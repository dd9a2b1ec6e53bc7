#include "module/Outcome.h"

#include <new>
#include <stdexcept>

#include "lights/SunIesDome.h"
#include "module/Extension.h"
#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "module/TextFallback.h"
#include "options/AllOptions.h"
#include "platform/File.h"
#include "xml/XmlSink.h"

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

const char* statusWord(FileStatus status) {
    if (status == FileStatus::Document) return "document";
    return status == FileStatus::Text ? "text" : "unreadable";
}

namespace {

// The load and the text of an open file into `out`; may throw std::bad_alloc.
void convertOpenFile(const std::u16string& path, FileKind kind, const XmlOptions& xml,
                     platform::RegularFile& file, ConversionOutcome& out) {
    bool loaded = false;
    StringSink text(out.text);
    if (kind == FileKind::Materials) {
        OrvMatFile materials;
        loaded = materials.load(file);
        if (loaded) {
            out.remapped = writeMaterialsDocument(materials, text, xml);
            out.items = materials.getMaterialCount();
        } else {
            out.note = materials.loadNote;
        }
    } else {
        OrvOptFile container;
        AllOptions options;
        loaded = container.load(options, file);
        if (loaded) {
            out.remapped = writeOptionsDocument(options, text, xml);
            out.items = AllOptions::documentBlockCount();
        } else {
            out.note = container.loadNote;
        }
    }
    if (loaded) {
        out.status = FileStatus::Document;
        return;
    }
    out.status = FileStatus::Text;
    out.text = readFileAsText(path);
}

}  // namespace

ConversionOutcome convertFile(const std::u16string& path, FileKind kind, SunStart sun) {
    ConversionOptions options;
    options.sun = sun;
    return convertFile(path, kind, options);
}

ConversionOutcome convertFile(const std::u16string& path, FileKind kind,
                              const ConversionOptions& options) {
    ConversionOutcome out;
    if (options.sun == SunStart::Fresh) resetDocumentSun();
    // The file is opened once, as the containers open it; a path that isn't
    // a regular file is never read.
    platform::RegularFile file;
    if (!openForLoading(file, path, out.note)) return out;
    out.fileSize = file.size();
    // What the failed conversion had built is freed by the time it is caught,
    // so the outcome itself can still be made.
    bool outOfMemory = false;
    try {
        convertOpenFile(path, kind, options, file, out);
    } catch (const std::bad_alloc&) {
        outOfMemory = true;
    } catch (const std::length_error&) {
        outOfMemory = true;
    }
    if (outOfMemory) {
        out = ConversionOutcome();
        out.fileSize = file.size();
        out.note.fail(LoadRule::OutOfMemory, 0);
    }
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
