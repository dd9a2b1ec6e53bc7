#include "persistence/QuickArchive.h"

#include <cstring>
#include <istream>
#include <ostream>

#include "platform/File.h"
#include "platform/Text.h"

namespace OrvaneLumoCore {

// ---- construction ----------------------------------------------------------

QuickArchive::QuickArchive(std::size_t blockCount) {
    blocks.reserve(blockCount);
    for (std::size_t i = 0; i < blockCount; ++i) appendBlock();
}

QuickArchive::QuickArchive(const void* data, std::size_t size) {
    blocks.reserve((size + kBlockSize - 1) / kBlockSize);
    writeFrom(data, size);
}

QuickArchive::QuickArchive(const BlockSource& source) : source(&source) {}

QuickArchive::~QuickArchive() = default;

void QuickArchive::appendBlock() {
    boost::shared_ptr<Block> b(new Block);
    b->fill(0);
    blocks.push_back(b);
}

// ---- byte movement ---------------------------------------------------------

void QuickArchive::writeFrom(const void* src, std::size_t n) {
    if (source) return;
    const char* p = static_cast<const char*>(src);
    while (n > 0) {
        const std::uint64_t index = writePosition >> 12;
        while (blocks.size() <= index) appendBlock();
        const std::size_t offset = static_cast<std::size_t>(writePosition & 0xFFF);
        const std::size_t chunk = std::min(n, kBlockSize - offset);
        std::memcpy(blocks[index]->data() + offset, p, chunk);
        writePosition += chunk;
        p += chunk;
        n -= chunk;
    }
}

const char* QuickArchive::blockData(std::uint64_t index) {
    if (!source) return index < blocks.size() ? blocks[index]->data() : nullptr;
    if (lastPulled && lastPulledIndex == index) return lastPulled;
    if (index >= source->blockCount()) return nullptr;
    boost::shared_ptr<Block>& block = pulled[index];
    if (!block) {
        block.reset(new Block);
        source->fill(index, block->data());
    }
    lastPulledIndex = index;
    lastPulled = block->data();
    return lastPulled;
}

void QuickArchive::readInto(void* dst, std::size_t n) {
    char* p = static_cast<char*>(dst);
    while (n > 0) {
        const std::uint64_t index = readPosition >> 12;
        const std::size_t offset = static_cast<std::size_t>(readPosition & 0xFFF);
        const std::size_t chunk = std::min(n, kBlockSize - offset);
        if (const char* block = blockData(index)) {
            std::memcpy(p, block + offset, chunk);
        } else {
            // Behind the last block: the cursor moves on, the destination
            // keeps what it held.
            readPosition += n;
            return;
        }
        readPosition += chunk;
        p += chunk;
        n -= chunk;
    }
}

// Little-endian values: this code runs on little-endian machines only, where
// the memory image of a value is its file form.
static_assert(sizeof(float) == 4 && sizeof(double) == 8, "IEEE 754 types expected");

void QuickArchive::writeByte(std::uint8_t b) { writeFrom(&b, 1); }

bool QuickArchive::readByte(std::uint8_t& b) {
    const bool exists = (readPosition >> 12) < blockTotal();
    readInto(&b, 1);
    return exists;
}

bool QuickArchive::readByte(bool& b) {
    std::uint8_t v = b ? 1 : 0;
    const bool exists = readByte(v);
    b = v != 0;
    return exists;
}

void QuickArchive::writeInt(std::int32_t v) { writeFrom(&v, 4); }
void QuickArchive::readInt(std::int32_t& v) { readInto(&v, 4); }
void QuickArchive::writeUInt(std::uint32_t v) { writeFrom(&v, 4); }
void QuickArchive::readUInt(std::uint32_t& v) { readInto(&v, 4); }

void QuickArchive::writeLength(std::uint64_t n) { writeUInt(static_cast<std::uint32_t>(n)); }

void QuickArchive::readLength(std::uint64_t& n) {
    std::uint32_t low = static_cast<std::uint32_t>(n);
    readUInt(low);
    n = low;
}

void QuickArchive::writeFloat(float v) { writeFrom(&v, 4); }
void QuickArchive::readFloat(float& v) { readInto(&v, 4); }
void QuickArchive::writeDouble(double v) { writeFrom(&v, 8); }
void QuickArchive::readDouble(double& v) { readInto(&v, 8); }

void QuickArchive::writeString(const std::string& s) {
    writeLength(s.size());
    writeFrom(s.data(), s.size());
}

namespace {
// Reads n stored bytes as a zero-terminated text. A length that runs past the
// last block reads only the bytes that exist; the cursor still passes all n.
std::string readCappedBytes(QuickArchive& ar, std::uint64_t n) {
    const std::uint64_t avail = std::min<std::uint64_t>(n, ar.bytesLeft());
    std::string buf(static_cast<std::size_t>(avail), '\0');
    if (avail) ar.getRaw(&buf[0], static_cast<std::size_t>(avail));
    ar.setReadPosition(ar.getReadPosition() + (n - avail));
    const std::size_t zero = buf.find('\0');
    if (zero != std::string::npos) buf.resize(zero);
    return buf;
}
}  // namespace

void QuickArchive::readString(std::string& s) {
    std::uint64_t n = 0;
    readLength(n);
    if (n == 0) {
        s.clear();
        return;
    }
    s = readCappedBytes(*this, n);
}

void QuickArchive::writeWString(const std::u16string& s) { writeString(wideToUtf8(s)); }

void QuickArchive::readWString(std::u16string& s) {
    std::string bytes;
    readString(bytes);
    s = utf8ToWide(bytes);
}

void QuickArchive::writeColor(const Color& c) { writeFloat(c.r); writeFloat(c.g); writeFloat(c.b); }
void QuickArchive::readColor(Color& c) { readFloat(c.r); readFloat(c.g); readFloat(c.b); }

void QuickArchive::writeAColor(const AColor& c) {
    writeFloat(c.r); writeFloat(c.g); writeFloat(c.b); writeFloat(c.a);
}
void QuickArchive::readAColor(AColor& c) {
    readFloat(c.r); readFloat(c.g); readFloat(c.b); readFloat(c.a);
}

void QuickArchive::writeVector(const Vector& v) { writeFloat(v.x); writeFloat(v.y); writeFloat(v.z); }
void QuickArchive::readVector(Vector& v) { readFloat(v.x); readFloat(v.y); readFloat(v.z); }

void QuickArchive::writeMatrix(const Matrix& m) {
    for (const Vector& v : m.m) writeVector(v);
}
void QuickArchive::readMatrix(Matrix& m) {
    for (Vector& v : m.m) readVector(v);
}

void QuickArchive::writeTransform(const Transform& t) { writeMatrix(t.m); writeVector(t.offs); }
void QuickArchive::readTransform(Transform& t) { readMatrix(t.m); readVector(t.offs); }

void QuickArchive::writeRect(const Rect& r) {
    writeInt(r.x0); writeInt(r.y0); writeInt(r.x1); writeInt(r.y1);
}

void QuickArchive::readRect(Rect& r) {
    readInt(r.x0); readInt(r.y0); readInt(r.x1); readInt(r.y1);
    // Wrapping arithmetic: damaged records may hold any values.
    r.width = static_cast<std::int32_t>(static_cast<std::uint32_t>(r.x1) - static_cast<std::uint32_t>(r.x0));
    r.height = static_cast<std::int32_t>(static_cast<std::uint32_t>(r.y1) - static_cast<std::uint32_t>(r.y0));
    r.reserved0 = 0;
    r.reserved1 = 0;
}

void QuickArchive::writeBytes(const void* data, std::uint32_t length) {
    writeUInt(length);
    writeFrom(data, length);
}

std::uint32_t QuickArchive::readBytes(void* buffer, std::uint32_t capacity, bool strict) {
    const std::uint64_t start = readPosition;
    std::uint32_t length = 0;
    readUInt(length);
    readInto(buffer, std::min(length, capacity));
    if (strict && length != capacity) {
        readPosition = start;
        return length;
    }
    if (length > capacity) readPosition += length - capacity;
    return length;
}

void QuickArchive::putRaw(const void* data, std::size_t length) { writeFrom(data, length); }
void QuickArchive::getRaw(void* buffer, std::size_t length) { readInto(buffer, length); }

// ---- whole store -----------------------------------------------------------

void QuickArchive::clear() {
    blocks.clear();
    source = nullptr;
    pulled.clear();
    lastPulled = nullptr;
    readPosition = 0;
    writePosition = 0;
}

bool QuickArchive::saveBlocks(std::ostream& out) const {
    const std::uint32_t count = static_cast<std::uint32_t>(blocks.size());
    out.write(reinterpret_cast<const char*>(&count), 4);
    for (const auto& b : blocks) out.write(b->data(), kBlockSize);
    return true;
}

bool QuickArchive::loadBlocks(std::istream& in) {
    clear();
    // A stream that ends inside the count keeps the bytes it delivered.
    std::uint32_t count = 0;
    in.read(reinterpret_cast<char*>(&count), 4);
    // Blocks are appended as the stream delivers them: a count read from a
    // damaged file does not reserve memory ahead of the data that backs it.
    for (std::uint32_t i = 0; i < count && in; ++i) {
        appendBlock();
        in.read(blocks.back()->data(), kBlockSize);
    }
    readPosition = 0;
    writePosition = 0;
    return count > 0;
}

bool QuickArchive::saveToFile(const std::u16string& path) const {
    std::ofstream file;
    platform::openForWriting(file, path);
    if (!file.is_open()) return false;
    saveBlocks(file);
    return true;
}

bool QuickArchive::saveToFile(const std::string& path) const { return saveToFile(utf8ToWide(path)); }

bool QuickArchive::loadFromFile(const std::u16string& path) {
    std::ifstream file;
    platform::openForReading(file, path);
    if (!file.is_open()) return false;
    return loadBlocks(file);
}

bool QuickArchive::loadFromFile(const std::string& path) { return loadFromFile(utf8ToWide(path)); }

}  // namespace OrvaneLumoCore
