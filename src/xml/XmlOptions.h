#pragma once
// How a document's texts are written: as the writer has always written them,
// or escaped for XML throughout; and the rules that rewrite stored file paths.
#include "xml/PathRemap.h"

namespace OrvaneLumoCore {

struct XmlOptions {
    // Off: the long-standing text, byte for byte. On: every text in element
    // content has "&", "<" and ">" escaped, every text in an attribute value
    // "&", "<", ">" and '"' as well, "&" always (text that looks escaped
    // already is not left alone), so that a parser gives back exactly the
    // model's text. A CR (and in attribute values a tab or LF) is written as
    // a character reference, which a parser keeps as it is. Characters that
    // XML 1.0 does not allow (C0 controls other than tab, LF and CR, U+FFFE,
    // U+FFFF, lone surrogates) are written as U+FFFD. A document without any
    // of these characters is the same in both modes.
    bool wellFormed = false;
    // Applied to every stored file path the document shows (see remapPath).
    PathRules pathRules;
};

}  // namespace OrvaneLumoCore
