#pragma once
// Writes the result document: a root element, Assets groups, Assets with one
// plugin each, and parameters of a fixed set of forms, with the writer's own
// indentation of two blanks a level. The text is made once: fragments go
// into a small buffer of the writer, and the buffer goes to a sink.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "values/Types.h"
#include "xml/XmlOptions.h"
#include "xml/XmlSink.h"

class OrvaneXMLSerializable;

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
    friend class AssetXmlWriter;

    const char* narrow_ = nullptr;
    const char16_t* wide_ = nullptr;
    std::size_t size_ = 0;
};

// Undoes earlier escapes when `normalize` is set, then escapes "&", "<" and
// ">" (in that order). Quotation marks and apostrophes stay as they are.
// One pass: runs of plain text are copied at once.
std::u16string escapeXml(const std::u16string& text, bool normalize = true);

class AssetXmlWriter {
public:
    // `out` is the result text; it must outlive the writer. The text is
    // appended as each call returns, so `out` is complete between calls.
    explicit AssetXmlWriter(std::u16string& out,
                            const OrvaneLumoCore::XmlOptions& options = OrvaneLumoCore::XmlOptions());
    // The text goes to `sink` whenever the buffer is full, at closeRoot and at
    // flush; `sink` must outlive the writer.
    explicit AssetXmlWriter(XmlSink& sink,
                            const OrvaneLumoCore::XmlOptions& options = OrvaneLumoCore::XmlOptions());
    AssetXmlWriter(const AssetXmlWriter&) = delete;
    AssetXmlWriter& operator=(const AssetXmlWriter&) = delete;

    // Hands what the buffer holds to the sink.
    void flush();

    // Map from a sun's id to the url of the Asset it was written under.
    std::map<std::u16string, std::u16string> sunRegistry;

    // The file paths that the options' rules rewrote, each stored text once,
    // in the order of their first appearance.
    const std::vector<OrvaneLumoCore::RemappedPath>& remappedPaths() const { return remapped_; }

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
    void writeComponentMatrix(const WriterText& name, const OrvaneLumoCore::TransformParts& components,
                              const WriterText& label = {});
    void writeComponentTransform(const WriterText& name, const OrvaneLumoCore::TransformParts& components,
                                 const WriterText& label = {});
    void writePlugin(const WriterText& name, const WriterText& text, const WriterText& label = {});
    // A reference to the model object `reference` (a texture, material, UVW
    // generator, camera, bitmap or light) under its slot url `url`: the url,
    // "/" and the object's referenceName. No value if `reference` is null.
    void writePluginRef(const WriterText& name, const OrvaneXMLSerializable* reference,
                        const std::u16string& url, const WriterText& label = {});
    // The same for a texture in a slot, whose url is `slotPrefix` followed by
    // `slotWord`: no url string is made per parameter.
    void writeTextureRef(const WriterText& name, const OrvaneXMLSerializable* texture,
                         const std::u16string& slotPrefix, const char16_t* slotWord);
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

    // Units the writer buffers before it hands them to its sink.
    static constexpr std::size_t kBufferUnits = 4096;

    // A fixed word of the vocabulary, with its length known when compiled.
    struct Word {
        template <std::size_t N>
        constexpr Word(const char16_t (&s)[N]) : text(s), size(N - 1) {}
        const char16_t* text;
        std::size_t size;
    };

private:
    // ---- the buffer
    void put(const char16_t* text, std::size_t size) {
        if (static_cast<std::size_t>(end_ - pos_) < size) return putLong(text, size);
        copyUnits(pos_, text, size);
        pos_ += size;
    }
    // Copies `size` units in moves of 16 bytes, the last one overlapping the
    // one before, rather than through a call of memmove: most pieces are a
    // few dozen units.
    static void copyUnits(char16_t* __restrict out, const char16_t* __restrict text, std::size_t size) {
        if (size >= 8) {
            for (std::size_t i = 0; i + 8 < size; i += 8) std::memcpy(out + i, text + i, 16);
            std::memcpy(out + size - 8, text + size - 8, 16);
        } else if (size >= 4) {
            std::memcpy(out, text, 8);
            std::memcpy(out + size - 4, text + size - 4, 8);
        } else if (size >= 2) {
            std::memcpy(out, text, 4);
            std::memcpy(out + size - 2, text + size - 2, 4);
        } else if (size == 1) {
            *out = *text;
        }
    }
    void put(Word w) { put(w.text, w.size); }
    void putText(const WriterText& text);
    void put(char16_t c) {
        if (pos_ == end_) flushBuffer();
        *pos_++ = c;
    }
    void putLong(const char16_t* text, std::size_t size);

