#include "xml/AssetXmlWriter.h"

#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include "persistence/Serializable.h"
#include "platform/NumberFormat.h"
#include "platform/Text.h"

using namespace OrvaneLumoCore;

// ---- WriterText --------------------------------------------------------------

WriterText::WriterText(const char* s) : narrow_(s), size_(s ? std::strlen(s) : 0) {}

WriterText::WriterText(const char16_t* s) : wide_(s) {
    if (s)
        while (s[size_]) ++size_;
}

namespace {

// Widens plain ASCII into `out`; false (with `out` partly written) if the
// text has a byte beyond ASCII.
bool widenAscii(const char* text, std::size_t size, char16_t* out) {
#if defined(__SSE2__)
    // Eight bytes at a time, the last eight overlapping the ones before.
    if (size >= 8) {
        const __m128i zero = _mm_setzero_si128();
        __m128i any = zero;
        const auto eight = [&](std::size_t i) {
            const __m128i v = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(text + i));
            any = _mm_or_si128(any, v);
            _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), _mm_unpacklo_epi8(v, zero));
        };
        for (std::size_t i = 0; i + 8 < size; i += 8) eight(i);
        eight(size - 8);
        return _mm_movemask_epi8(any) == 0;
    }
#endif
    unsigned char any = 0;
    for (std::size_t i = 0; i < size; ++i) {
        const unsigned char c = static_cast<unsigned char>(text[i]);
        any |= c;
        out[i] = c;
    }
    return any < 0x80;
}

}  // namespace

void WriterText::appendTo(std::u16string& out) const {
    if (wide_) {
        out.append(wide_, size_);
        return;
    }
    // Narrow text: plain ASCII widens unit by unit; anything else goes
    // through the system's conversion (UTF-8, else the ANSI code page).
    const std::size_t old = out.size();
    out.resize(old + size_);
    if (!widenAscii(narrow_, size_, &out[old])) {
        out.resize(old);
        out += platform::utf8ToWide(narrow_, size_);
    }
}

// ---- escapeXml ---------------------------------------------------------------

namespace {

// The length of the escape "&lt;", "&gt;" or "&amp;" at `p`, or 0.
std::size_t entityAt(const char16_t* p, const char16_t* end) {
    const std::size_t left = static_cast<std::size_t>(end - p);
    if (left >= 4 && (p[1] == u'l' || p[1] == u'g') && p[2] == u't' && p[3] == u';') return 4;
    if (left >= 5 && p[1] == u'a' && p[2] == u'm' && p[3] == u'p' && p[4] == u';') return 5;
    return 0;
}

// What stands in the text for the unit at p: `size` units of `text` in place
// of `units` units; with no text the units stay in the run.
struct Escape {
    const char16_t* text = nullptr;
    std::size_t size = 0;
    std::size_t units = 1;
};

// Calls put(text, size) for the text with each unit that `plain` refuses
// replaced as escapeAt(p, end) says: each run of units at once, then an escape.
template <class Plain, class EscapeAt, class Put>
void putRuns(const char16_t* text, std::size_t size, Plain plain, EscapeAt escapeAt, Put put) {
    const char16_t* const end = text + size;
    const char16_t* run = text;
    for (const char16_t* p = text; p != end;) {
        if (plain(*p)) {
            ++p;
            continue;
        }
        const Escape e = escapeAt(p, end);
        if (e.text) {
            put(run, static_cast<std::size_t>(p - run));
            put(e.text, e.size);
            run = p + e.units;
        }
        p += e.units;
    }
    put(run, static_cast<std::size_t>(end - run));
}

// Calls put(text, size) for the escaped text: each run of plain units at
// once, then an escape. Undoing the three escapes and escaping again, as
// `normalize` asks, leaves an escape that is there unchanged, so such an
// escape is copied as it stands and only a bare "&" becomes "&amp;".
template <class Put>
void escapeRuns(const char16_t* text, std::size_t size, bool normalize, Put put) {
    const auto plain = [](char16_t c) { return c > u'>' || (c != u'&' && c != u'<' && c != u'>'); };
    putRuns(text, size, plain, [normalize](const char16_t* p, const char16_t* end) -> Escape {
        if (*p == u'<') return {u"&lt;", 4};
        if (*p == u'>') return {u"&gt;", 4};
        if (const std::size_t entity = normalize ? entityAt(p, end) : 0) return {p, entity, entity};
        return {u"&amp;", 5};
    }, put);
}

}  // namespace

