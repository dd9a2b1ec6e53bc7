#pragma once
// Writes the result document: a root element, Assets groups, Assets with one
// plugin each, and parameters of a fixed set of forms. The text goes straight
// into a wide string, with the writer's own indentation of two blanks a level.
#include <cstddef>
#include <cstdint>
#include <map>
#include <string>

#include <boost/any.hpp>

#include "persistence/Types.h"

namespace OrvaneLumoCore {
class TransformComponents;
}

// A text argument of the writer: wide, or narrow (UTF-8, else the ANSI code
// page, like every narrow text of the system). Holds a view, no copy.
class WriterText {
public:
    WriterText() = default;
    WriterText(const char* s);
    WriterText(const std::string& s) : narrow_(s.data()), size_(s.size()) {}
    WriterText(const char16_t* s);
    WriterText(const std::u16string& s) : wide_(s.data()), size_(s.size()) {}

    bool empty() const { return size_ == 0; }
    void appendTo(std::u16string& out) const;

private:
    const char* narrow_ = nullptr;
    const char16_t* wide_ = nullptr;
    std::size_t size_ = 0;
};

// Undoes earlier escapes when `normalize` is set, then escapes "&", "<" and
// ">" (in that order). Quotation marks and apostrophes stay as they are.
std::u16string escapeXml(const std::u16string& text, bool normalize = true);

class AssetXmlWriter {
public:
    // `out` is the result text; it must outlive the writer.
    explicit AssetXmlWriter(std::u16string& out);

    // Map from a sun's id to the url of the Asset it was written under.
    std::map<std::u16string, std::u16string> sunRegistry;

    // ---- structure ----
    void openRoot(const WriterText& name);
    void closeRoot();
    void openAssets();
    void closeAssets();
    void openAsset(const WriterText& url, const WriterText& type, const WriterText& layout);
    void closeAsset();
    void openPlugin(const WriterText& name, const WriterText& type);
    void closePlugin();
    void openParameters();
    void closeParameters();

    // ---- parameters ----
    void writeFloat(const WriterText& name, float value, const WriterText& label = {},
                    bool isUserData = false);
    void writeInteger(const WriterText& name, std::int32_t value, const WriterText& label = {},
                      bool isUserData = false);
    void writeBool(const WriterText& name, bool value, const WriterText& label = {},
                   bool isUserData = false);
    void writeString(const WriterText& name, const WriterText& value, const WriterText& label = {},
                     bool isUserData = false);
    void writeFileName(const WriterText& name, const std::u16string& value,
                       const WriterText& label = {}, bool isUserData = false);
    void writeVector(const WriterText& name, const OrvaneLumoCore::Vector& value,
                     const WriterText& label = {});
    void writeColor(const WriterText& name, const OrvaneLumoCore::Color& value,
                    const WriterText& label = {});
    void writeAColor(const WriterText& name, const OrvaneLumoCore::AColor& value,
                     const WriterText& label = {});
    void writeMatrix(const WriterText& name, const OrvaneLumoCore::Matrix& value,
                     const WriterText& label = {});
    void writeTransform(const WriterText& name, const OrvaneLumoCore::Transform& value,
                        const WriterText& label = {});
    void writeComponentMatrix(const WriterText& name,
                              const OrvaneLumoCore::TransformComponents& components,
                              const WriterText& label = {});
    void writeComponentTransform(const WriterText& name,
                                 const OrvaneLumoCore::TransformComponents& components,
                                 const WriterText& label = {});
    void writePlugin(const WriterText& name, const WriterText& text, const WriterText& label = {});
    // `reference` holds a boost::shared_ptr of BaseTexture, BaseMaterial,
    // BaseUVW, BaseCamera, BaseBitmap or BaseLight; `url` is the child's slot url.
    void writePluginRef(const WriterText& name, boost::any reference, const std::u16string& url,
                        const WriterText& label = {});
    void openList(const WriterText& name, const WriterText& listType, const WriterText& label = {});
    void writeListEntry(const std::u16string& text);
    void writeStringEntry(const WriterText& text);
    void closeList();

    // ---- building blocks ----
    void openParameter(const WriterText& name, const WriterText& type, const WriterText& label,
                       const WriterText& listType, bool isUserData, const WriterText& handler);
    void closeParameter();
    void openValue();
    void closeValue();
    void openInlineValue();
    void closeInlineValue();
    void writeRaw(const WriterText& text);
    void increaseIndent() { ++indent_; }
    void decreaseIndent() { --indent_; }

    int getIndent() const { return indent_; }

private:
    void indentation();
    void writeNumber(double value);
    void vectorBlock(const OrvaneLumoCore::Vector& v);
    void componentLines(const OrvaneLumoCore::TransformComponents& c);
    void componentParameter(const WriterText& name, const WriterText& type,
                            const OrvaneLumoCore::TransformComponents& components,
                            const WriterText& label);

    std::u16string& out_;
    int indent_ = 0;
    std::u16string rootName_;
};
