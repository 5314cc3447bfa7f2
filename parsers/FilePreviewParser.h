#pragma once
// The preview parsers' common base: the result table, file binding, item selection and preview.
#include "platform/system/Types.h"
#include "platform/ui/UserInterface.h"

class CSpecification;

class CFilePreviewParser {
public:
    CFilePreviewParser() = default;
    virtual ~CFilePreviewParser() = default;
    CFilePreviewParser(const CFilePreviewParser&) = delete;
    CFilePreviewParser& operator=(const CFilePreviewParser&) = delete;

    virtual int Parse(const CString& path) = 0;
    virtual int GetItemNames(CStringList& names) = 0;
    virtual int GetItemTypes(CStringList& types) = 0;
    virtual int GetUnits(CStringList& units) = 0;
    virtual int GetValueTypes(CStringList& valueTypes) = 0;
    virtual int GetItemCount(int& count) = 0;
    // Shows the preview dialog of the last result; 0 when there is nothing to show.
    virtual int ShowPreview(const CString& title);
    // Binds the parser to a data file.
    virtual void SetFile(const CString& path);

    // The selection the preview applies: the parser's own, else the template's, else none.
    CUIntArray EffectiveSelection() const;
    ui::Rows BuildPreviewRows() const;
    CStringList BuildPreviewTitles() const;

    CString m_strFile;
    CString m_strFileTitle;
    // Why the last operation failed, naming the file and, where one is concerned, its line
    // ("file:line: reason"); whether or not a message box said so. ParseGuarded empties it first.
    CString m_strFailure;
    CSpecification* m_pSpecification = nullptr; // not owned
    CUIntArray m_arrItems;
    CStringList m_vecItemNames;
    ui::Rows m_vecRawLines;
    ui::Rows m_vecRows;

protected:
    // Records why `file` cannot be read (at `line` when above 0) and returns 0.
    int Fail(const CString& file, long line, const CString& reason);
    // Shows string `stringId` in a message box, as parsers report a file they cannot read, records it
    // as the reason about the bound file, and returns 0.
    int Refuse(int stringId, long line = 0);
};

// Parsers that read a file through a template.
class CGeneralFileParser : public CFilePreviewParser {
public:
    // Fills the raw lines from the start of `path` (or the bound file) without the template.
    virtual int ReadRawLines(const CString& path) = 0;
};
