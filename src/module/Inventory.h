#pragma once
// What a file holds, without converting it, and the files it refers to.
//
// A listing loads a material library or an options file as the conversion
// does and sums it up: each material with its class, UUID, the shape of its
// tree and how many textures it holds; or the options' record version and
// camera. The file references are every path that the loaded objects hold:
// the image of every bitmap anywhere in a material's tree (skies, environment
// overrides and old records that stored a bare path included), the profile
// of an IES light, and the paths of an options file's settings (with the
// bitmaps of its environment textures). A reference is then looked for on
// disk beside the file and in search folders.
//
// Loading never throws for a bad file: a file that doesn't load, isn't a
// regular file or runs out of memory comes back with its status and the
// reason, in the words of explainOutcome. Loading leaves the document sun
// as it was.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "materials/BaseMaterial.h"
#include "module/Outcome.h"

namespace OrvaneLumoCore {

class AllOptions;

// ---- listing ------------------------------------------------------------------------

struct MaterialSummary {
    std::u16string name;
    std::string className;     // the material's class: "MaterialBump"
    std::u16string uuid;
    // The classes of the material and of every material and layer inside it,
    // on one line: "MaterialBump[MaterialLayeredBRDF[Diffuse_BRDF, Phong_BRDF]]".
    // A layered material's empty layer slot shows as "-".
    std::string shape;
    // Texture objects anywhere in the tree, nested ones included; an object
    // that a tree built in memory shares counts once.
    std::size_t textures = 0;
};

struct OptionsSummary {
    int recordVersion = 0;        // the version of the file's AllOptions record
    std::int32_t cameraType = 0;  // SettingsCamera's type
    bool physicalCameraOn = false;
    std::int32_t physicalCameraType = 0;
};

struct FileListing {
    FileKind kind = FileKind::Materials;
    // Document: the file loaded. Text: it didn't (damaged, newer, a text
    // export). Unreadable: not a regular file, can't be opened, or memory ran
    // out.
    FileStatus status = FileStatus::Unreadable;
    std::string reason;                      // why it isn't a Document
    std::vector<MaterialSummary> materials;  // a library's, in file order
    OptionsSummary options;                  // an options file's
};

FileListing listFile(const std::u16string& path, FileKind kind);

// The summary of a material that is loaded already.
MaterialSummary summarizeMaterial(const MaterialPtr& material);

// ---- file references ----------------------------------------------------------------

// What the renderer does with the file a path names.
enum class PathUse {
    Read,     // a file it reads: an image, a profile, a saved cache
    Folder,   // a folder that must exist
    Written,  // a file it writes: an output image, a cache it saves
};

struct FileReference {
    std::u16string material;  // the top-level material that holds it; empty for options
    // Where the path is held: the classes from the top-level material down to
    // the holder ("MaterialBump > MaterialLayeredBRDF > Diffuse_BRDF >
    // BitmapTexture > BitmapBuffer"); for options the block and parameter
    // ("SettingsOutput.img_file"), followed by the classes down from a
    // texture parameter.
    std::string where;
    std::u16string path;  // as stored; never empty
    PathUse use = PathUse::Read;
    // Filled by checkReferences: whether the file was found, and where.
    bool found = false;
    std::string foundPath;
};

struct FileReferences {
    FileKind kind = FileKind::Materials;
    FileStatus status = FileStatus::Unreadable;  // as in FileListing
    std::string reason;
    // In file order, a material's own slots before those of the materials
    // inside it; empty paths left out.
    std::vector<FileReference> references;
};

FileReferences listFileReferences(const std::u16string& path, FileKind kind);

// The references of loaded objects, appended to `out`.
void collectMaterialReferences(const MaterialPtr& material, std::vector<FileReference>& out);
void collectOptionsReferences(const AllOptions& options, std::vector<FileReference>& out);

// ---- finding the files --------------------------------------------------------------

// Looks for the file that `stored` names; paths here are UTF-8. An absolute
// path is tried as it is (a Windows path with a drive or a UNC path only on
// Windows); a relative one in `libraryFolder` and then in each search folder;
// an absolute path that isn't there (a Windows path always) by its file name
// in those folders. "\" separates folders in a stored path on every system.
// A Folder reference must name a folder, any other a file that isn't one.
// Returns the first path that exists in `found`, as tried (the stored path's
// "\" written as "/").
bool resolveReference(const std::u16string& stored, PathUse use, const std::string& libraryFolder,
                      const std::vector<std::string>& searchFolders, std::string& found);

// Resolves every reference that the renderer doesn't write; returns how many
// of them weren't found.
std::size_t checkReferences(std::vector<FileReference>& references, const std::string& libraryFolder,
                            const std::vector<std::string>& searchFolders);

// ---- lines and JSON -----------------------------------------------------------------
//
// Text is UTF-8; in a text line a control character shows as \xNN. Each
// JSON object is one line without a line end.

// "<name>\t<class>\t<uuid>\t<n> textures\t<shape>"
std::string listingLine(const MaterialSummary& material);
// "version <v>\tcamera type <t>\tphysical camera on|off, type <p>"
std::string listingLine(const OptionsSummary& options);
// {"name": , "class": , "uuid": , "textures": , "shape": }
std::string listingJson(const MaterialSummary& material);
// {"version": , "camera_type": , "physical_camera": , "physical_camera_type": }
std::string listingJson(const OptionsSummary& options);

// After checkReferences, a library's reference as
// "<material>\t<path>\t<found path | missing>\t<where>", an options file's as
// "<where>\t<path>\t<found path | missing | written by the renderer>".
std::string referenceLine(const FileReference& reference, FileKind kind);
// {"material": , "where": , "path": , "use": "read"|"folder"|"written",
//  "status": "found"|"missing"|"written", "found": }
std::string referenceJson(const FileReference& reference);

// A JSON string of wide text: quotes, backslashes and control characters
// escaped (\n, \r, \t, else \u00NN), the rest as UTF-8 (a lone surrogate as
// U+FFFD).
std::string jsonText(const std::u16string& text);

}  // namespace OrvaneLumoCore
