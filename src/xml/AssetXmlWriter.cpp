#include "xml/AssetXmlWriter.h"

#include <cstring>

#include "animation/BaseCamera.h"
#include "animation/TransformComponents.h"
#include "lights/BaseLight.h"
#include "materials/BaseMaterial.h"
#include "persistence/QuickArchive.h"
#include "platform/NumberFormat.h"
#include "textures/BaseBitmap.h"
#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"

using namespace OrvaneLumoCore;

// ---- WriterText --------------------------------------------------------------

WriterText::WriterText(const char* s) : narrow_(s), size_(s ? std::strlen(s) : 0) {}

WriterText::WriterText(const char16_t* s) : wide_(s) {
    if (s)
        while (s[size_]) ++size_;
}

void WriterText::appendTo(std::u16string& out) const {
    if (wide_) {
        out.append(wide_, size_);
        return;
    }
    // Narrow text: plain ASCII widens unit by unit; anything else goes
    // through the system's conversion (UTF-8, else the ANSI code page).
    for (std::size_t i = 0; i < size_; ++i) {
        if (static_cast<unsigned char>(narrow_[i]) >= 0x80) {
            out += utf8ToWide(narrow_, size_);
            return;
        }
    }
    for (std::size_t i = 0; i < size_; ++i) out.push_back(static_cast<char16_t>(narrow_[i]));
}

// ---- escapeXml ---------------------------------------------------------------

namespace {

// One pass from left to right; the search goes on behind the inserted text.
void replaceAll(std::u16string& s, const std::u16string& from, const std::u16string& to) {
    std::size_t pos = s.find(from);
    while (pos != std::u16string::npos) {
        s.replace(pos, from.size(), to);
        pos = s.find(from, pos + to.size());
    }
}

}  // namespace

std::u16string escapeXml(const std::u16string& text, bool normalize) {
    if (text.find_first_of(u"&<>") == std::u16string::npos) return text;
    std::u16string s = text;
    if (normalize) {
        replaceAll(s, u"&lt;", u"<");
        replaceAll(s, u"&gt;", u">");
        replaceAll(s, u"&amp;", u"&");
    }
    replaceAll(s, u"&", u"&amp;");
    replaceAll(s, u"<", u"&lt;");
    replaceAll(s, u">", u"&gt;");
    return s;
}

// ---- structure -----------------------------------------------------------------

AssetXmlWriter::AssetXmlWriter(std::u16string& out) : out_(out) {}

void AssetXmlWriter::indentation() { out_.append(static_cast<std::size_t>(indent_ > 0 ? indent_ : 0) * 2, u' '); }

void AssetXmlWriter::openRoot(const WriterText& name) {
    rootName_.clear();
    name.appendTo(rootName_);
    out_ += u"<";
    out_ += rootName_;
    out_ += u">\n";
}

void AssetXmlWriter::closeRoot() {
    out_ += u"</";
    out_ += rootName_;
    out_ += u">\n";
}

void AssetXmlWriter::openAssets() {
    ++indent_;
    indentation();
    out_ += u"<Assets>\n";
}

void AssetXmlWriter::closeAssets() {
    indentation();
    out_ += u"</Assets>\n";
    --indent_;
}

void AssetXmlWriter::openAsset(const WriterText& url, const WriterText& type, const WriterText& layout) {
    ++indent_;
    indentation();
    out_ += u"<Asset layout=\"";
    layout.appendTo(out_);
    out_ += u"\" renderer=\"lumo\" type=\"";
    type.appendTo(out_);
    out_ += u"\" url=\"";
    std::u16string u;
    url.appendTo(u);
    out_ += escapeXml(u);
    out_ += u"\" >\n";
}

void AssetXmlWriter::closeAsset() {
    indentation();
    out_ += u"</Asset>\n";
    --indent_;
}

void AssetXmlWriter::openPlugin(const WriterText& name, const WriterText& type) {
    ++indent_;
    indentation();
    out_ += u"<plugin>\n";
    ++indent_;
    indentation();
    out_ += u"<lumoplugin name=\"";
    name.appendTo(out_);
    out_ += u"\" type=\"";
    type.appendTo(out_);
    out_ += u"\">\n";
}

