#pragma once
// The template of an Excel worksheet, stored as an "MSExcelTSBridgeSpecification" XML file.
#include "templates/Specification.h"

#include <string_view>

class CExcelSpecification : public CSpecification {
public:
    // Writes the template file; 0 with LastError() set when nothing could be written.
    int Save(const CString& path) override;
    // Reads the template file; on failure returns 0, sets LastError() and changes nothing.
    int Load(const CString& path) override;
    // Reads the bytes of a template file as if they had been read from `path`.
    int LoadFromMemory(std::string_view bytes, const CString& path);
    // Excel date/time values may span cells joined by "|" in the format, when its use flag is set.
    int CountFormatColumns(int byOption) const override;
};
