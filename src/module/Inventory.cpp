#include "module/Inventory.h"

#include <cstring>
#include <new>
#include <stdexcept>
#include <typeinfo>
#include <unordered_set>

#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/MaterialTree.h"
#include "materials/ReferenceMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "options/AllOptions.h"
#include "persistence/Record.h"
#include "platform/File.h"
#include "platform/System.h"
#include "platform/Text.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"
#include "textures/SkyTexture.h"

namespace OrvaneLumoCore {

namespace {

// ---- loading ------------------------------------------------------------------------

// Puts the document sun back as it was: a version 3 sky record replaces it in
// place while it loads, and a listing changes nothing of what a conversion
// that follows sees.
class KeepDocumentSun {
public:
    KeepDocumentSun() : saved_(*documentSun()) {}
    // Also runs while an allocation failure unwinds, so it must not throw:
    // if memory is too short even to put the sun back, it stays as the
    // load left it.
    ~KeepDocumentSun() {
        try {
            *documentSun() = saved_;
        } catch (const std::bad_alloc&) {
        } catch (const std::length_error&) {
        }
    }
    KeepDocumentSun(const KeepDocumentSun&) = delete;
    KeepDocumentSun& operator=(const KeepDocumentSun&) = delete;

private:
    SunLight saved_;
};

// Opens the file and calls `load(file, note)`, as convertFile does: a path
// that isn't a regular file is never read, and running out of memory is a
// status, not an exception. `load` returns whether the file loaded and
// leaves the note of a failure in `note`.
template <class Load>
FileStatus loadFile(const std::u16string& path, std::string& reason, Load load) {
    LoadNote note;
    platform::RegularFile file;
    FileStatus status = FileStatus::Unreadable;
    if (openForLoading(file, path, note)) {
        bool outOfMemory = false;
        try {
            KeepDocumentSun keepSun;
            status = load(file, note) ? FileStatus::Document : FileStatus::Text;
        } catch (const std::bad_alloc&) {
            outOfMemory = true;
        } catch (const std::length_error&) {
            outOfMemory = true;
        }
        if (outOfMemory) {
            status = FileStatus::Unreadable;
            note = LoadNote();
            note.fail(LoadRule::OutOfMemory, 0);
        }
    }
    if (status != FileStatus::Document) reason = describe(note);
    return status;
}

// Loads a library and hands each material to `use`.
template <class Use>
FileStatus loadMaterials(const std::u16string& path, std::string& reason, Use use) {
    return loadFile(path, reason, [&](const platform::RegularFile& file, LoadNote& note) {
        OrvMatFile library;
        if (!library.load(file)) {
            note = library.loadNote;
            return false;
        }
        for (const MaterialPtr& material : library.materials) use(material);
        return true;
    });
}

// Loads an options file and hands the options and their record version to
// `use`.
template <class Use>
FileStatus loadOptions(const std::u16string& path, std::string& reason, Use use) {
    return loadFile(path, reason, [&](const platform::RegularFile& file, LoadNote& note) {
        OrvOptFile container;
        AllOptions options;
        if (!container.load(options, file)) {
            note = container.loadNote;
            return false;
        }
        // The file is the record: its first word is the version tag, whose
        // high half is the version.
        unsigned char tag[4] = {0, 0, 0, 0};
        file.readAt(0, tag, sizeof tag);
        use(options, static_cast<int>(tag[2] | (tag[3] << 8)));
        return true;
    });
}

// ---- the walk over a tree -------------------------------------------------------------

template <class T>
std::string classOf(const boost::shared_ptr<T>& object) {
    return object ? className(&typeid(*object)) : std::string("-");
}

// A loaded tree is at most kMaxNestingDepth records deep and holds each
// object once. One built in memory may share objects or refer back to itself
// through a reference's copy: a walk takes each material and texture once
// and stops at this depth.
const int kWalkDepthLimit = 4 * kMaxNestingDepth;

// Visits every object of a tree: materials, layers, textures, bitmaps and
// lights. It counts the textures and gathers every non-empty path field.
//
// A class whose record is one table (bitmaps, lights, the wrapping
// materials, the constant colour) is walked through its table: every path
// row and every texture row of it, so a field added to such a table is found
// without a change here. Classes whose records are written by hand name
// their texture slots below; child materials come from childMaterials.
class TreeWalk {
public:
    TreeWalk(std::vector<FileReference>* out, const std::u16string& material, const std::string& where)
        : out_(out), material_(material) {
        if (!where.empty()) trail_.push_back(where);
    }

