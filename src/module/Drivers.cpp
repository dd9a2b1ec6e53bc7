// The two conversion drivers: a file that loads becomes a document, any other
// file comes back as its text. The text goes to a sink as it is made.
#include "materials/MaterialAssets.h"
#include "module/Extension.h"
#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "module/TextFallback.h"
#include "options/AllOptions.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

namespace {

void writeFileText(const std::u16string& path, XmlSink& sink) {
    const std::u16string text = readFileAsText(path);
    if (!text.empty()) sink.flush(text.data(), text.size());
}

}  // namespace

std::vector<RemappedPath> writeMaterialsDocument(const OrvMatFile& file, XmlSink& sink,
                                                 const XmlOptions& xml) {
    AssetXmlWriter writer(sink, xml);
    writer.openRoot(u"orvmat");
    for (std::size_t i = 0; i < file.getMaterialCount(); ++i) {
        MaterialPtr material;
        file.getMaterial(i, material);
        writeMaterialAssets(writer, material);
    }
    writer.closeRoot();
    return writer.remappedPaths();
}

std::vector<RemappedPath> writeOptionsDocument(AllOptions& options, XmlSink& sink,
                                               const XmlOptions& xml) {
    AssetXmlWriter writer(sink, xml);
    writer.openRoot(u"orvopt");
    options.writeXml(writer, std::u16string());
    writer.closeRoot();
    return writer.remappedPaths();
}

void writeMaterialDocument(const std::u16string& path, XmlSink& sink) {
    OrvMatFile file;
    if (file.load(path))
        writeMaterialsDocument(file, sink);
    else
        writeFileText(path, sink);
}

void writeOptionsDocument(const std::u16string& path, XmlSink& sink) {
    OrvOptFile file;
    AllOptions options;
    if (file.load(options, path))
        writeOptionsDocument(options, sink);
    else
        writeFileText(path, sink);
}

std::u16string OrvMatFile::documentXml() const {
    std::u16string result;
    StringSink sink(result);
    writeMaterialsDocument(*this, sink);
    return result;
}

std::u16string OrvOptFile::documentXml(AllOptions& options) {
    std::u16string result;
    StringSink sink(result);
    writeOptionsDocument(options, sink);
    return result;
}

std::u16string OrvMatFile::getXml(std::u16string path) {
    std::u16string result;
    StringSink sink(result);
    writeMaterialDocument(path, sink);
    return result;
}

std::u16string OrvOptFile::getXml(std::u16string path) {
    std::u16string result;
    StringSink sink(result);
    writeOptionsDocument(path, sink);
    return result;
}

}  // namespace OrvaneLumoCore
