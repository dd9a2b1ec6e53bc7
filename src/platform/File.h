#pragma once
// Files named by wide paths. A path is opened through its UTF-8 form; other
// processes may have the file open at the same time.
#include <fstream>
#include <string>

namespace platform {

std::string pathToNative(const std::u16string& path);

void openForReading(std::ifstream& file, const std::u16string& path);
void openForWriting(std::ofstream& file, const std::u16string& path);

}  // namespace platform
