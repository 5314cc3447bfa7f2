#pragma once
// The gate every template file passes before its values are read: expat, a conforming XML parser,
// decides whether the document is well-formed, so a damaged or hand-broken file never loads half
// right. pugixml, which is lenient on purpose, only builds the tree afterwards.
#include "platform/system/Status.h"

#include <string_view>

namespace tmplfile {

// Ok when `utf8` is a well-formed XML 1.0 document without a document type declaration. The text
// is taken as UTF-8 whatever encoding its declaration names (the caller has decoded it). A failure
// says what is wrong and where ("... at line L, column C"); the caller names the file.
sys::Status CheckWellFormedXml(std::string_view utf8);

} // namespace tmplfile
