#include "formats/xlsx/XlsxParts.h"

#include "platform/system/Text.h"

#include <ctime>

namespace sheet::package {

namespace {

constexpr const char* kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\" standalone=\"yes\"?>\n";
constexpr const char* kMainNamespace = "http://schemas.openxmlformats.org/spreadsheetml/2006/main";
constexpr const char* kRelationshipNamespace = "http://schemas.openxmlformats.org/officeDocument/2006/relationships";

void AppendAscii(std::string& out, char c)
{
    switch (c) {
    case '&': out += "&amp;"; break;
    case '<': out += "&lt;"; break;
    case '>': out += "&gt;"; break;
    case '"': out += "&quot;"; break;
    case '\'': out += "&apos;"; break;
    case '\t':
    case '\n': out += c; break;
    default: out += static_cast<unsigned char>(c) < 0x20 ? ' ' : c; break;
    }
}

bool NeedsPreservedSpace(const std::string& text)
{
    auto blank = [](char c) { return c == ' ' || c == '\t' || c == '\n'; };
    return !text.empty() && (blank(text.front()) || blank(text.back()));
}

std::string NowW3c()
{
    const std::time_t now = std::time(nullptr);
    std::tm utc{};
    gmtime_r(&now, &utc);
    char text[32];
    std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &utc);
    return text;
}

} // namespace

std::string XmlText(std::string_view text)
{
    if (!text::IsUtf8(text))
        return XmlText(text::ToUtf8(text));
    std::string out;
    out.reserve(text.size());
    const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
    for (size_t i = 0; i < text.size();) {
        if (bytes[i] < 0x80) {
            AppendAscii(out, text[i++]);
            continue;
        }
        const size_t length = text::Utf8SequenceLength(text, i);
        const bool nonCharacter = length == 3 && bytes[i] == 0xEF && bytes[i + 1] == 0xBF && bytes[i + 2] >= 0xBE;
        if (nonCharacter)
            out += ' '; // U+FFFE and U+FFFF are not XML characters
        else
            out.append(text.substr(i, length));
        i += length;
    }
    return out;
}

std::string ColumnName(unsigned column)
{
    std::string name;
    for (; column > 0; column = (column - 1) / 26)
        name.insert(name.begin(), static_cast<char>('A' + (column - 1) % 26));
    return name;
}

std::string ContentTypes()
{
    const std::string sheetml = "application/vnd.openxmlformats-officedocument.spreadsheetml.";
    return std::string(kDeclaration) +
           "<Types xmlns=\"http://schemas.openxmlformats.org/package/2006/content-types\">"
           "<Default Extension=\"rels\" ContentType=\"application/vnd.openxmlformats-package.relationships+xml\"/>"
           "<Default Extension=\"xml\" ContentType=\"application/xml\"/>"
           "<Override PartName=\"/xl/workbook.xml\" ContentType=\"" + sheetml + "sheet.main+xml\"/>"
           "<Override PartName=\"/xl/worksheets/sheet1.xml\" ContentType=\"" + sheetml + "worksheet+xml\"/>"
           "<Override PartName=\"/xl/styles.xml\" ContentType=\"" + sheetml + "styles+xml\"/>"
           "<Override PartName=\"/xl/sharedStrings.xml\" ContentType=\"" + sheetml + "sharedStrings+xml\"/>"
           "<Override PartName=\"/docProps/core.xml\" ContentType=\"application/vnd.openxmlformats-package.core-properties+xml\"/>"
           "<Override PartName=\"/docProps/app.xml\" ContentType=\"application/vnd.openxmlformats-officedocument.extended-properties+xml\"/>"
           "</Types>";
}

std::string PackageRelationships()
{
    return std::string(kDeclaration) +
           "<Relationships xmlns=\"http://schemas.openxmlformats.org/package/2006/relationships\">"
           "<Relationship Id=\"rId1\" Type=\"" + kRelationshipNamespace + "/officeDocument\" Target=\"xl/workbook.xml\"/>"
           "<Relationship Id=\"rId2\" Type=\"http://schemas.openxmlformats.org/package/2006/relationships/metadata/core-properties\" Target=\"docProps/core.xml\"/>"
           "<Relationship Id=\"rId3\" Type=\"" + kRelationshipNamespace + "/extended-properties\" Target=\"docProps/app.xml\"/>"
           "</Relationships>";
}

std::string CoreProperties(const std::string& title)
{
    std::string xml = std::string(kDeclaration) +
                      "<cp:coreProperties"
                      " xmlns:cp=\"http://schemas.openxmlformats.org/package/2006/metadata/core-properties\""
                      " xmlns:dc=\"http://purl.org/dc/elements/1.1/\" xmlns:dcterms=\"http://purl.org/dc/terms/\""
                      " xmlns:dcmitype=\"http://purl.org/dc/dcmitype/\""
                      " xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\">";
    if (!title.empty())
        xml += "<dc:title>" + XmlText(title) + "</dc:title>";
    xml += "<dc:creator>Velmora</dc:creator>"
           "<dcterms:created xsi:type=\"dcterms:W3CDTF\">" + NowW3c() + "</dcterms:created>"
           "</cp:coreProperties>";
    return xml;
}