    std::size_t textureCount = 0;

    void material(const MaterialPtr& m) {
        if (!m || !seen_.insert(m.get()).second) return;
        Step step(*this, classOf(m));
        if (step.tooDeep()) return;
        materialTextures(*m);
        for (const MaterialPtr& child : childMaterials(*m)) material(child);
    }

    void texture(const TexturePtr& t) {
        if (!t || !seen_.insert(t.get()).second) return;
        Step step(*this, classOf(t));
        if (step.tooDeep()) return;
        ++textureCount;
        textureChildren(*t);
    }

private:
    // The class of one object on the trail while its children are walked.
    class Step {
    public:
        Step(TreeWalk& walk, const std::string& name) : walk_(walk) { walk_.trail_.push_back(name); }
        ~Step() { walk_.trail_.pop_back(); }
        Step(const Step&) = delete;
        Step& operator=(const Step&) = delete;
        bool tooDeep() const { return walk_.trail_.size() > static_cast<std::size_t>(kWalkDepthLimit); }

    private:
        TreeWalk& walk_;
    };

    void path(const std::u16string& value) {
        if (!out_ || value.empty()) return;
        FileReference ref;
        ref.material = material_;
        for (const std::string& step : trail_) ref.where += (ref.where.empty() ? "" : " > ") + step;
        ref.path = value;
        out_->push_back(ref);
    }

    void slots(std::initializer_list<TexturePtr> textures) {
        for (const TexturePtr& t : textures) texture(t);
    }

    // Every path and texture row of a class's table.
    template <class C, class Rows>
    void rows(const C& object, const Rows& table) {
        for (const RecordRow<C>& row : table) {
            if (row.field.kind() == FieldRef<C>::Kind::Path)
                path(row.field.template get<std::u16string>(object));
            else if (row.field.kind() == FieldRef<C>::Kind::Texture)
                texture(row.field.template get<TexturePtr>(object));
        }
    }

    template <class C, class Root>
    bool byTable(const Root& object) {
        const C* c = dynamic_cast<const C*>(&object);
        if (c) rows(*c, C::record());
        return c != nullptr;
    }

    void materialTextures(const BaseMaterial& m) {
        if (const MaterialLayeredBRDF* layered = dynamic_cast<const MaterialLayeredBRDF*>(&m)) {
            for (const BrdfPtr& l : layered->brdfs) layer(l);
        } else if (const MaterialSingleBRDF* single = dynamic_cast<const MaterialSingleBRDF*>(&m)) {
            layer(single->brdf);
        } else if (const MaterialBump* bump = dynamic_cast<const MaterialBump*>(&m)) {
            texture(bump->bump_tex);
        } else if (const Material2Sided* twoSided = dynamic_cast<const Material2Sided*>(&m)) {
            slots({twoSided->translucency_tex, twoSided->transparency_tex});
        } else if (!byTable<MaterialOverrideEnvironment>(m) && !byTable<MaterialDisplaced>(m) &&
                   !byTable<MaterialAlphaContribution>(m) && !byTable<MaterialAngleBlend>(m)) {
            byTable<MaterialToon>(m);
        }
        // Multi, two-sided (SketchUp), linked, object exclusion, reference and
        // instance hold no texture of their own.
    }

