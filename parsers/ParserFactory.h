#pragma once
// The working objects of an input format: the template object (none for rbx0, whose files describe
// themselves) and the preview parser. Formats by the setup's numbers (sys::FileFormat); a preview
// reader for a new format is added here and nowhere else.
#include "parsers/FilePreviewParser.h"
#include "templates/Specification.h"

#include <memory>

// A template object with the defaults; null for rbx0 and for formats without a reader here.
std::unique_ptr<CSpecification> MakeSpecification(int format);
// The parser of the format, not yet bound to a file or template; null for an unknown format.
std::unique_ptr<CFilePreviewParser> MakeParser(int format);
// True when `parser` is of the class MakeParser makes for `format`; false for null.
bool IsParserOfFormat(const CFilePreviewParser* parser, int format);

// Parse as the setup record runs it: an exception the parser lets through (a file that exists but
// cannot be read) makes the parse fail with 0. After a failure the parser's m_strFailure names the
// file and the reason, whatever ended the parse; after a success it is empty. `threw`, when given,
// tells whether an exception ended it.
int ParseGuarded(CFilePreviewParser& parser, const CString& path, bool* threw = nullptr);
