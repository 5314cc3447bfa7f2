// .xlsx workbooks: a zip package of XML parts, found through its relationships. The small parts
// (relationships, workbook, styles) and the shared strings are read first, so the style table
// is complete before the first cell; each sheet part then streams through the scanner into the
// sink, and only the current cell is held.
#include "formats/workbook/WorkbookImport.h"

#include "formats/xlsx/XlsxPartReaders.h"
#include "formats/xlsx/ZipReader.h"

#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <vector>

namespace sheet {

namespace {

using Token = XmlScanner::Token;

constexpr std::string_view kWorkbookFallback = "xl/workbook.xml";

struct Relationship {
    std::string id;
    std::string type; // its last path segment: "worksheet", "styles", ...
    std::string part; // the target as a part name of the package
};

struct SheetEntry {
    std::string name;
    std::string relationship;
};

struct WorkbookEntries {
    std::vector<SheetEntry> sheets;
    bool date1904 = false;
};

std::string FolderOf(std::string_view part)
{
    const std::size_t slash = part.rfind('/');
    return slash == std::string_view::npos ? std::string() : std::string(part.substr(0, slash + 1));
}

// A relationship's target, relative to the folder of the part it belongs to unless it starts
// with '/', as a part name with "." and ".." resolved.
std::string ResolveTarget(std::string_view folder, std::string_view target)
{
    const std::string joined = !target.empty() && target.front() == '/' ? std::string(target.substr(1))
                                                                         : std::string(folder) + std::string(target);
    std::vector<std::string_view> segments;
    std::string_view rest = joined;
    while (!rest.empty()) {
        const std::size_t slash = rest.find('/');
        const std::string_view segment = rest.substr(0, slash);
        rest = slash == std::string_view::npos ? std::string_view() : rest.substr(slash + 1);
        if (segment == "..") {
            if (!segments.empty())
                segments.pop_back();
        } else if (!segment.empty() && segment != ".") {
            segments.push_back(segment);
        }
    }
    std::string part;
    for (std::string_view segment : segments)
        part.append(part.empty() ? "" : "/").append(segment);
    return part;
}

// Reads one part of the package through the scanner.
class PartReader {
public:
    PartReader(ZipReader& package, const ZipReader::Entry& entry)
        : m_stream(package.Open(entry)),
          m_xml([stream = m_stream.get()](char* out, std::size_t capacity) { return stream->Read(out, capacity); }, entry.name)
    {
    }
    XmlScanner& Xml() { return m_xml; }

private:
    std::unique_ptr<ZipReader::PartStream> m_stream;
    XmlScanner m_xml;
};

class XlsxReader {
public:
    XlsxReader(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
        : m_path(path), m_package(path, limits), m_sink(sink), m_styles(styles), m_limits(limits) {}

    void Read();

private:
    std::string WorkbookPart();
    std::vector<Relationship> ReadRelationships(const std::string& part);
    WorkbookEntries ReadWorkbook(const std::string& part);
    const ZipReader::Entry* Related(const std::vector<Relationship>& relationships, std::string_view type,
                                    const std::string& fallback) const;
    const Relationship& SheetRelationship(const SheetEntry& sheet, const std::vector<Relationship>& relationships) const;
    const ZipReader::Entry* SheetPart(const SheetEntry& sheet, const Relationship& relationship) const;

    const std::string& m_path;
    ZipReader m_package;
    ImportSink& m_sink;
    StyleTable& m_styles;
    const ImportLimits& m_limits;
};

// The workbook part the package's own relationships name, else the usual one.
std::string XlsxReader::WorkbookPart()
{
    for (const Relationship& relationship : ReadRelationships("_rels/.rels"))
        if (relationship.type == "officeDocument" && m_package.Find(relationship.part) != nullptr)
            return relationship.part;
    if (m_package.Find(kWorkbookFallback) == nullptr)
        throw OpenError(m_path, "the zip package holds no workbook (xl/workbook.xml is missing).");
    return std::string(kWorkbookFallback);
}

// The relationships of a part in its .rels part; none when there is no such part.
std::vector<Relationship> XlsxReader::ReadRelationships(const std::string& relsPart)
{
    std::vector<Relationship> relationships;
    const ZipReader::Entry* entry = m_package.Find(relsPart);
    if (entry == nullptr)
        return relationships;
    // "xl/_rels/workbook.xml.rels" holds the relationships of the parts in "xl/".
    const std::string folder = ResolveTarget(FolderOf(relsPart), "..");
    PartReader reader(m_package, *entry);
    XmlScanner& xml = reader.Xml();
    for (Token token = xml.Next(); token != Token::End; token = xml.Next()) {
        if (token != Token::StartTag || xml.Name() != "Relationship" || xml.Attribute("TargetMode") == "External")
            continue;
        Relationship relationship;
        relationship.id = xml.Attribute("Id").value_or("");
        const std::string_view type = xml.Attribute("Type").value_or("");
        relationship.type = type.substr(type.rfind('/') + 1);
        relationship.part = ResolveTarget(folder.empty() ? folder : folder + "/", xml.Attribute("Target").value_or(""));
        relationships.push_back(std::move(relationship));
    }
    return relationships;
}

WorkbookEntries XlsxReader::ReadWorkbook(const std::string& part)
{
    WorkbookEntries workbook;
    PartReader reader(m_package, *m_package.Find(part));
    XmlScanner& xml = reader.Xml();
    for (Token token = xml.Next(); token != Token::End; token = xml.Next()) {
        if (token != Token::StartTag)
            continue;
        if (xml.Name() == "workbookPr") {
            const std::string_view system = xml.Attribute("date1904").value_or("0");
            workbook.date1904 = system == "1" || system == "true";
        } else if (xml.Name() == "sheet") {
            SheetEntry sheet;
            sheet.name = xml.Attribute("name").value_or("");
            sheet.relationship = xml.Attribute("id").value_or("");
            workbook.sheets.push_back(std::move(sheet));
        }
    }
    return workbook;
}

const ZipReader::Entry* XlsxReader::Related(const std::vector<Relationship>& relationships, std::string_view type,
                                            const std::string& fallback) const
{
    for (const Relationship& relationship : relationships)
        if (relationship.type == type)
            return m_package.Find(relationship.part);
    return m_package.Find(fallback);
}

void XlsxReader::Read()
{
    const std::string workbookPart = WorkbookPart();
    const std::string folder = FolderOf(workbookPart);
    const std::vector<Relationship> relationships =
        ReadRelationships(folder + "_rels/" + workbookPart.substr(folder.size()) + ".rels");
    const WorkbookEntries workbook = ReadWorkbook(workbookPart);

    // Chart sheets and dialog sheets hold no cells and are not worksheets. The sheets are listed
    // first, so a reader that wants only their names can stop before the styles and texts.
    std::vector<std::pair<std::string, const ZipReader::Entry*>> worksheets;
    for (const SheetEntry& sheet : workbook.sheets) {
        const Relationship& relationship = SheetRelationship(sheet, relationships);
        if (relationship.type == "worksheet")
            worksheets.emplace_back(sheet.name, SheetPart(sheet, relationship));
    }
    for (const auto& [name, part] : worksheets)
        if (!m_sink.AddSheet(name))
            return;

    xlsx::CellStyles cellStyles;
    if (const ZipReader::Entry* styles = Related(relationships, "styles", folder + "styles.xml")) {
        PartReader reader(m_package, *styles);
        cellStyles = xlsx::ReadStyles(reader.Xml(), m_styles);
    }
    xlsx::SharedStrings strings;
    if (const ZipReader::Entry* shared = Related(relationships, "sharedStrings", folder + "sharedStrings.xml")) {
        PartReader reader(m_package, *shared);
        xlsx::ReadSharedStrings(reader.Xml(), strings);
    }

    const xlsx::SheetContext context{strings, cellStyles, workbook.date1904, m_limits};
    for (std::size_t s = 0; s < worksheets.size(); ++s) {
        PartReader reader(m_package, *worksheets[s].second);
        if (!xlsx::ReadSheetCells(reader.Xml(), context, static_cast<int>(s), m_sink) ||
            !m_sink.EndSheet(static_cast<int>(s)))
            return;
    }
}

const Relationship& XlsxReader::SheetRelationship(const SheetEntry& sheet, const std::vector<Relationship>& relationships) const
{
    for (const Relationship& relationship : relationships)
        if (relationship.id == sheet.relationship)
            return relationship;
    throw OpenError(m_path, "the sheet '" + sheet.name + "' has no part in the package (relationship '" +
                                sheet.relationship + "' is missing).");
}

const ZipReader::Entry* XlsxReader::SheetPart(const SheetEntry& sheet, const Relationship& relationship) const
{
    const ZipReader::Entry* entry = m_package.Find(relationship.part);
    if (entry == nullptr)
        throw OpenError(m_path, "the sheet '" + sheet.name + "' has no part in the package (" + relationship.part +
                                    " is missing).");
    return entry;
}

} // namespace

void ImportXlsx(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    try {
        XlsxReader(path, sink, styles, limits).Read();
    } catch (const XmlScanner::Error& e) {
        throw OpenError(path, std::string(e.what()) + ".");
    } catch (const std::bad_alloc&) {
        throw OpenError(path, "not enough memory to read the workbook.");
    }
}

} // namespace sheet
