#include "platform/File.h"

#include "platform/Text.h"

namespace platform {

std::string pathToNative(const std::u16string& path) {
    return encodeUtf8(path.data(), path.size());
}

void openForReading(std::ifstream& file, const std::u16string& path) {
    file.open(pathToNative(path), std::ios::in | std::ios::binary);
}

void openForWriting(std::ofstream& file, const std::u16string& path) {
    file.open(pathToNative(path), std::ios::out | std::ios::binary | std::ios::trunc);
}

}  // namespace platform
