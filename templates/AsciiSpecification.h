#pragma once
// The template of a delimited ASCII text file, stored as an "ASCIITSBridgeSpecification" XML file.
#include "templates/Specification.h"

#include <string_view>

class CAsciiSpecification : public CSpecification {
public:
    // Writes the template file; 0 with LastError() set when nothing could be written.
    int Save(const CString& path) override;
    // Reads the template file; on failure returns 0, sets LastError() and changes nothing.
    int Load(const CString& path) override;
    // Reads the bytes of a template file as if they had been read from `path`.
    int LoadFromMemory(std::string_view bytes, const CString& path);
};
