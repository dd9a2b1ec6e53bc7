#pragma once
// Files named by wide paths. On POSIX systems a path is opened through its
// UTF-8 form, on Windows as it is (paths beyond 260 characters included).
// Other processes may have the file open, for reading or writing, at the
// same time.
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <string>

namespace platform {

// The path in the form the system's file calls take.
std::filesystem::path nativePath(const std::u16string& path);

// Streams on a path. Reading opens regular files only (see RegularFile);
// anything else leaves the stream closed.
void openForReading(std::ifstream& file, const std::u16string& path);
void openForWriting(std::ofstream& file, const std::u16string& path);

// Bytes that can be read at any offset.
class ByteSource {
public:
    virtual ~ByteSource() = default;
    // The number of bytes, as known when the source was opened.
    virtual std::uint64_t size() const = 0;
    // Copies up to n bytes from `offset` into `dst` and returns how many were
    // copied: fewer than n only at the end or on a read error.
    virtual std::size_t readAt(std::uint64_t offset, void* dst, std::size_t n) const = 0;
};

// Bytes held in memory by the caller, who keeps them alive.
class MemoryBytes : public ByteSource {
public:
    MemoryBytes(const void* data, std::size_t size)
        : data_(static_cast<const char*>(data)), size_(size) {}
    std::uint64_t size() const override { return size_; }
    std::size_t readAt(std::uint64_t offset, void* dst, std::size_t n) const override;

private:
    const char* data_;
    std::size_t size_;
};

// A regular file opened for reading. A folder, FIFO, device or socket is a
// file that can't be opened, and opening one never blocks: the path is
// opened without waiting for a writer and its kind checked on the handle.
class RegularFile : public ByteSource {
public:
    RegularFile() = default;
    ~RegularFile() override;
    RegularFile(const RegularFile&) = delete;
    RegularFile& operator=(const RegularFile&) = delete;

    bool open(const std::u16string& path);
    bool isOpen() const { return handle_ != kClosed; }
    // Why the last open failed: the path opened but isn't a regular file,
    // or the error number (errno) of the system's error.
    bool notRegular() const { return notRegular_; }
    int error() const { return error_; }

    std::uint64_t size() const override { return size_; }
    std::size_t readAt(std::uint64_t offset, void* dst, std::size_t n) const override;

private:
    // A file descriptor, or a Windows HANDLE; -1 is the closed value of both.
    static constexpr std::intptr_t kClosed = -1;
    void close();
    // The system's part of open(), on a closed file with no error noted.
    bool openNative(const std::u16string& path);

    std::intptr_t handle_ = kClosed;
    std::uint64_t size_ = 0;
    bool notRegular_ = false;
    int error_ = 0;
};

}  // namespace platform
