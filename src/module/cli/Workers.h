#pragma once
// What the ways of running worker processes share (Jobs.cpp): the messages
// between a worker and the parent, the part files, the jobs run here. A
// system's own way is in WorkersPosix.cpp (fork) or WorkersWindows.cpp (the
// program started again).
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "module/cli/Jobs.h"

namespace orvxml {

// Values in host order and texts with their 32-bit length in front.
class Packer {
public:
    template <class T>
    void put(const T& v) {
        bytes.append(reinterpret_cast<const char*>(&v), sizeof v);
    }
    void putText(const std::string& s) {
        put(static_cast<std::uint32_t>(s.size()));
        bytes.append(s);
    }
    std::string bytes;
};

class Unpacker {
public:
    Unpacker(const char* p, std::size_t n) : p_(p), end_(p + n) {}
    template <class T>
    bool get(T& v) {
        if (static_cast<std::size_t>(end_ - p_) < sizeof v) return false;
        std::memcpy(&v, p_, sizeof v);
        p_ += sizeof v;
        return true;
    }
    bool getText(std::string& s) {
        std::uint32_t n = 0;
        if (!get(n) || static_cast<std::size_t>(end_ - p_) < n) return false;
        s.assign(p_, n);
        p_ += n;
        return true;
    }

private:
    const char* p_;
    const char* end_;
};

// A worker's news: it started a job, or finished one with this result.
enum class MessageType : std::uint8_t { Started, Finished };

struct Message {
    MessageType type = MessageType::Started;
    std::uint32_t worker = 0;
    std::uint64_t index = 0;
    FileResult result;
};

// The message with its length in front, as one piece to write.
std::string packMessage(const Message& m);
bool parseMessage(const char* p, std::size_t n, Message& m);

// Bytes with a 32-bit length in front, as one piece to write.
std::string frame(const std::string& body);

// Collects the bytes of a stream of frames as they come and hands out the
// whole ones.
class FrameReader {
public:
    void append(const char* data, std::size_t n);
    // The next whole frame's body, or false until more bytes come.
    bool next(std::string& body);

private:
    std::string buffer_;
    std::size_t at_ = 0;
};

// The temporary file beside `path` that process `pid` writes first.
std::string partPath(const std::string& path, unsigned long pid);

// The result of a job whose worker ended without finishing it.
FileResult stopped(const std::string& reason);

// Runs the jobs that `done` doesn't mark in this process, in order, until
// the process is interrupted or the sink stops the run.
void runHere(const std::vector<Job>& jobs, const std::vector<bool>& done, const ResultSink& sink);

}  // namespace orvxml
