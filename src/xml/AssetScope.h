#pragma once
// One Asset of one plugin around its parameters:
//
//   <Asset url=... type=... layout=...>     openAsset
//     <plugin name=... type=...>            openPlugin (same type as the Asset)
//       <parameters>                        openParameters
//         ... the body ...
//       </parameters>                       closeParameters
//     </plugin>                             closePlugin
//   </Asset>                                closeAsset
//
// writeAsset runs the body between the two halves. Code whose body is spread
// over several calls (a frame that writes children's Assets first) uses
// openPluginAsset and closePluginAsset. Nothing closes on leaving a scope:
// the writer may throw (allocation failure), and a destructor must not write
// then.
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

inline void openPluginAsset(AssetXmlWriter& w, const WriterText& url, const WriterText& type,
                            const WriterText& plugin, const WriterText& layout = u"") {
    w.openAsset(url, type, layout);
    w.openPlugin(plugin, type);
    w.openParameters();
}

inline void closePluginAsset(AssetXmlWriter& w) {
    w.closeParameters();
    w.closePlugin();
    w.closeAsset();
}

template <class Body>
void writeAsset(AssetXmlWriter& w, const WriterText& url, const WriterText& type, const WriterText& plugin,
                Body body) {
    openPluginAsset(w, url, type, plugin);
    body();
    closePluginAsset(w);
}

}  // namespace OrvaneLumoCore
