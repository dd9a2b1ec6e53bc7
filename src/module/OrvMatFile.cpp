#include "module/OrvMatFile.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <istream>
#include <iterator>
#include <memory>
#include <ostream>

#include "persistence/FileBlocks.h"
#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/File.h"

namespace OrvaneLumoCore {

namespace {

constexpr std::size_t kBlockSize = QuickArchive::kBlockSize;

// Turns each CR LF pair of raw[0, size) into LF, from left to right, writing
// at most `room` bytes to `out`. With `more`, raw bytes follow `size`, and a
// CR at the end waits for them. Sets `used` to the raw bytes taken; returns
// the bytes written.
std::size_t undoTextModeStep(const char* raw, std::size_t size, bool more, char* out,
                             std::size_t room, std::size_t& used) {
    std::size_t i = 0;
    std::size_t o = 0;
    while (i < size && o < room) {
        if (raw[i] == '\r') {
            if (i + 1 == size && more) break;
            if (i + 1 < size && raw[i + 1] == '\n') {
                out[o++] = '\n';
                i += 2;
                continue;
            }
        }
        out[o++] = raw[i++];
    }
    used = i;
    return o;
}

// The body of a version 1 file, bytes [begin, end) of the file, with the CR
// LF pairs undone, as blocks. One pass over the body finds its length and
// where in the file each block starts; a block is converted again when a
// read reaches it.
class TextModeBlocks : public QuickArchive::BlockSource {
public:
    TextModeBlocks(const platform::ByteSource& bytes, std::uint64_t begin, std::uint64_t end)
        : bytes_(bytes), end_(end) {
        std::unique_ptr<char[]> block(new char[kBlockSize]);
        for (std::uint64_t raw = begin; raw < end_;) {
            std::size_t produced = 0;
            const std::uint64_t next = convert(raw, block.get(), produced);
            if (produced == 0) break;
            starts_.push_back(raw);
            total_ += produced;
            raw = next;
        }
    }

    std::uint64_t blockCount() const override { return starts_.size(); }
    std::uint64_t dataSize() const override { return total_; }

    // The file offset of byte `at` of the converted body: each CR LF pair in
    // front of it counts two bytes of the file.
    std::uint64_t fileOffset(std::uint64_t at) const {
        const std::uint64_t index = at / kBlockSize;
        if (index >= starts_.size()) return end_ + (at - total_);
        std::uint64_t raw = starts_[index];
        std::uint64_t seen = index * kBlockSize;
        char buffer[2 * kBlockSize + 1];
        const std::size_t got = bytes_.readAt(
            raw, buffer, static_cast<std::size_t>(std::min<std::uint64_t>(sizeof buffer, end_ - raw)));
        for (std::size_t i = 0; seen < at && i < got; ++seen) {
            const bool pair = buffer[i] == '\r' && i + 1 < got && buffer[i + 1] == '\n';
            i += pair ? 2 : 1;
            raw += pair ? 2 : 1;
        }
        return raw + (at - seen);
    }

    void fill(std::uint64_t index, char* block) const override {
        std::size_t produced = 0;
        convert(starts_[index], block, produced);
        std::memset(block + produced, 0, kBlockSize - produced);
    }

private:
    // Converts from file offset `raw` until the block is full or the body
    // ends; returns the offset reached.
    std::uint64_t convert(std::uint64_t raw, char* block, std::size_t& produced) const {
        char buffer[kBlockSize + 1];
        produced = 0;
        while (produced < kBlockSize && raw < end_) {
            const std::size_t want =
                static_cast<std::size_t>(std::min<std::uint64_t>(sizeof buffer, end_ - raw));
            const std::size_t got = bytes_.readAt(raw, buffer, want);
            std::size_t used = 0;
            produced += undoTextModeStep(buffer, got, raw + got < end_, block + produced,
                                         kBlockSize - produced, used);
            if (used == 0) break;
            raw += used;
        }
        return raw;
    }

    const platform::ByteSource& bytes_;
    std::uint64_t end_;
    std::vector<std::uint64_t> starts_;
    std::uint64_t total_ = 0;
};

}  // namespace

// Version 1 files went through a text-mode write: each CR LF pair becomes LF,
// in one pass from left to right (CR CR LF turns into CR LF).
std::string undoTextMode(const std::string& body) {
    std::string out(body.size(), '\0');
    std::size_t used = 0;
    out.resize(undoTextModeStep(body.data(), body.size(), false, &out[0], out.size(), used));
    return out;
}

bool OrvMatFile::load(const platform::ByteSource& bytes) {
    loadNote = LoadNote();
    std::uint32_t header[2] = {0, 0};
    if (bytes.readAt(0, header, 8) != 8)
        return loadNote.fail(LoadRule::BadHeader, 0, 0, "file shorter than its 8-byte header");
    const std::uint32_t tag = header[0];
    const std::uint32_t count = header[1];
    if (count == 0) return loadNote.fail(LoadRule::BadHeader, 4, 0, "material count is 0");
    if ((tag & 0xFFFF) != 0)
        return loadNote.fail(LoadRule::BadHeader, 0, tag, "version tag with a low half");

    // The material stream behind the header, read block by block as the
    // materials reach it.
    const std::uint64_t size = std::max<std::uint64_t>(bytes.size(), 8);
    std::unique_ptr<QuickArchive::BlockSource> stream;
    const TextModeBlocks* textMode = nullptr;  // version 1 only
    std::uint64_t streamStart = 8;             // where the stream starts in the file
    switch (tag >> 16) {
        case 3: {
            // A block count and the blocks. A file that ends early ends the
            // list with the block it ends in, short or empty, zero-padded.
            std::uint32_t blockCount = 0;
            if (bytes.readAt(8, &blockCount, 4) != 4 || blockCount == 0)
                return loadNote.fail(LoadRule::BadHeader, 8, 0, "no blocks");
            const std::uint64_t body = size > 12 ? size - 12 : 0;
            stream.reset(new RangeBlocks(bytes, 12, body,
                                         std::min<std::uint64_t>(blockCount, body / kBlockSize + 1)));
            streamStart = 12;
            break;
        }
        case 2:
            // Everything behind the header.
            stream.reset(new RangeBlocks(bytes, 8, size - 8, RangeBlocks::blocksFor(size - 8)));
            break;
        case 1:
            stream.reset(new TextModeBlocks(bytes, 8, size));
            textMode = static_cast<const TextModeBlocks*>(stream.get());
            break;
        default:
            return loadNote.fail(LoadRule::BadHeader, 0, tag, "unknown container version tag");
    }
    QuickArchive ar(*stream);

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
            // The note's offsets count bytes of the stream; the reader wants
            // those of the file.
            loadNote = ar.trace.note;
            for (std::uint64_t* offset : {&loadNote.offset, &loadNote.reached, &loadNote.record.start})
                *offset = textMode ? textMode->fileOffset(*offset) : streamStart + *offset;
            return false;
        }
        loaded.push_back(material);
    }
    materials.swap(loaded);
    return true;
}

bool OrvMatFile::load(const void* data, std::size_t size) {
    return load(platform::MemoryBytes(data, size));
}

bool OrvMatFile::load(std::istream& in) {
    const std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    return load(bytes.data(), bytes.size());
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
    platform::RegularFile file;
    if (!openForLoading(file, path, loadNote)) return false;
    return load(file);
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
