#pragma once
// The byte store of all records: a growing list of 4096-byte blocks with
// independent read and write cursors. Values are little-endian and unaligned;
// every reader and writer goes byte by byte, so a value may cross a block
// border. A read behind the last block advances the cursor and leaves its
// destination untouched.
//
// An archive may also stand on a block source (a file): its blocks are then
// pulled from the source when a read first reaches them, so loading costs
// what the records use, not what the file holds.
#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <map>
#include <string>
#include <vector>

#include <boost/array.hpp>
#include <boost/shared_ptr.hpp>

#include "persistence/LoadNote.h"
#include "platform/Text.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// The model's text conversions, under the names its code uses.
using platform::utf8ToWide;
using platform::wideToUtf8;

class QuickArchive {
public:
    static constexpr std::size_t kBlockSize = 4096;
    typedef boost::array<char, kBlockSize> Block;

    // Where the blocks of a read-only archive come from.
    class BlockSource {
    public:
        virtual ~BlockSource() = default;
        virtual std::uint64_t blockCount() const = 0;
        // Fills `block` (kBlockSize bytes) with block `index` < blockCount().
        virtual void fill(std::uint64_t index, char* block) const = 0;
        // The bytes of data in the blocks; the rest of the last block is
        // padding.
        virtual std::uint64_t dataSize() const { return blockCount() * kBlockSize; }
    };

    explicit QuickArchive(std::size_t blockCount = 1);
    QuickArchive(const void* data, std::size_t size);
    // Reads the blocks of `source`, which outlives the archive. Such an
    // archive is read-only: writes leave it unchanged.
    explicit QuickArchive(const BlockSource& source);
    // An archive holds its blocks by pointer: a copy would share them, and a
    // write to one would show in the other. It moves; it doesn't copy.
    QuickArchive(const QuickArchive&) = delete;
    QuickArchive& operator=(const QuickArchive&) = delete;
    QuickArchive(QuickArchive&&) = default;
    QuickArchive& operator=(QuickArchive&&) = default;
    virtual ~QuickArchive();

    // Primitives. Readers fill their argument only with bytes that exist.
    void writeByte(std::uint8_t b);
    bool readByte(std::uint8_t& b);
    void writeByte(bool b) { writeByte(static_cast<std::uint8_t>(b ? 1 : 0)); }
    bool readByte(bool& b);  // any non-zero byte reads as true

    void writeInt(std::int32_t v);
    void readInt(std::int32_t& v);
    void writeUInt(std::uint32_t v);
    void readUInt(std::uint32_t& v);
    void writeLength(std::uint64_t n);  // keeps the low 32 bits
    void readLength(std::uint64_t& n);  // clears the high 32 bits
    void writeFloat(float v);
    void readFloat(float& v);
    void writeDouble(double v);
    void readDouble(double& v);
    void writeString(const std::string& s);
    void readString(std::string& s);
    void writeWString(const std::u16string& s);
    void readWString(std::u16string& s);
    void writeColor(const Color& c);
    void readColor(Color& c);
    void writeAColor(const AColor& c);
    void readAColor(AColor& c);
    void writeVector(const Vector& v);
    void readVector(Vector& v);
    void writeMatrix(const Matrix& m);
    void readMatrix(Matrix& m);
    void writeTransform(const Transform& t);
    void readTransform(Transform& t);
    void writeRect(const Rect& r);
    void readRect(Rect& r);
    void writeBytes(const void* data, std::uint32_t length);
    // Returns the stored length L. Reads min(L, capacity) bytes; with `strict`
    // and L != capacity the cursor goes back to the length field, otherwise
    // bytes beyond the capacity are skipped.
    std::uint32_t readBytes(void* buffer, std::uint32_t capacity, bool strict);
    void putRaw(const void* data, std::size_t length);
    void getRaw(void* buffer, std::size_t length);

    // Whole store; the block list holds the blocks written or loaded, not
    // those of a block source.
    void clear();
    std::size_t getBlockCount() const { return blocks.size(); }
    boost::shared_ptr<Block> getBlock(std::size_t index) const { return blocks[index]; }
    bool saveBlocks(std::ostream& out) const;
    bool loadBlocks(std::istream& in);
    bool saveToFile(const std::u16string& path) const;
    bool saveToFile(const std::string& path) const;
    bool loadFromFile(const std::u16string& path);
    bool loadFromFile(const std::string& path);

    std::uint64_t getReadPosition() const { return readPosition; }
    std::uint64_t getWritePosition() const { return writePosition; }
    void setReadPosition(std::uint64_t p) { readPosition = p; }

    // Bytes from the read cursor to the end of the last block: an upper
    // bound for anything a record can still hold.
    std::uint64_t bytesLeft() const {
        const std::uint64_t total = blockTotal() * kBlockSize;
        return readPosition < total ? total - readPosition : 0;
    }

    // Where the data ends: the source's data, else the bytes written, else
    // the end of the last block.
    std::uint64_t dataSize() const {
        if (source) return source->dataSize();
        if (writePosition > 0) return writePosition;
        return static_cast<std::uint64_t>(blocks.size()) * kBlockSize;
    }

    // Depth of nested member records being loaded; see persistence/Record.h.
    int nestingDepth = 0;
    // Why a load from this archive failed, and the records being read; see
    // persistence/LoadNote.h.
    LoadTrace trace;

private:
    void appendBlock();
    void readInto(void* dst, std::size_t n);
    void writeFrom(const void* src, std::size_t n);
    std::uint64_t blockTotal() const {
        return source ? source->blockCount() : static_cast<std::uint64_t>(blocks.size());
    }
    // The bytes of block `index`, pulled from the source if needed; null
    // behind the last block.
    const char* blockData(std::uint64_t index);

    std::vector<boost::shared_ptr<Block>> blocks;
    std::uint64_t readPosition = 0;
    std::uint64_t writePosition = 0;

    // Set for an archive on a block source, with the blocks pulled so far
    // and the last one used.
    const BlockSource* source = nullptr;
    std::map<std::uint64_t, boost::shared_ptr<Block>> pulled;
    std::uint64_t lastPulledIndex = 0;
    const char* lastPulled = nullptr;
};

}  // namespace OrvaneLumoCore