std::u16string escapeXml(const std::u16string& text, bool normalize) {
    std::u16string out;
    out.reserve(text.size());
    escapeRuns(text.data(), text.size(), normalize,
               [&out](const char16_t* s, std::size_t n) { out.append(s, n); });
    return out;
}

// ---- well-formed text ----------------------------------------------------------

namespace {

bool isHighSurrogate(char16_t c) { return c >= 0xD800 && c <= 0xDBFF; }
bool isLowSurrogate(char16_t c) { return c >= 0xDC00 && c <= 0xDFFF; }

// Calls put(text, size) for the text as well-formed XML has it in its place,
// each run of plain units at once: the marks as entities, every "&" included;
// a CR (and in an attribute a tab or LF, which a parser would turn into
// blanks) as a character reference; a unit that XML 1.0 doesn't allow (a C0
// control, U+FFFE, U+FFFF, a surrogate without its other half) as U+FFFD.
template <class Put>
void escapeWellFormedRuns(const char16_t* text, std::size_t size, bool attribute, Put put) {
    // The bulk of any text: blank to U+D7FF, other than the four marks.
    const auto plain = [](char16_t c) {
        return c >= u' ' && c < 0xD800 && c != u'&' && c != u'<' && c != u'>' && c != u'"';
    };
    putRuns(text, size, plain, [attribute](const char16_t* p, const char16_t* end) -> Escape {
        const char16_t c = *p;
        switch (c) {
        case u'&': return {u"&amp;", 5};
        case u'<': return {u"&lt;", 4};
        case u'>': return {u"&gt;", 4};
        case u'"': return attribute ? Escape{u"&quot;", 6} : Escape{};
        case u'\t': return attribute ? Escape{u"&#9;", 4} : Escape{};
        case u'\n': return attribute ? Escape{u"&#10;", 5} : Escape{};
        case u'\r': return {u"&#13;", 5};
        default: break;
        }
        if (c >= 0xE000 && c < 0xFFFE) return {};
        if (isHighSurrogate(c) && p + 1 != end && isLowSurrogate(p[1])) return {nullptr, 0, 2};  // a pair
        return {u"\uFFFD", 1};
    }, put);
}

}  // namespace

// ---- the buffer ----------------------------------------------------------------

AssetXmlWriter::AssetXmlWriter(std::u16string& out, const XmlOptions& options)
    : sink_(ownSink_),
      writeThrough_(true),
      wellFormed_(options.wellFormed),
      pathRules_(options.pathRules),
      pos_(buffer_),
      end_(buffer_ + kBufferUnits) {
    ownSink_.out = &out;
}

AssetXmlWriter::AssetXmlWriter(XmlSink& sink, const XmlOptions& options)
    : sink_(sink),
      writeThrough_(false),
      wellFormed_(options.wellFormed),
      pathRules_(options.pathRules),
      pos_(buffer_),
      end_(buffer_ + kBufferUnits) {
    ownSink_.out = nullptr;
}

void AssetXmlWriter::flushBuffer() {
    if (pos_ == buffer_) return;
    const std::size_t size = static_cast<std::size_t>(pos_ - buffer_);
    // Emptied first: after a sink that throws, the writer holds nothing.
    pos_ = buffer_;
    sink_.flush(buffer_, size);
}

void AssetXmlWriter::flush() { flushBuffer(); }