void AssetXmlWriter::closePlugin() {
    indentation();
    out_ += u"</lumoplugin>\n";
    --indent_;
    indentation();
    out_ += u"</plugin>\n";
    --indent_;
}

void AssetXmlWriter::openParameters() {
    ++indent_;
    indentation();
    out_ += u"<parameters>\n";
    ++indent_;
}

void AssetXmlWriter::closeParameters() {
    --indent_;
    indentation();
    out_ += u"</parameters>\n";
    --indent_;
}

// ---- building blocks -------------------------------------------------------------

void AssetXmlWriter::openParameter(const WriterText& name, const WriterText& type,
                                   const WriterText& label, const WriterText& listType,
                                   bool isUserData, const WriterText& handler) {
    indentation();
    out_ += u"<parameter type=\"";
    type.appendTo(out_);
    out_ += u"\" name=\"";
    name.appendTo(out_);
    out_ += u"\" handler=\"";
    handler.appendTo(out_);
    out_ += u"\" listType=\"";
    listType.appendTo(out_);
    out_ += u"\"";
    if (isUserData) out_ += u" isUserData=\"1\"";
    out_ += u" label=\"";
    (label.empty() ? name : label).appendTo(out_);
    out_ += u"\">\n";
    ++indent_;
}

void AssetXmlWriter::closeParameter() {
    --indent_;
    indentation();
    out_ += u"</parameter>\n";
}

void AssetXmlWriter::openValue() {
    indentation();
    out_ += u"<value>\n";
}

void AssetXmlWriter::closeValue() {
    indentation();
    out_ += u"</value>\n";
}

void AssetXmlWriter::openInlineValue() {
    indentation();
    out_ += u"<value>";
}

void AssetXmlWriter::closeInlineValue() { out_ += u"</value>\n"; }

void AssetXmlWriter::writeRaw(const WriterText& text) { text.appendTo(out_); }

void AssetXmlWriter::writeNumber(double value) { platform::appendFloat(out_, value); }

// ---- parameters ------------------------------------------------------------------

void AssetXmlWriter::writeFloat(const WriterText& name, float value, const WriterText& label,
                                bool isUserData) {
    openParameter(name, "float", label, "none", isUserData, "default");
    openInlineValue();
    writeNumber(value);
    closeInlineValue();
    closeParameter();
}

void AssetXmlWriter::writeInteger(const WriterText& name, std::int32_t value,
                                  const WriterText& label, bool isUserData) {
    openParameter(name, "integer", label, "none", isUserData, "default");
    openInlineValue();
    platform::appendInt(out_, value);
    closeInlineValue();
    closeParameter();
}

void AssetXmlWriter::writeBool(const WriterText& name, bool value, const WriterText& label,
                               bool isUserData) {
    openParameter(name, "bool", label, "none", isUserData, "default");
    openInlineValue();
    out_.push_back(value ? u'1' : u'0');
    closeInlineValue();
    closeParameter();
}

void AssetXmlWriter::writeString(const WriterText& name, const WriterText& value,
                                 const WriterText& label, bool isUserData) {
    openParameter(name, "string", label, "none", isUserData, "default");
    openInlineValue();
    value.appendTo(out_);
    closeInlineValue();
    closeParameter();
}

void AssetXmlWriter::writeFileName(const WriterText& name, const std::u16string& value,
                                   const WriterText& label, bool isUserData) {
    openParameter(name, "string", label, "none", isUserData, "FileBrowserHandler");
    openInlineValue();
    out_ += escapeXml(value);
    closeInlineValue();
    closeParameter();
}

