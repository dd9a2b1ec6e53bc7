#pragma once
// Sample files written by orvxml-samples. Each family adds its samples to the
// list; main writes them all into the directory given on the command line.
#include <filesystem>
#include <string>
#include <vector>

namespace samples {

struct Sample {
    const char* fileName;                      // name inside the output directory
    bool (*write)(const std::string& path);    // writes the file; false on failure
};

void addMaterialSamples(std::vector<Sample>& list);
void addWrappedMaterialSamples(std::vector<Sample>& list);
void addTextureSamples(std::vector<Sample>& list);
void addTextRoadSamples(std::vector<Sample>& list);
void addOptionSamples(std::vector<Sample>& list);

// Writes one library per class of each family that can be stored at its
// defaults into `dir`.
void writeClassSeeds(const std::filesystem::path& dir);

}  // namespace samples