void AssetXmlWriter::putLong(const char16_t* text, std::size_t size) {
    flushBuffer();
    if (size >= kBufferUnits / 2) {
        sink_.flush(text, size);
        return;
    }
    std::copy(text, text + size, pos_);
    pos_ += size;
}

void AssetXmlWriter::putText(const WriterText& text) {
    if (text.wide_) return put(text.wide_, text.size_);
    if (text.size_ <= kBufferUnits && widenAscii(text.narrow_, text.size_, room(text.size_))) {
        pos_ += text.size_;
        return;
    }
    const std::u16string wide = platform::utf8ToWide(text.narrow_, text.size_);
    put(wide.data(), wide.size());
}

void AssetXmlWriter::putEscaped(const char16_t* text, std::size_t size, Place place) {
    const auto out = [this](const char16_t* s, std::size_t n) { put(s, n); };
    if (wellFormed_)
        escapeWellFormedRuns(text, size, place == Place::Attribute, out);
    else
        escapeRuns(text, size, true, out);
}

void AssetXmlWriter::putEscaped(const WriterText& text, Place place) {
    if (text.wide_) return putEscaped(text.wide_, text.size_, place);
    // Most narrow texts are short ASCII words of the vocabulary: widened on
    // the stack rather than into a string of their own.
    char16_t local[128];
    if (text.size_ <= sizeof local / sizeof local[0] && widenAscii(text.narrow_, text.size_, local))
        return putEscaped(local, text.size_, place);
    std::u16string wide;
    text.appendTo(wide);
    putEscaped(wide.data(), wide.size(), place);
}

namespace {
// Enough blanks for 64 levels at once.
const char16_t kBlanks[] =
    u"                                                                "
    u"                                                                ";
const std::size_t kBlankCount = sizeof kBlanks / sizeof kBlanks[0] - 1;
}  // namespace

void AssetXmlWriter::indentation() {
    std::size_t n = static_cast<std::size_t>(indent_ > 0 ? indent_ : 0) * 2;
    for (; n > kBlankCount; n -= kBlankCount) put(kBlanks, kBlankCount);
    put(kBlanks, n);
}

void AssetXmlWriter::writeNumber(double value) {
    pos_ += platform::formatFloat(room(platform::kMaxFloatText), value);
}

void AssetXmlWriter::writeInt(std::int64_t value) {
    pos_ += platform::formatInt(room(platform::kMaxIntText), value);
}

void AssetXmlWriter::numberLine(Word open, double value, Word close) {
    indentation();
    put(open);
    writeNumber(value);
    put(close);
}

// ---- structure -----------------------------------------------------------------

void AssetXmlWriter::openRoot(const WriterText& name) {
    rootName_.clear();
    name.appendTo(rootName_);
    put(u'<');
    put(rootName_.data(), rootName_.size());
    put(u">\n");
    done();
}

void AssetXmlWriter::closeRoot() {
    put(u"</");
    put(rootName_.data(), rootName_.size());
    put(u">\n");
    flushBuffer();
}

void AssetXmlWriter::openAssets() {
    ++indent_;
    lastLine(u"<Assets>\n");
}

void AssetXmlWriter::closeAssets() {
    line(u"</Assets>\n");
    --indent_;
    done();
}

void AssetXmlWriter::openAsset(const WriterText& url, const WriterText& type, const WriterText& layout) {
    ++indent_;
    indentation();
    attribute(u"<Asset layout=\"", layout);
    attribute(u"\" renderer=\"lumo\" type=\"", type);
    put(u"\" url=\"");
    putEscaped(url, Place::Attribute);
    put(u"\" >\n");
    done();
}

void AssetXmlWriter::closeAsset() {
    line(u"</Asset>\n");
    --indent_;
    done();
}

void AssetXmlWriter::openPlugin(const WriterText& name, const WriterText& type) {
    ++indent_;
    line(u"<plugin>\n");
    ++indent_;
    indentation();
    attribute(u"<lumoplugin name=\"", name);
    attribute(u"\" type=\"", type);
    put(u"\">\n");
    done();
}