void AssetXmlWriter::vectorBlock(const Vector& v) {
    indentation();
    out_ += u"<vector>\n";
    ++indent_;
    static const char16_t* const kTags[3][2] = {{u"<x>", u"</x>\n"}, {u"<y>", u"</y>\n"},
                                                {u"<z>", u"</z>\n"}};
    for (int i = 0; i < 3; ++i) {
        indentation();
        out_ += kTags[i][0];
        writeNumber(v[i]);
        out_ += kTags[i][1];
    }
    --indent_;
    indentation();
    out_ += u"</vector>\n";
}

void AssetXmlWriter::writeVector(const WriterText& name, const Vector& value, const WriterText& label) {
    openParameter(name, "vector", label, "none", false, "default");
    openValue();
    ++indent_;
    vectorBlock(value);
    --indent_;
    closeValue();
    closeParameter();
}

namespace {
struct NamedNumber {
    const char16_t* open;
    const char16_t* close;
};
}  // namespace

void AssetXmlWriter::writeColor(const WriterText& name, const Color& value, const WriterText& label) {
    openParameter(name, "color", label, "none", false, "default");
    openValue();
    ++indent_;
    const NamedNumber tags[3] = {{u"<r>", u"</r>\n"}, {u"<g>", u"</g>\n"}, {u"<b>", u"</b>\n"}};
    const float values[3] = {value.r, value.g, value.b};
    for (int i = 0; i < 3; ++i) {
        indentation();
        out_ += tags[i].open;
        writeNumber(values[i]);
        out_ += tags[i].close;
    }
    --indent_;
    closeValue();
    closeParameter();
}

void AssetXmlWriter::writeAColor(const WriterText& name, const AColor& value, const WriterText& label) {
    openParameter(name, "acolor", label, "none", false, "default");
    openValue();
    ++indent_;
    const NamedNumber tags[4] = {
        {u"<r>", u"</r>\n"}, {u"<g>", u"</g>\n"}, {u"<b>", u"</b>\n"}, {u"<a>", u"</a>\n"}};
    const float values[4] = {value.r, value.g, value.b, value.a};
    for (int i = 0; i < 4; ++i) {
        indentation();
        out_ += tags[i].open;
        writeNumber(values[i]);
        out_ += tags[i].close;
    }
    --indent_;
    closeValue();
    closeParameter();
}

void AssetXmlWriter::writeMatrix(const WriterText& name, const Matrix& value, const WriterText& label) {
    openParameter(name, "matrix", label, "none", false, "default");
    openValue();
    ++indent_;
    out_ += u"\n";
    indentation();
    out_ += u"<matrix>\n";
    ++indent_;
    for (const Vector& v : value.m) vectorBlock(v);
    --indent_;
    indentation();
    out_ += u"</matrix>\n";
    --indent_;
    closeValue();
    closeParameter();
}

void AssetXmlWriter::writeTransform(const WriterText& name, const Transform& value,
                                    const WriterText& label) {
    openParameter(name, "transform", label, "none", false, "default");
    openValue();
    ++indent_;
    for (const Vector& v : value.m.m) vectorBlock(v);
    vectorBlock(value.offs);
    --indent_;
    closeValue();
    closeParameter();
}

void AssetXmlWriter::componentLines(const TransformComponents& c) {
    static const NamedNumber kFloats[9] = {
        {u"<x_rotation>", u"</x_rotation>\n"}, {u"<y_rotation>", u"</y_rotation>\n"},
        {u"<z_rotation>", u"</z_rotation>\n"}, {u"<x_scale>", u"</x_scale>\n"},
        {u"<y_scale>", u"</y_scale>\n"},       {u"<z_scale>", u"</z_scale>\n"},
        {u"<x_offset>", u"</x_offset>\n"},     {u"<y_offset>", u"</y_offset>\n"},
        {u"<z_offset>", u"</z_offset>\n"}};
    static const NamedNumber kMirrors[3] = {{u"<x_mirror>", u"</x_mirror>\n"},
                                            {u"<y_mirror>", u"</y_mirror>\n"},
                                            {u"<z_mirror>", u"</z_mirror>\n"}};
    const Vector* groups[3] = {&c.rotation, &c.scale, &c.offset};
    for (int i = 0; i < 9; ++i) {
        indentation();
        out_ += kFloats[i].open;
        writeNumber((*groups[i / 3])[i % 3]);
        out_ += kFloats[i].close;
    }
    for (int i = 0; i < 3; ++i) {
        indentation();
        out_ += kMirrors[i].open;
        platform::appendInt(out_, c.mirror[i]);
        out_ += kMirrors[i].close;
    }
}