    // Where a text stands: between tags, or in an attribute value in '"'.
    enum class Place { Content, Attribute };
    // A text that the long-standing document writes as it stands (names,
    // labels, string values); in well-formed mode escaped for its place.
    void putPlain(const WriterText& text, Place place) {
        if (wellFormed_) return putEscaped(text, place);
        putText(text);
    }
    void putPlain(const std::u16string& text, Place place) {
        if (wellFormed_) return putEscaped(text.data(), text.size(), place);
        put(text.data(), text.size());
    }
    // A text that the long-standing document escapes, leaving what looks
    // escaped already alone (urls, file names, list entries); in well-formed
    // mode escaped for its place, every "&" included.
    void putEscaped(const char16_t* text, std::size_t size, Place place);
    void putEscaped(const WriterText& text, Place place);
    // `lead` (the text up to an attribute value), then the value as plain text.
    void attribute(Word lead, const WriterText& value) {
        put(lead);
        putPlain(value, Place::Attribute);
    }
    // Room for `size` (at most kBufferUnits) units at pos_.
    char16_t* room(std::size_t size) {
        if (static_cast<std::size_t>(end_ - pos_) < size) flushBuffer();
        return pos_;
    }
    void flushBuffer();
    // The end of a public call: a writer over a string brings it up to date.
    void done() {
        if (writeThrough_) flushBuffer();
    }

    // ---- pieces of the text
    void indentation();
    void line(Word w) {
        indentation();
        put(w);
    }
    // The line that ends a public call.
    void lastLine(Word w) {
        line(w);
        done();
    }
    void writeNumber(double value);
    void writeInt(std::int64_t value);
    void numberLine(Word open, double value, Word close);
    void head(Word open, const WriterText& name, Word middle, bool isUserData, const WriterText& label);
    void headEnd(bool isUserData, const WriterText& name, const WriterText& label);
    void inlineEnd();
    void pluginRef(const WriterText& name, const WriterText& label, const OrvaneXMLSerializable* reference,
                   const std::u16string& url, const WriterText& urlTail);
    void blockStart();
    void blockEnd();
    void vectorBlock(const OrvaneLumoCore::Vector& v);
    // A color parameter (r, g, b) or, with `alpha`, an acolor one (and a).
    void colorParameter(Word open, const WriterText& name, const OrvaneLumoCore::AColor& value, bool alpha,
                        const WriterText& label);
    void componentParameter(Word open, const WriterText& name,
                            const OrvaneLumoCore::TransformParts& components, const WriterText& label);

    // The sink of a writer over a string.
    struct OwnString final : XmlSink {
        std::u16string* out;
        void flush(const char16_t* text, std::size_t size) override { out->append(text, size); }
    };

    OwnString ownSink_;
    XmlSink& sink_;
    const bool writeThrough_;
    const bool wellFormed_;
    const OrvaneLumoCore::PathRules pathRules_;
    std::vector<OrvaneLumoCore::RemappedPath> remapped_;
    std::set<std::u16string> remappedFrom_;
    int indent_ = 0;
    std::u16string rootName_;
    char16_t* pos_;
    char16_t* end_;
    char16_t buffer_[kBufferUnits];
};
