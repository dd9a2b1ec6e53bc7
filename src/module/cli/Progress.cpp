#include "module/cli/Progress.h"

#include <cmath>
#include <cstdio>

namespace orvxml {

std::string fitLine(const std::vector<std::string>& forms, int columns) {
    const std::size_t room = columns > 1 ? static_cast<std::size_t>(columns - 1) : 0;
    for (const std::string& form : forms)
        if (form.size() <= room) return form;
    return forms.empty() ? std::string() : forms.back().substr(0, room);
}

std::string clockTime(double seconds) {
    const unsigned long long whole = seconds > 0 ? static_cast<unsigned long long>(std::ceil(seconds)) : 0;
    char text[32];
    if (whole < 3600)
        std::snprintf(text, sizeof text, "%llu:%02llu", whole / 60, whole % 60);
    else
        std::snprintf(text, sizeof text, "%llu:%02llu:%02llu", whole / 3600, whole / 60 % 60, whole % 60);
    return text;
}

Progress::Progress(platform::Terminal terminal) : terminal_(terminal) {}

bool Progress::due(bool force) {
    if (terminal_ == platform::Terminal::None) return false;
    const auto now = std::chrono::steady_clock::now();
    if (drawn_ && !force && now - last_ < std::chrono::milliseconds(100)) return false;
    drawn_ = true;
    last_ = now;
    return true;
}

void Progress::walking(std::size_t found) {
    if (!due(false)) return;
    const std::string n = std::to_string(found);
    show(fitLine({"orvxml: finding files, " + n + " found", "finding files, " + n + " found", n + " found"},
                 platform::errorTerminalColumns()));
}

void Progress::converting(std::size_t done, std::size_t total, std::size_t converted, double seconds) {
    if (!due(done <= 1)) return;
    const std::string of = std::to_string(done) + " of " + std::to_string(total) + " files";
    const std::string counts = std::to_string(done) + "/" + std::to_string(total);
    std::string rate, left;
    // A rate and a time left once there is something to go by.
    if (converted > 0 && seconds >= 0.25) {
        const double perSecond = converted / seconds;
        char text[32];
        std::snprintf(text, sizeof text, perSecond < 10 ? "%.1f" : "%.0f", perSecond);
        rate = text;
        left = clockTime((total - done) / perSecond) + " left";
    }
    std::vector<std::string> forms;
    if (rate.empty()) {
        forms = {"orvxml: " + of, of, counts};
    } else {
        forms = {"orvxml: " + of + ", " + rate + " files/s, " + left, of + ", " + rate + " files/s, " + left,
                 counts + ", " + rate + "/s, " + left, counts + ", " + left, counts};
    }
    show(fitLine(forms, platform::errorTerminalColumns()));
}

void Progress::clear() {
    if (shown_) show(std::string());
}

// Replaces the line: erased to its end, or where the terminal can't do that,
// written over with spaces.
void Progress::show(const std::string& line) {
    if (terminal_ == platform::Terminal::Escapes) {
        std::fprintf(stderr, "\r\033[K%s", line.c_str());
    } else {
        const std::size_t pad = shown_ > line.size() ? shown_ - line.size() : 0;
        std::fprintf(stderr, "\r%s%s", line.c_str(), std::string(pad, ' ').c_str());
        if (line.empty()) std::fputc('\r', stderr);
    }
    shown_ = line.size();
    std::fflush(stderr);
}

}  // namespace orvxml