void AssetXmlWriter::componentParameter(const WriterText& name, const WriterText& type,
                                        const TransformComponents& components,
                                        const WriterText& label) {
    openParameter(name, type, label, "none", false, "default");
    openValue();
    ++indent_;
    componentLines(components);
    --indent_;
    closeValue();
    closeParameter();
}

void AssetXmlWriter::writeComponentMatrix(const WriterText& name, const TransformComponents& components,
                                          const WriterText& label) {
    componentParameter(name, "componentMatrix", components, label);
}

void AssetXmlWriter::writeComponentTransform(const WriterText& name,
                                             const TransformComponents& components,
                                             const WriterText& label) {
    componentParameter(name, "componentTransform", components, label);
}

void AssetXmlWriter::writePlugin(const WriterText& name, const WriterText& text, const WriterText& label) {
    openParameter(name, "plugin", label, "none", false, "default");
    openInlineValue();
    text.appendTo(out_);
    closeInlineValue();
    closeParameter();
}

namespace {

// The text that refers to the held object's Asset, or false for a null
// pointer (and for a type outside the six roots, which no caller passes).
bool referenceText(const boost::any& reference, const std::u16string& url, std::u16string& text) {
    text = escapeXml(url);
    if (auto p = boost::any_cast<boost::shared_ptr<BaseTexture>>(&reference)) {
        if (!*p) return false;
        text += u"/" + (*p)->getPluginName();
    } else if (auto p = boost::any_cast<boost::shared_ptr<BaseMaterial>>(&reference)) {
        if (!*p) return false;
        text += u"/" + (*p)->name;
    } else if (auto p = boost::any_cast<boost::shared_ptr<BaseUVW>>(&reference)) {
        if (!*p) return false;
        text += u"/" + (*p)->getPluginName();
    } else if (auto p = boost::any_cast<boost::shared_ptr<BaseCamera>>(&reference)) {
        if (!*p) return false;
        text += u"/" + (*p)->getPluginName();
    } else if (auto p = boost::any_cast<boost::shared_ptr<BaseBitmap>>(&reference)) {
        if (!*p) return false;
        text += u"/" + (*p)->getPluginName();
    } else if (auto p = boost::any_cast<boost::shared_ptr<BaseLight>>(&reference)) {
        if (!*p) return false;
        // A sun's Asset stands under the url itself.
        if ((*p)->getType() != BaseLight::kSunLightType) text += u"/" + (*p)->getPluginName();
    } else {
        return false;
    }
    return true;
}

}  // namespace

void AssetXmlWriter::writePluginRef(const WriterText& name, boost::any reference,
                                    const std::u16string& url, const WriterText& label) {
    openParameter(name, "plugin", label, "none", false, "default");
    std::u16string text;
    if (referenceText(reference, url, text)) {
        openInlineValue();
        out_ += text;
        closeInlineValue();
    }
    closeParameter();
}

void AssetXmlWriter::openList(const WriterText& name, const WriterText& listType, const WriterText& label) {
    openParameter(name, "list", label, listType, false, "default");
    openValue();
    indentation();
    out_ += u"<list>\n";
    ++indent_;
}

void AssetXmlWriter::writeListEntry(const std::u16string& text) {
    indentation();
    out_ += u"<entry>";
    out_ += escapeXml(text);
    out_ += u"</entry>\n";
}

void AssetXmlWriter::writeStringEntry(const WriterText& text) {
    indentation();
    out_ += u"<string>\"";
    text.appendTo(out_);
    out_ += u"\"</string>\n";
}

void AssetXmlWriter::closeList() {
    --indent_;
    indentation();
    out_ += u"</list>\n";
    closeValue();
    closeParameter();
}