    void layer(const BrdfPtr& l) {
        if (!l) return;
        Step step(*this, classOf(l));
        const Base_BRDF* b = l.get();
        if (const Glass_BRDF* glass = dynamic_cast<const Glass_BRDF*>(b))
            slots({glass->color_tex, glass->transparency_tex, glass->glossiness_tex, glass->ior_tex,
                      glass->translucency_tex});
        else if (const BaseGlossy_BRDF* glossy = dynamic_cast<const BaseGlossy_BRDF*>(b))
            slots({glossy->color_tex, glossy->hilightGlossiness_tex, glossy->reflectionGlossiness_tex,
                      glossy->transparency_tex});
        else if (const Mirror_BRDF* mirror = dynamic_cast<const Mirror_BRDF*>(b))
            slots({mirror->color_tex, mirror->transparency_tex});
        else if (const Diffuse_BRDF* diffuse = dynamic_cast<const Diffuse_BRDF*>(b))
            slots({diffuse->color_tex, diffuse->transparency_tex});
        else if (const Light_BRDF* light = dynamic_cast<const Light_BRDF*>(b))
            slots({light->color_tex, light->transparency_tex});
    }

    void textureChildren(const BaseTexture& t) {
        if (const BitmapTexture* bitmap = dynamic_cast<const BitmapTexture*>(&t)) {
            if (!bitmap->bitmap) return;
            Step step(*this, classOf(bitmap->bitmap));
            byTable<BitmapBuffer>(*bitmap->bitmap);
        } else if (const FresnelTexture* fresnel = dynamic_cast<const FresnelTexture*>(&t)) {
            slots({fresnel->reflection_tex, fresnel->refraction_tex, fresnel->fresnel_ior_tex,
                      fresnel->refract_ior_tex});
        } else if (const BlendTexture* blend = dynamic_cast<const BlendTexture*>(&t)) {
            slots({blend->color_a, blend->color_b});
        } else if (const InvertTexture* invert = dynamic_cast<const InvertTexture*>(&t)) {
            texture(invert->texture);
        } else if (const RampTexture* ramp = dynamic_cast<const RampTexture*>(&t)) {
            texture(ramp->colors);
        } else if (const GridTexture* grid = dynamic_cast<const GridTexture*>(&t)) {
            slots({grid->line_color, grid->fill_color});
        } else if (const NoiseTexture* noise = dynamic_cast<const NoiseTexture*>(&t)) {
            slots({noise->color1_tex, noise->color2_tex});
        } else if (const CheckerTexture* checker = dynamic_cast<const CheckerTexture*>(&t)) {
            slots({checker->white_color, checker->black_color});
        } else if (const SkyTexture* sky = dynamic_cast<const SkyTexture*>(&t)) {
            light(sky->sun);
        }
        // UVW generators hold neither paths nor textures; bulge, cloth, the
        // constant colour and the UVW texture hold nothing else.
    }

    void light(const LightPtr& l) {
        if (!l) return;
        Step step(*this, classOf(l));
        const BaseLight& b = *l;
        if (!byTable<IESLight>(b) && !byTable<OmniLight>(b) && !byTable<SpotLight>(b)) byTable<RectangleLight>(b);
    }

