#include "module/cli/Listing.h"

#include <string>

#include "module/Inventory.h"
#include "module/cli/Report.h"
#include "platform/Interrupt.h"
#include "platform/Path.h"
#include "platform/System.h"

namespace orvxml {

using OrvaneLumoCore::FileKind;
using OrvaneLumoCore::FileStatus;

namespace {

class Listing {
public:
    Listing(const Settings& settings, const OrvaneLumoCore::PathRules& rules, std::FILE* report)
        : settings_(settings), rules_(rules), report_(report) {}

    void run(const Job& job);
    int finish(std::size_t files);

private:
    // The start of every JSON object of a file: its path and kind.
    std::string jsonHead(const Job& job) const {
        return "{\"path\": " + jsonString(job.source) + ", \"kind\": \"" +
               (job.kind == FileKind::Materials ? "materials" : "options") + "\", ";
    }
    void say(const Job& job, const std::string& line) { tally_.say(job.source, line); }
    void record(const std::string& json);
    // A file that isn't listed: why, on every channel.
    void failed(const Job& job, FileStatus status, const std::string& reason);
    void list(const Job& job);
    void references(const Job& job);

    const Settings& settings_;
    const OrvaneLumoCore::PathRules& rules_;
    std::FILE* report_;
    // The files listed count as documents.
    Tally tally_;
    std::size_t done_ = 0, items_ = 0, missing_ = 0;
};

void Listing::record(const std::string& json) {
    if (report_) std::fprintf(report_, "%s\n", json.c_str());
}

void Listing::failed(const Job& job, FileStatus status, const std::string& reason) {
    const bool text = status == FileStatus::Text;
    tally_.count(status);
    say(job, OrvaneLumoCore::statusWord(status) + (": " + reason));
    if (!text) Tally::unreadableFile(job.source, reason);
    record((job.hasKind ? jsonHead(job) : "{\"path\": " + jsonString(job.source) + ", \"kind\": null, ") +
           "\"status\": \"" + OrvaneLumoCore::statusWord(status) + "\", \"reason\": " + jsonString(reason) + "}");
}

void Listing::list(const Job& job) {
    const OrvaneLumoCore::FileListing listing = OrvaneLumoCore::listFile(job.widePath, job.kind);
    if (listing.status != FileStatus::Document) return failed(job, listing.status, listing.reason);
    tally_.count(FileStatus::Document);
    const std::string head = jsonHead(job) + "\"status\": \"document\", ";
    if (job.kind == FileKind::Options) {
        say(job, OrvaneLumoCore::listingLine(listing.options));
        record(head + OrvaneLumoCore::listingJson(listing.options).substr(1));
        return;
    }
    for (const OrvaneLumoCore::MaterialSummary& material : listing.materials) {
        ++items_;
        say(job, OrvaneLumoCore::listingLine(material));
        record(head + OrvaneLumoCore::listingJson(material).substr(1));
    }
}

void Listing::references(const Job& job) {
    OrvaneLumoCore::FileReferences found = OrvaneLumoCore::listFileReferences(job.widePath, job.kind);
    if (found.status != FileStatus::Document) return failed(job, found.status, found.reason);
    tally_.count(FileStatus::Document);
    // The rules apply before the files are looked for: a reference is found
    // where its rewritten path leads.
    std::vector<std::u16string> stored(found.references.size());
    for (std::size_t i = 0; i < found.references.size(); ++i) {
        std::u16string rewritten;
        if (OrvaneLumoCore::remapPath(rules_, found.references[i].path, rewritten)) {
            stored[i] = found.references[i].path;
            found.references[i].path = rewritten;
        }
    }
    missing_ += OrvaneLumoCore::checkReferences(found.references, platform::folderOf(job.source, platform::kPathSeparators),
                                                settings_.searchFolders);
    for (std::size_t i = 0; i < found.references.size(); ++i) {
        const OrvaneLumoCore::FileReference& reference = found.references[i];
        ++items_;
        const std::string json = OrvaneLumoCore::referenceJson(reference);
        if (stored[i].empty()) {
            say(job, OrvaneLumoCore::referenceLine(reference, job.kind));
            record(jsonHead(job) + json.substr(1));
        } else {
            say(job, OrvaneLumoCore::referenceLine(reference, job.kind) + "\tremapped from " +
                         toUtf8(stored[i]));
            record(jsonHead(job) + json.substr(1, json.size() - 2) +
                   ", \"stored\": " + OrvaneLumoCore::jsonText(stored[i]) + "}");
        }
    }
}

void Listing::run(const Job& job) {
    ++done_;
    if (!job.refusal.empty()) return failed(job, FileStatus::Unreadable, job.refusal);
    if (settings_.mode == Mode::List)
        list(job);
    else
        references(job);
}

int Listing::finish(std::size_t files) {
    tally_.flushStandardOutput();
    if (!settings_.quiet) {
        if (settings_.mode == Mode::List)
            std::fprintf(stderr, "orvxml: %zu files listed, %zu materials", tally_.documents, items_);
        else
            std::fprintf(stderr, "orvxml: %zu references in %zu files, %zu missing", items_, tally_.documents,
                         missing_);
        tally_.summaryEnd();
        std::fputs("\n", stderr);
    }
    if (const int signal = platform::interruption()) return Tally::interrupted(signal, files - done_, files, "read");
    return tally_.status(false, missing_ != 0);
}

}  // namespace

int runListing(const Settings& settings, const std::vector<Job>& jobs, const OrvaneLumoCore::PathRules& rules,
               std::FILE* report) {
    Listing listing(settings, rules, report);
    for (std::size_t i = 0; i < jobs.size() && !platform::interruption(); ++i) listing.run(jobs[i]);
    return listing.finish(jobs.size());
}

}  // namespace orvxml