void AssetXmlWriter::closePlugin() {
    line(u"</lumoplugin>\n");
    --indent_;
    line(u"</plugin>\n");
    --indent_;
    done();
}

void AssetXmlWriter::openParameters() {
    ++indent_;
    line(u"<parameters>\n");
    ++indent_;
    done();
}

void AssetXmlWriter::closeParameters() {
    --indent_;
    line(u"</parameters>\n");
    --indent_;
    done();
}

// ---- building blocks -------------------------------------------------------------

// The parameter head of the fixed forms: `open` holds the text up to the
// name, `middle` the handler and list type.
void AssetXmlWriter::head(Word open, const WriterText& name, Word middle, bool isUserData,
                          const WriterText& label) {
    indentation();
    attribute(open, name);
    put(middle);
    headEnd(isUserData, name, label);
}

// The end of a parameter's head: the user-data mark, the label (the name
// when there is none) and the ">"; the parameter's content is indented.
void AssetXmlWriter::headEnd(bool isUserData, const WriterText& name, const WriterText& label) {
    if (isUserData) put(u" isUserData=\"1\"");
    attribute(u" label=\"", label.empty() ? name : label);
    put(u"\">\n");
    ++indent_;
}

void AssetXmlWriter::openParameter(const WriterText& name, const WriterText& type,
                                   const WriterText& label, const WriterText& listType,
                                   bool isUserData, const WriterText& handler) {
    indentation();
    attribute(u"<parameter type=\"", type);
    attribute(u"\" name=\"", name);
    attribute(u"\" handler=\"", handler);
    attribute(u"\" listType=\"", listType);
    put(u'"');
    headEnd(isUserData, name, label);
    done();
}

void AssetXmlWriter::closeParameter() {
    --indent_;
    lastLine(u"</parameter>\n");
}

void AssetXmlWriter::openValue() { lastLine(u"<value>\n"); }

void AssetXmlWriter::closeValue() { lastLine(u"</value>\n"); }

void AssetXmlWriter::openInlineValue() { lastLine(u"<value>"); }

void AssetXmlWriter::closeInlineValue() {
    put(u"</value>\n");
    done();
}

void AssetXmlWriter::writeRaw(const WriterText& text) {
    putText(text);
    done();
}

// "</value>", the end of the parameter.
void AssetXmlWriter::inlineEnd() {
    put(u"</value>\n");
    closeParameter();
}

// "<value>" on a line of its own, the content a level deeper.
void AssetXmlWriter::blockStart() {
    line(u"<value>\n");
    ++indent_;
}

void AssetXmlWriter::blockEnd() {
    --indent_;
    line(u"</value>\n");
    closeParameter();
}

// ---- parameters ------------------------------------------------------------------

namespace {
const char16_t kPlainMiddle[] = u"\" handler=\"default\" listType=\"none\"";
}  // namespace

void AssetXmlWriter::writeFloat(const WriterText& name, float value, const WriterText& label,
                                bool isUserData) {
    head(u"<parameter type=\"float\" name=\"", name, kPlainMiddle, isUserData, label);
    line(u"<value>");
    writeNumber(value);
    inlineEnd();
}

void AssetXmlWriter::writeInteger(const WriterText& name, std::int32_t value,
                                  const WriterText& label, bool isUserData) {
    head(u"<parameter type=\"integer\" name=\"", name, kPlainMiddle, isUserData, label);
    line(u"<value>");
    writeInt(value);
    inlineEnd();
}

void AssetXmlWriter::writeBool(const WriterText& name, bool value, const WriterText& label,
                               bool isUserData) {
    head(u"<parameter type=\"bool\" name=\"", name, kPlainMiddle, isUserData, label);
    line(u"<value>");
    put(value ? u'1' : u'0');
    inlineEnd();
}