    std::vector<FileReference>* out_;
    std::u16string material_;
    std::vector<std::string> trail_;
    std::unordered_set<const void*> seen_;
};

// ---- shape ---------------------------------------------------------------------------

// A material shown already (shared, or a reference's copy that leads back)
// shows as its class and "[...]".
void appendShape(std::string& out, const MaterialPtr& m, int depth, std::unordered_set<const void*>& seen) {
    out += classOf(m);
    if (!m || depth > kWalkDepthLimit) return;
    if (!seen.insert(m.get()).second) {
        out += "[...]";
        return;
    }
    std::vector<std::string> inner;
    if (const MaterialLayeredBRDF* layered = dynamic_cast<const MaterialLayeredBRDF*>(m.get())) {
        for (const BrdfPtr& l : layered->brdfs) inner.push_back(classOf(l));
    } else if (const MaterialSingleBRDF* single = dynamic_cast<const MaterialSingleBRDF*>(m.get())) {
        if (single->brdf) inner.push_back(classOf(single->brdf));
    }
    const std::vector<MaterialPtr> children = childMaterials(*m);
    if (inner.empty() && children.empty()) return;
    out += '[';
    bool first = true;
    for (const std::string& name : inner) {
        out += (first ? "" : ", ") + name;
        first = false;
    }
    for (const MaterialPtr& child : children) {
        if (!first) out += ", ";
        first = false;
        appendShape(out, child, depth + 1, seen);
    }
    out += ']';
}

// ---- options -------------------------------------------------------------------------

bool endsWith(const char* text, const char* tail) {
    const std::size_t n = std::strlen(text), m = std::strlen(tail);
    return n >= m && std::strcmp(text + n - m, tail) == 0;
}

// What the renderer does with a settings path: the output images and the
// caches it saves on its own are written; the distributed rendering folder
// must exist; the cache files of the "from file" modes are read.
PathUse useOfSetting(const std::u16string& block, const char* parameter) {
    if (endsWith(parameter, "auto_save_file")) return PathUse::Written;
    if (block == u"SettingsOutput" &&
        (std::strcmp(parameter, "img_file") == 0 || std::strcmp(parameter, "luimg_file") == 0))
        return PathUse::Written;
    if (block == u"SettingsDR" && std::strcmp(parameter, "folder") == 0) return PathUse::Folder;
    return PathUse::Read;
}

std::string utf8(const std::u16string& text) { return platform::encodeUtf8(text.data(), text.size()); }

// ---- paths ---------------------------------------------------------------------------

const bool kBackslashSeparates = std::strchr(platform::kPathSeparators, '\\') != nullptr;

bool isSlash(char c) { return c == '/' || c == '\\'; }

// A drive ("C:\maps", "C:maps"), a UNC path or one from the drive's root.
bool isWindowsAbsolute(const std::string& p) {
    const bool drive = p.size() >= 2 && p[1] == ':' &&
                       ((p[0] >= 'A' && p[0] <= 'Z') || (p[0] >= 'a' && p[0] <= 'z'));
    return drive || (!p.empty() && p[0] == '\\');
}

// A path this system opens as it is, without a folder in front.
bool isNativeAbsolute(const std::string& p) {
    if (kBackslashSeparates) return isWindowsAbsolute(p) || (!p.empty() && p[0] == '/');
    return !p.empty() && p[0] == '/';
}

std::string fileNameOf(const std::string& p) {
    std::size_t start = p.size();
    while (start > 0 && !isSlash(p[start - 1])) --start;
    // "C:wood.png" has no separator but a drive.
    if (start == 0 && isWindowsAbsolute(p) && p.size() >= 2 && p[1] == ':') start = 2;
    return p.substr(start);
}

// `relative` in `folder`, its "\" made "/" (which Windows takes as well).
std::string joined(const std::string& folder, const std::string& relative) {
    std::string tail = relative;
    for (char& c : tail)
        if (c == '\\') c = '/';
    if (folder.empty()) return tail;
    return isSlash(folder.back()) ? folder + tail : folder + "/" + tail;
}

bool existsAs(const std::string& path, PathUse use) {
    int error = 0;
    const platform::PathKind kind = platform::pathKind(path, error);
    if (kind == platform::PathKind::Missing) return false;
    return (kind == platform::PathKind::Folder) == (use == PathUse::Folder);
}

// The first of `folder/name` for the library's folder and the search
// folders that exists.
bool findIn(const std::string& name, PathUse use, const std::string& libraryFolder,
            const std::vector<std::string>& searchFolders, std::string& found) {
    if (name.empty()) return false;
    std::string candidate = joined(libraryFolder, name);
    if (existsAs(candidate, use)) return found = candidate, true;
    for (const std::string& folder : searchFolders) {
        candidate = joined(folder, name);
        if (existsAs(candidate, use)) return found = candidate, true;
    }
    return false;
}

// ---- text ----------------------------------------------------------------------------

// A byte as `prefix` and two hex digits.
std::string hexEscape(const char* prefix, unsigned char byte) {
    static const char kHex[] = "0123456789abcdef";
    return std::string(prefix) + kHex[byte >> 4] + kHex[byte & 15];
}

bool isControl(unsigned char byte) { return byte < 0x20 || byte == 0x7F; }

// UTF-8 for a text line: control characters as \xNN, so one entry stays on
// one line.
std::string lineText(const std::string& text) {
    std::string out;
    for (const char c : text) {
        const unsigned char byte = static_cast<unsigned char>(c);
        if (isControl(byte))
            out += hexEscape("\\x", byte);
        else
            out += c;
    }
    return out;
}
std::string lineText(const std::u16string& text) { return lineText(utf8(text)); }

// A JSON string of UTF-8 text: the short escapes where JSON has them, \u00NN
// for the other control characters.
std::string jsonText(const std::string& text) {
    std::string out = "\"";
    for (const char c : text) {
        switch (c) {
        case '"': out += "\\\""; break;
        case '\\': out += "\\\\"; break;
        case '\n': out += "\\n"; break;
        case '\r': out += "\\r"; break;
        case '\t': out += "\\t"; break;
        default:
            if (static_cast<unsigned char>(c) < 0x20)
                out += hexEscape("\\u00", static_cast<unsigned char>(c));
            else
                out += c;
        }
    }
    return out + "\"";
}

const char* useWord(PathUse use) {
    switch (use) {
    case PathUse::Read: return "read";
    case PathUse::Folder: return "folder";
    case PathUse::Written: break;
    }
    return "written";
}

}  // namespace

// ---- listing ------------------------------------------------------------------------

MaterialSummary summarizeMaterial(const MaterialPtr& material) {
    MaterialSummary summary;
    if (!material) return summary;
    summary.name = material->name;
    summary.className = classOf(material);
    summary.uuid = material->uuid;
    std::unordered_set<const void*> seen;
    appendShape(summary.shape, material, 0, seen);
    TreeWalk walk(nullptr, material->name, std::string());
    walk.material(material);
    summary.textures = walk.textureCount;
    return summary;
}

FileListing listFile(const std::u16string& path, FileKind kind) {
    FileListing listing;
    listing.kind = kind;
    if (kind == FileKind::Materials) {
        listing.status = loadMaterials(path, listing.reason, [&](const MaterialPtr& material) {
            listing.materials.push_back(summarizeMaterial(material));
        });
    } else {
        listing.status = loadOptions(path, listing.reason, [&](const AllOptions& options, int version) {
            listing.options.recordVersion = version;
            listing.options.cameraType = options.params.camera_type;
            listing.options.physicalCameraOn = options.physicalCameraOn != 0;
            listing.options.physicalCameraType = options.physicalCamera.type;
        });
    }
    if (listing.status != FileStatus::Document) listing.materials.clear();
    return listing;
}

// ---- file references ----------------------------------------------------------------

void collectMaterialReferences(const MaterialPtr& material, std::vector<FileReference>& out) {
    if (!material) return;
    TreeWalk walk(&out, material->name, std::string());
    walk.material(material);
}

void collectOptionsReferences(const AllOptions& options, std::vector<FileReference>& out) {
    for (const AllOptions::DocumentField& field : options.pathAndTextureFields()) {
        const std::u16string block = field.block;
        const std::string where = utf8(block) + "." + field.parameter;
        if (field.texture) {
            TreeWalk walk(&out, std::u16string(), where);
            walk.texture(*field.texture);
        } else if (!field.path->empty()) {
            FileReference ref;
            ref.where = where;
            ref.path = *field.path;
            ref.use = useOfSetting(block, field.parameter);
            out.push_back(ref);
        }
    }
}

FileReferences listFileReferences(const std::u16string& path, FileKind kind) {
    FileReferences result;
    result.kind = kind;
    if (kind == FileKind::Materials) {
        result.status = loadMaterials(path, result.reason, [&](const MaterialPtr& material) {
            collectMaterialReferences(material, result.references);
        });
    } else {
        result.status = loadOptions(path, result.reason, [&](const AllOptions& options, int) {
            collectOptionsReferences(options, result.references);
        });
    }
    if (result.status != FileStatus::Document) result.references.clear();
    return result;
}

// ---- finding the files --------------------------------------------------------------

bool resolveReference(const std::u16string& stored, PathUse use, const std::string& libraryFolder,
                      const std::vector<std::string>& searchFolders, std::string& found) {
    found.clear();
    const std::string path = utf8(stored);
    if (path.empty()) return false;
    const bool absolute = isNativeAbsolute(path) || isWindowsAbsolute(path) || path[0] == '/';
    if (isNativeAbsolute(path) && existsAs(path, use)) return found = path, true;
    if (!absolute) return findIn(path, use, libraryFolder, searchFolders, found);
    return findIn(fileNameOf(path), use, libraryFolder, searchFolders, found);
}

std::size_t checkReferences(std::vector<FileReference>& references, const std::string& libraryFolder,
                            const std::vector<std::string>& searchFolders) {
    std::size_t missing = 0;
    for (FileReference& ref : references) {
        ref.found = false;
        ref.foundPath.clear();
        if (ref.use == PathUse::Written) continue;
        ref.found = resolveReference(ref.path, ref.use, libraryFolder, searchFolders, ref.foundPath);
        if (!ref.found) ++missing;
    }
    return missing;
}

// ---- lines and JSON -----------------------------------------------------------------

std::string jsonText(const std::u16string& text) { return jsonText(utf8(text)); }

std::string listingLine(const MaterialSummary& m) {
    return lineText(m.name) + "\t" + m.className + "\t" + lineText(m.uuid) + "\t" +
           std::to_string(m.textures) + (m.textures == 1 ? " texture\t" : " textures\t") + m.shape;
}

std::string listingLine(const OptionsSummary& o) {
    return "version " + std::to_string(o.recordVersion) + "\tcamera type " + std::to_string(o.cameraType) +
           "\tphysical camera " + (o.physicalCameraOn ? "on" : "off") + ", type " +
           std::to_string(o.physicalCameraType);
}

std::string listingJson(const MaterialSummary& m) {
    return "{\"name\": " + jsonText(m.name) + ", \"class\": " + jsonText(m.className) +
           ", \"uuid\": " + jsonText(m.uuid) + ", \"textures\": " + std::to_string(m.textures) +
           ", \"shape\": " + jsonText(m.shape) + "}";
}

std::string listingJson(const OptionsSummary& o) {
    return "{\"version\": " + std::to_string(o.recordVersion) + ", \"camera_type\": " +
           std::to_string(o.cameraType) + ", \"physical_camera\": " + (o.physicalCameraOn ? "true" : "false") +
           ", \"physical_camera_type\": " + std::to_string(o.physicalCameraType) + "}";
}

std::string referenceLine(const FileReference& r, FileKind kind) {
    const std::string status = r.use == PathUse::Written ? "written by the renderer"
                               : r.found                 ? lineText(r.foundPath)
                                                         : "missing";
    const std::string tail = "\t" + lineText(r.path) + "\t" + status;
    if (kind == FileKind::Options) return lineText(r.where) + tail;
    return lineText(r.material) + tail + "\t" + lineText(r.where);
}

std::string referenceJson(const FileReference& r) {
    const char* status = r.use == PathUse::Written ? "written" : r.found ? "found" : "missing";
    return "{\"material\": " + (r.material.empty() ? std::string("null") : jsonText(r.material)) +
           ", \"where\": " + jsonText(r.where) + ", \"path\": " + jsonText(r.path) + ", \"use\": \"" +
           useWord(r.use) + "\", \"status\": \"" + status +
           "\", \"found\": " + (r.found ? jsonText(r.foundPath) : std::string("null")) + "}";
}

}  // namespace OrvaneLumoCore
