#pragma once
#include <string>
#include <vector>

#include "xml/XmlOptions.h"

class XmlSink;

namespace OrvaneLumoCore {

class AllOptions;
class OrvMatFile;

// True if the text behind the last "." of the whole path (directory
// separators included) equals `first` or `second`, ignoring case.
bool hasExtension(const std::u16string& path, const std::u16string& first,
                  const std::u16string& second);

// The two conversions as the module calls them: the extension test, then the
// file's document. `ok` is false when the extension is refused.
std::u16string convertMaterialPath(const std::u16string& path, bool& ok);
std::u16string convertOptionsPath(const std::u16string& path, bool& ok);

// The same into a sink of the caller: the document (or the text of a file
// that doesn't load) goes to `sink` in pieces, in order, and is complete
// when the call returns. False, with nothing written, when the extension is
// refused.
bool convertMaterialPath(const std::u16string& path, XmlSink& sink);
bool convertOptionsPath(const std::u16string& path, XmlSink& sink);

// The drivers behind them, without the extension test.
void writeMaterialDocument(const std::u16string& path, XmlSink& sink);
void writeOptionsDocument(const std::u16string& path, XmlSink& sink);

// The document of what is loaded already, written with `xml`'s options.
// Returns the file paths that the options' rules rewrote (see
// AssetXmlWriter::remappedPaths).
std::vector<RemappedPath> writeMaterialsDocument(const OrvMatFile& file, XmlSink& sink,
                                                 const XmlOptions& xml = XmlOptions());
std::vector<RemappedPath> writeOptionsDocument(AllOptions& options, XmlSink& sink,
                                               const XmlOptions& xml = XmlOptions());

}  // namespace OrvaneLumoCore