void AssetXmlWriter::writeString(const WriterText& name, const WriterText& value,
                                 const WriterText& label, bool isUserData) {
    head(u"<parameter type=\"string\" name=\"", name, kPlainMiddle, isUserData, label);
    line(u"<value>");
    putPlain(value, Place::Content);
    inlineEnd();
}

void AssetXmlWriter::writeFileName(const WriterText& name, const std::u16string& value,
                                   const WriterText& label, bool isUserData) {
    head(u"<parameter type=\"string\" name=\"", name,
         u"\" handler=\"FileBrowserHandler\" listType=\"none\"", isUserData, label);
    line(u"<value>");
    std::u16string remapped;
    if (!pathRules_.empty() && remapPath(pathRules_, value, remapped)) {
        if (remappedFrom_.insert(value).second) remapped_.push_back({value, remapped});
        putEscaped(remapped.data(), remapped.size(), Place::Content);
    } else {
        putEscaped(value.data(), value.size(), Place::Content);
    }
    inlineEnd();
}

void AssetXmlWriter::vectorBlock(const Vector& v) {
    line(u"<vector>\n");
    ++indent_;
    numberLine(u"<x>", v.x, u"</x>\n");
    numberLine(u"<y>", v.y, u"</y>\n");
    numberLine(u"<z>", v.z, u"</z>\n");
    --indent_;
    line(u"</vector>\n");
}

void AssetXmlWriter::writeVector(const WriterText& name, const Vector& value, const WriterText& label) {
    head(u"<parameter type=\"vector\" name=\"", name, kPlainMiddle, false, label);
    blockStart();
    vectorBlock(value);
    blockEnd();
}

void AssetXmlWriter::colorParameter(Word open, const WriterText& name, const AColor& value, bool alpha,
                                    const WriterText& label) {
    head(open, name, kPlainMiddle, false, label);
    blockStart();
    numberLine(u"<r>", value.r, u"</r>\n");
    numberLine(u"<g>", value.g, u"</g>\n");
    numberLine(u"<b>", value.b, u"</b>\n");
    if (alpha) numberLine(u"<a>", value.a, u"</a>\n");
    blockEnd();
}

void AssetXmlWriter::writeColor(const WriterText& name, const Color& value, const WriterText& label) {
    colorParameter(u"<parameter type=\"color\" name=\"", name, AColor(value.r, value.g, value.b, 1), false, label);
}

void AssetXmlWriter::writeAColor(const WriterText& name, const AColor& value, const WriterText& label) {
    colorParameter(u"<parameter type=\"acolor\" name=\"", name, value, true, label);
}

void AssetXmlWriter::writeMatrix(const WriterText& name, const Matrix& value, const WriterText& label) {
    head(u"<parameter type=\"matrix\" name=\"", name, kPlainMiddle, false, label);
    blockStart();
    put(u'\n');
    line(u"<matrix>\n");
    ++indent_;
    for (const Vector& v : value.m) vectorBlock(v);
    --indent_;
    line(u"</matrix>\n");
    blockEnd();
}

void AssetXmlWriter::writeTransform(const WriterText& name, const Transform& value,
                                    const WriterText& label) {
    head(u"<parameter type=\"transform\" name=\"", name, kPlainMiddle, false, label);
    blockStart();
    for (const Vector& v : value.m.m) vectorBlock(v);
    vectorBlock(value.offs);
    blockEnd();
}

