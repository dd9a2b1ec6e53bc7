#pragma once
// The progress line that orvxml keeps on standard error while that is a
// terminal: a count of the files found while the folders are walked, then
// the files done of those found, the rate and the time left. It is fitted to
// the terminal's width as it is at each redraw, so that it never wraps.
#include <chrono>
#include <cstddef>
#include <string>
#include <vector>

#include "platform/System.h"

namespace orvxml {

// The first of `forms` (longest first) that fits in `columns` less one (a
// line that fills the last column makes some terminals wrap), or else the
// last one cut to fit.
std::string fitLine(const std::vector<std::string>& forms, int columns);

// "0:07" or "1:02:03", rounded up to a whole second.
std::string clockTime(double seconds);

class Progress {
public:
    // No terminal: the line is never shown.
    explicit Progress(platform::Terminal terminal);

    // While the folders are walked: how many files were found so far.
    void walking(std::size_t found);
    // `done` of `total` files have their result; `converted` of those were
    // converted (not up to date) in `seconds`, which gives the rate. The
    // first result replaces the walk's count at once.
    void converting(std::size_t done, std::size_t total, std::size_t converted, double seconds);
    // Erases the line, so that what comes next starts on a clean line.
    void clear();

private:
    // The line changes at most ten times a second; the first time, and
    // when `force` is set, at once.
    bool due(bool force);
    void show(const std::string& line);

    const platform::Terminal terminal_;
    std::size_t shown_ = 0;  // the length of the line on the terminal
    bool drawn_ = false;
    std::chrono::steady_clock::time_point last_;
};

}  // namespace orvxml
