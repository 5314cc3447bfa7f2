#pragma once
// Reads an rbx0 file through the rbx data-file calls: the file describes itself, so no template is
// needed. Every time step becomes a row of the result table, stamped from the file's time axis.
#include "parsers/FilePreviewParser.h"

#include <memory>

class COpenRbxFile;

class CRbxPreviewFileParser : public CFilePreviewParser {
public:
    CRbxPreviewFileParser(); // prepares the rbx data-file library

    // Reads `path` itself (not the bound file) and binds the parser to it on success.
    int Parse(const CString& path) override;
    int GetItemNames(CStringList& names) override;
    int GetItemTypes(CStringList& types) override;
    int GetUnits(CStringList& units) override;
    // Leaves the list empty; succeeds when the file can be read and every item is scalar.
    int GetValueTypes(CStringList& valueTypes) override;
    // The count comes from the file's own header, so the argument is left as it is.
    int GetItemCount(int& count) override;

private:
    enum class ItemText { Type, Unit, None };
    // The bound file opened through the library; null, with the reason recorded, when it cannot be.
    std::unique_ptr<COpenRbxFile> OpenBoundFile();
    // Reads every item's type or unit text into `texts`; 0 when the file cannot be read or an item
    // is not scalar.
    int ReadItemTexts(ItemText which, CStringList& texts);
};
