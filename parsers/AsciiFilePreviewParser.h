#pragma once
// Reads a delimited text file through an ASCII template: item names, types, units and value types
// from the header rows or the template, and the stamps and values of the first data lines.
#include "parsers/FilePreviewParser.h"
#include "templates/Specification.h"

class CFieldCursor;

class CAsciiFilePreviewParser : public CGeneralFileParser {
public:
    // Data lines a parse reads after the header lines; raw lines ReadRawLines gives.
    static constexpr int kPreviewLines = 20;
    // The bytes of a line the "Input file" list shows; the rest of a longer line is read past.
    static constexpr size_t kShownLineBytes = 64 * 1024;
    // Data cells a parse holds at most: a file with very many columns shows fewer data lines, so no
    // file can make the preview hold more than this and one line.
    static constexpr size_t kPreviewCells = 1000000;

    // Reads the bound file; `path` is not used.
    int Parse(const CString& path) override;
    int GetItemNames(CStringList& names) override;
    int GetItemTypes(CStringList& types) override;
    int GetUnits(CStringList& units) override;
    int GetValueTypes(CStringList& valueTypes) override;
    int GetItemCount(int& count) override;
    int ReadRawLines(const CString& path) override;

    // Line `n` (from 1) of the bound file, the empty text beyond its end. 0 when the file does not
    // exist or `n` is negative. Throws CFileException when the file exists but cannot be read.
    int ReadLine(int n, CString& text);

private:
    // The text a field is compared with to be stored empty; `active` is false when none applies.
    struct DeleteValue {
        bool active = false;
        CString text;
        bool Matches(const CString& field) const;
    };

    // The metadata rows a parse begins with: how each is read and where the template says it stands.
    struct MetadataRow {
        int (CAsciiFilePreviewParser::*get)(CStringList&);
        const char* what;
        int CDataDescription::*option;
        int CDataDescription::*row;
    };

    // False, with the reason recorded, when there is no template or the bound file does not exist.
    bool HasTemplateAndFile();
    int FailOnOption(const char* what, int option);
    CString ReadLineOrEmpty(int n);
    // Line `n` into `line`; false after message `emptyMessageId` when it is missing or empty.
    bool ReadHeaderLine(int n, int emptyMessageId, CString& line);
    DeleteValue DetermineDeleteValue();
    // The item fields of the data start line or the item name line (its fields minus the date/time
    // fields); false with a message when the line has no delimiter.
    bool CountItemFields(const CString& line, long number, bool isDataLine, int& items);
    int TakeHeaderFields(const CString& line, int count, CStringList& fields);
    bool IsKnownItemType(const CString& text) const;
    bool AppendMetadataRow(const MetadataRow& kind);
    bool ReadColumnCountAndNames(const DeleteValue& deleteValue, int& columns);
    bool ReadNamesFromLine(const CString& nameLine, int columns, const DeleteValue& deleteValue);
    bool ReadHeaderAndDataLines(int columns, const DeleteValue& deleteValue);
    // Data line `number` of the file into a row of m_vecRows; false after a message.
    bool ParseDataLine(const CString& line, long number, int columns, const DeleteValue& deleteValue);
    bool TakeDateTime(CFieldCursor& cursor, long number, ui::Row& row, int& column);
};
