#include "module/cli/Jobs.h"

#include <cerrno>
#include <chrono>
#include <cstring>
#include <new>
#include <stdexcept>
#include <set>

#include "module/cli/Workers.h"
#include "platform/Interrupt.h"
#include "platform/Path.h"
#include "platform/System.h"
#include "platform/Text.h"

namespace orvxml {

using OrvaneLumoCore::FileStatus;

std::string toUtf8(const std::u16string& text) { return platform::encodeUtf8(text.data(), text.size()); }

std::u16string toWide(const std::string& bytes) {
    std::u16string wide;
    if (!platform::decodeUtf8Strict(bytes.data(), bytes.size(), wide))
        wide = platform::decodeAnsi(bytes.data(), bytes.size());
    return wide;
}

std::string partPath(const std::string& path, unsigned long pid) { return path + ".part" + std::to_string(pid); }

int makeFolders(const std::string& dir) {
    int error = 0;
    if (platform::pathKind(dir, error) == platform::PathKind::Folder) return 0;
    error = platform::makeFolder(dir);
    if (error == ENOENT) {
        const std::size_t end = dir.find_last_not_of(platform::kPathSeparators);
        const std::size_t at = end == std::string::npos ? end : dir.find_last_of(platform::kPathSeparators, end);
        if (at != std::string::npos && at > 0 && makeFolders(dir.substr(0, at)) == 0)
            error = platform::makeFolder(dir);
    }
    // Another worker made it first, something else has that name, or a
    // link leads nowhere.
    if (error == EEXIST) {
        int why = 0;
        const platform::PathKind kind = platform::pathKind(dir, why);
        if (kind == platform::PathKind::Folder) return 0;
        if (kind == platform::PathKind::Missing) return why;
    }
    return error;
}

bool isPartName(const std::string& name) {
    static const std::string kPart = ".xml.part";
    const std::size_t digits = name.find_last_not_of("0123456789") + 1;
    return digits < name.size() && digits > kPart.size() &&
           name.compare(digits - kPart.size(), kPart.size(), kPart) == 0;
}

void removeLeftParts(const std::vector<Job>& jobs) {
    std::set<std::string> folders;
    for (const Job& job : jobs) {
        // The output's folder with its separator: the part files' names go behind it.
        const std::string folder = job.output.substr(0, job.output.find_last_of(platform::kPathSeparators) + 1);
        if (job.output.empty() || !folders.insert(folder).second) continue;
        std::vector<platform::FolderEntry> entries;
        if (platform::listFolder(folder.empty() ? std::string(".") : folder, entries) != 0) continue;
        for (const platform::FolderEntry& entry : entries)
            if (entry.kind == platform::FolderEntry::Other && isPartName(entry.name))
                platform::removeFile(folder + entry.name);
    }
}

namespace {

std::uint64_t codePoints(const std::u16string& text) {
    std::uint64_t n = text.size();
    for (std::size_t i = 0; i + 1 < text.size(); ++i) {
        const bool high = text[i] >= 0xD800 && text[i] <= 0xDBFF;
        const bool low = text[i + 1] >= 0xDC00 && text[i + 1] <= 0xDFFF;
        if (high && low) {
            --n;
            ++i;
        }
    }
    return n;
}

// Writes `bytes` to `path` through a temporary file beside it, so that a
// reader never sees half a file. Returns 0 or the errno of the failure.
int writeFile(const std::string& path, const std::string& bytes) {
    const std::string part = partPath(path, platform::processId());
    int error = platform::writeNewFile(part, bytes);
    // Folders are made as their first output is written, so that files
    // that give none leave no empty folder behind.
    if (error == ENOENT && makeFolders(platform::folderOf(path, platform::kPathSeparators)) == 0) error = platform::writeNewFile(part, bytes);
    if (error == 0 && (error = platform::replaceFile(part, path)) != 0) platform::removeFile(part);
    return error;
}

// Writes the whole text to a stream and flushes it. Returns 0 or the errno.
int writeStream(std::FILE* out, const std::string& bytes) {
    errno = 0;
    if (std::fwrite(bytes.data(), 1, bytes.size(), out) != bytes.size() || std::fflush(out) != 0)
        return errno ? errno : EIO;
    return 0;
}

}  // namespace

FileResult upToDate() {
    FileResult r;
    r.upToDate = true;
    r.line = "up to date";
    return r;
}

bool stopsTheRun(const FileResult& result) { return platform::isNoSpace(result.writeErrno); }

namespace {

// Converts the job and writes its text: to its output file, or if it has
// none and `textOut` is given, there.
void convertJob(const Job& job, std::FILE* textOut, FileResult& r) {
    OrvaneLumoCore::ConversionOptions options;
    if (job.xml) static_cast<OrvaneLumoCore::XmlOptions&>(options) = *job.xml;
    const OrvaneLumoCore::ConversionOutcome o = OrvaneLumoCore::convertFile(job.widePath, job.kind, options);
    for (const OrvaneLumoCore::RemappedPath& path : o.remapped)
        r.remapped.emplace_back(toUtf8(path.from), toUtf8(path.to));
    r.status = o.status;
    r.characters = codePoints(o.text);
    r.line = OrvaneLumoCore::explainOutcome(o, job.kind);
    if (o.status != FileStatus::Document) r.reason = OrvaneLumoCore::describe(o.note);
    // A file that can't be read has no text of its own: it gets no output
    // file, and a text gets one unless the run skips them.
    const bool written = o.status == FileStatus::Document || (o.status == FileStatus::Text && job.writeText);
    if (!job.output.empty() && written) {
        if ((r.writeErrno = writeFile(job.output, toUtf8(o.text))) != 0)
            r.writeError = job.output + ": " + std::strerror(r.writeErrno);
    } else if (textOut) {
        if ((r.writeErrno = writeStream(textOut, toUtf8(o.text))) != 0)
            r.writeError = std::string("standard output: ") + std::strerror(r.writeErrno);
    }
}

}  // namespace

FileResult runJob(const Job& job, std::FILE* textOut) {
    const auto start = std::chrono::steady_clock::now();
    FileResult r;
    if (!job.refusal.empty()) {
        r = stopped(job.refusal);
    } else {
        // The conversion itself reports running out of memory; what is left
        // (the UTF-8 copy of a text that only just fit) ends this file, not
        // the run, here as in a worker.
        try {
            convertJob(job, textOut, r);
        } catch (const std::bad_alloc&) {
            r = stopped("out of memory");
        } catch (const std::length_error&) {
            r = stopped("out of memory");
        } catch (const std::exception& e) {
            r = stopped(std::string("the conversion failed: ") + e.what());
        }
    }
    r.milliseconds =
        std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count();
    return r;
}

void runHere(const std::vector<Job>& jobs, const std::vector<bool>& done, const ResultSink& sink) {
    for (std::size_t i = 0; i < jobs.size() && !platform::interruption(); ++i)
        if (!done[i] && !sink(i, runJob(jobs[i], nullptr))) return;
}

FileResult stopped(const std::string& reason) {
    FileResult r;
    r.reason = reason;
    r.line = "unreadable: " + reason;
    return r;
}

// ---- messages ----------------------------------------------------------------------

std::string frame(const std::string& body) {
    Packer whole;
    whole.put(static_cast<std::uint32_t>(body.size()));
    return whole.bytes + body;
}

void FrameReader::append(const char* data, std::size_t n) {
    buffer_.erase(0, at_);  // what is left is less than one frame
    at_ = 0;
    buffer_.append(data, n);
}

bool FrameReader::next(std::string& body) {
    std::uint32_t size = 0;
    if (buffer_.size() - at_ < sizeof size) return false;
    std::memcpy(&size, buffer_.data() + at_, sizeof size);
    if (buffer_.size() - at_ - sizeof size < size) return false;
    body.assign(buffer_, at_ + sizeof size, size);
    at_ += sizeof size + size;
    return true;
}

std::string packMessage(const Message& m) {
    Packer body;
    body.put(m.type);
    body.put(m.worker);
    body.put(m.index);
    if (m.type == MessageType::Finished) {
        body.put(static_cast<std::uint8_t>(m.result.status));
        body.put(m.result.characters);
        body.put(m.result.milliseconds);
        body.putText(m.result.line);
        body.putText(m.result.reason);
        body.putText(m.result.writeError);
        body.put(static_cast<std::int32_t>(m.result.writeErrno));
        body.put(static_cast<std::uint32_t>(m.result.remapped.size()));
        for (const auto& path : m.result.remapped) {
            body.putText(path.first);
            body.putText(path.second);
        }
    }
    return frame(body.bytes);
}

bool parseMessage(const char* p, std::size_t n, Message& m) {
    Unpacker in(p, n);
    if (!in.get(m.type) || !in.get(m.worker) || !in.get(m.index)) return false;
    if (m.type != MessageType::Finished) return m.type == MessageType::Started;
    std::uint8_t status = 0;
    std::int32_t writeErrno = 0;
    std::uint32_t remapped = 0;
    if (!(in.get(status) && in.get(m.result.characters) && in.get(m.result.milliseconds) &&
          in.getText(m.result.line) && in.getText(m.result.reason) && in.getText(m.result.writeError) &&
          in.get(writeErrno) && in.get(remapped)))
        return false;
    m.result.status = static_cast<FileStatus>(status);
    m.result.writeErrno = writeErrno;
    for (std::uint32_t i = 0; i < remapped; ++i) {
        std::pair<std::string, std::string> path;
        if (!in.getText(path.first) || !in.getText(path.second)) return false;
        m.result.remapped.push_back(path);
    }
    return true;
}

}  // namespace orvxml