void AssetXmlWriter::componentParameter(Word open, const WriterText& name,
                                        const TransformParts& c, const WriterText& label) {
    head(open, name, kPlainMiddle, false, label);
    blockStart();
    numberLine(u"<x_rotation>", c.rotation.x, u"</x_rotation>\n");
    numberLine(u"<y_rotation>", c.rotation.y, u"</y_rotation>\n");
    numberLine(u"<z_rotation>", c.rotation.z, u"</z_rotation>\n");
    numberLine(u"<x_scale>", c.scale.x, u"</x_scale>\n");
    numberLine(u"<y_scale>", c.scale.y, u"</y_scale>\n");
    numberLine(u"<z_scale>", c.scale.z, u"</z_scale>\n");
    numberLine(u"<x_offset>", c.offset.x, u"</x_offset>\n");
    numberLine(u"<y_offset>", c.offset.y, u"</y_offset>\n");
    numberLine(u"<z_offset>", c.offset.z, u"</z_offset>\n");
    const Word mirrors[3][2] = {{u"<x_mirror>", u"</x_mirror>\n"},
                                {u"<y_mirror>", u"</y_mirror>\n"},
                                {u"<z_mirror>", u"</z_mirror>\n"}};
    for (int i = 0; i < 3; ++i) {
        indentation();
        put(mirrors[i][0]);
        writeInt(c.mirror[i]);
        put(mirrors[i][1]);
    }
    blockEnd();
}

void AssetXmlWriter::writeComponentMatrix(const WriterText& name, const TransformParts& components,
                                          const WriterText& label) {
    componentParameter(u"<parameter type=\"componentMatrix\" name=\"", name, components, label);
}

void AssetXmlWriter::writeComponentTransform(const WriterText& name,
                                             const TransformParts& components,
                                             const WriterText& label) {
    componentParameter(u"<parameter type=\"componentTransform\" name=\"", name, components, label);
}

void AssetXmlWriter::writePlugin(const WriterText& name, const WriterText& text, const WriterText& label) {
    head(u"<parameter type=\"plugin\" name=\"", name, kPlainMiddle, false, label);
    line(u"<value>");
    putPlain(text, Place::Content);
    inlineEnd();
}

// A plugin parameter whose value is the url, `url` and `urlTail`, then "/"
// and the reference's name unless its Asset stands under the url itself; no
// value when `reference` is null.
void AssetXmlWriter::pluginRef(const WriterText& name, const WriterText& label,
                               const OrvaneXMLSerializable* reference, const std::u16string& url,
                               const WriterText& urlTail) {
    head(u"<parameter type=\"plugin\" name=\"", name, kPlainMiddle, false, label);
    if (reference) {
        std::u16string scratch;
        const std::u16string* child = reference->referenceName(scratch);
        line(u"<value>");
        putEscaped(url.data(), url.size(), Place::Content);
        // The tail is a slot word, plain letters, so escaping the two parts
        // one after the other gives what escaping the whole url gives.
        if (!urlTail.empty()) putEscaped(urlTail, Place::Content);
        if (child) {
            put(u'/');
            putPlain(*child, Place::Content);
        }
        put(u"</value>\n");
    }
    closeParameter();
}

void AssetXmlWriter::writePluginRef(const WriterText& name, const OrvaneXMLSerializable* reference,
                                    const std::u16string& url, const WriterText& label) {
    pluginRef(name, label, reference, url, WriterText());
}

void AssetXmlWriter::writeTextureRef(const WriterText& name, const OrvaneXMLSerializable* texture,
                                     const std::u16string& slotPrefix, const char16_t* slotWord) {
    pluginRef(name, WriterText(), texture, slotPrefix, slotWord);
}

void AssetXmlWriter::openList(const WriterText& name, const WriterText& listType, const WriterText& label) {
    openParameter(name, "list", label, listType, false, "default");
    line(u"<value>\n");
    line(u"<list>\n");
    ++indent_;
    done();
}

void AssetXmlWriter::writeListEntry(const std::u16string& text) {
    line(u"<entry>");
    putEscaped(text.data(), text.size(), Place::Content);
    put(u"</entry>\n");
    done();
}

void AssetXmlWriter::writeStringEntry(const WriterText& text) {
    line(u"<string>\"");
    putPlain(text, Place::Content);
    put(u"\"</string>\n");
    done();
}

void AssetXmlWriter::closeList() {
    --indent_;
    line(u"</list>\n");
    line(u"</value>\n");
    closeParameter();
}
