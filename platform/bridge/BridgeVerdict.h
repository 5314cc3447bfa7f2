#pragma once
// What the bridge component decides and why: whether the conversion engine would convert a data file
// with a template, found by running the engine's readers on it without showing anything.
#include "platform/system/Types.h"

namespace bridge {

struct Request {
    CString bridgeName;
    CString parameters; // "TemplateFilePath=..."
    CString dataFile;
    bool folderScan = false;
};

struct Verdict {
    bool accepted = false;
    CString reason; // empty when accepted
};

// The template path of a parameter string, empty when it names none.
CString TemplatePathOf(const CString& parameters);

// Judges the request; never throws.
Verdict Judge(const Request& request);

} // namespace bridge