std::string AppProperties()
{
    return std::string(kDeclaration) +
           "<Properties xmlns=\"http://schemas.openxmlformats.org/officeDocument/2006/extended-properties\">"
           "<Application>Velmora</Application></Properties>";
}

std::string Workbook(std::string_view sheetName)
{
    return std::string(kDeclaration) + "<workbook xmlns=\"" + kMainNamespace + "\" xmlns:r=\"" +
           kRelationshipNamespace + "\">"
           "<bookViews><workbookView/></bookViews>"
           "<sheets><sheet name=\"" + XmlText(sheetName) + "\" sheetId=\"1\" r:id=\"rId1\"/></sheets>"
           "</workbook>";
}

std::string WorkbookRelationships()
{
    const std::string type = std::string(kRelationshipNamespace) + "/";
    return std::string(kDeclaration) +
           "<Relationships xmlns=\"http://schemas.openxmlformats.org/package/2006/relationships\">"
           "<Relationship Id=\"rId1\" Type=\"" + type + "worksheet\" Target=\"worksheets/sheet1.xml\"/>"
           "<Relationship Id=\"rId2\" Type=\"" + type + "styles\" Target=\"styles.xml\"/>"
           "<Relationship Id=\"rId3\" Type=\"" + type + "sharedStrings\" Target=\"sharedStrings.xml\"/>"
           "</Relationships>";
}

std::string Styles(std::string_view dateFormat)
{
    return std::string(kDeclaration) + "<styleSheet xmlns=\"" + kMainNamespace + "\">"
           "<numFmts count=\"1\"><numFmt numFmtId=\"164\" formatCode=\"" + XmlText(dateFormat) + "\"/></numFmts>"
           "<fonts count=\"1\"><font><sz val=\"11\"/><name val=\"Calibri\"/><family val=\"2\"/></font></fonts>"
           "<fills count=\"2\"><fill><patternFill patternType=\"none\"/></fill>"
           "<fill><patternFill patternType=\"gray125\"/></fill></fills>"
           "<borders count=\"1\"><border><left/><right/><top/><bottom/><diagonal/></border></borders>"
           "<cellStyleXfs count=\"1\"><xf numFmtId=\"0\" fontId=\"0\" fillId=\"0\" borderId=\"0\"/></cellStyleXfs>"
           "<cellXfs count=\"2\"><xf numFmtId=\"0\" fontId=\"0\" fillId=\"0\" borderId=\"0\" xfId=\"0\"/>"
           "<xf numFmtId=\"164\" fontId=\"0\" fillId=\"0\" borderId=\"0\" xfId=\"0\" applyNumberFormat=\"1\"/></cellXfs>"
           "<cellStyles count=\"1\"><cellStyle name=\"Normal\" xfId=\"0\" builtinId=\"0\"/></cellStyles>"
           "</styleSheet>";
}

std::string SharedStrings(const std::vector<std::string>& strings, size_t references)
{
    std::string xml = std::string(kDeclaration) + "<sst xmlns=\"" + kMainNamespace + "\" count=\"" +
                      std::to_string(references) + "\" uniqueCount=\"" + std::to_string(strings.size()) + "\">";
    for (const std::string& text : strings) {
        // Without the attribute a reader may drop blanks at either end.
        xml += NeedsPreservedSpace(text) ? "<si><t xml:space=\"preserve\">" : "<si><t>";
        xml += XmlText(text);
        xml += "</t></si>";
    }
    xml += "</sst>";
    return xml;
}

std::string SheetHead(const std::string& lastCell)
{
    // The widest range the grid has ("XFD1048576") sets the length; blanks before "/>" fill the rest.
    constexpr size_t kWidestCell = 10;
    const std::string padding(kWidestCell > lastCell.size() ? kWidestCell - lastCell.size() : 0, ' ');
    // Column A holds the dates: 20 characters wide, stored with the 5-pixel cell padding of a
    // 7-pixel digit (trunc((20 * 7 + 5) / 7 * 256) / 256).
    return std::string(kDeclaration) + "<worksheet xmlns=\"" + kMainNamespace + "\" xmlns:r=\"" +
           kRelationshipNamespace + "\">"
           "<dimension ref=\"A1:" + lastCell + "\"" + padding + "/>"
           "<sheetViews><sheetView tabSelected=\"1\" workbookViewId=\"0\"/></sheetViews>"
           "<sheetFormatPr defaultRowHeight=\"15\"/>"
           "<cols><col min=\"1\" max=\"1\" width=\"20.7109375\" customWidth=\"1\"/></cols>"
           "<sheetData>";
}

std::string SheetTail()
{
    return "</sheetData>"
           "<pageMargins left=\"0.7\" right=\"0.7\" top=\"0.75\" bottom=\"0.75\" header=\"0.3\" footer=\"0.3\"/>"
           "</worksheet>";
}

} // namespace sheet::package
