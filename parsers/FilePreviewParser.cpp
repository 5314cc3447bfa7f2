#include "parsers/FilePreviewParser.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"
#include "templates/Specification.h"

CUIntArray CFilePreviewParser::EffectiveSelection() const
{
    if (!m_arrItems.empty())
        return m_arrItems;
    if (m_pSpecification)
        return m_pSpecification->m_arrSelItems;
    return {};
}

ui::Rows CFilePreviewParser::BuildPreviewRows() const
{
    const CUIntArray selection = EffectiveSelection();
    if (selection.empty())
        return m_vecRows;
    ui::Rows rows;
    rows.reserve(m_vecRows.size());
    for (const ui::Row& row : m_vecRows) {
        ui::Row picked;
        if (!row.empty())
            picked.push_back(row.front());
        for (unsigned k : selection)
            if (static_cast<size_t>(k) + 1 < row.size())
                picked.push_back(row[k + 1]);
        rows.push_back(std::move(picked));
    }
    return rows;
}

CStringList CFilePreviewParser::BuildPreviewTitles() const
{
    const CUIntArray selection = EffectiveSelection();
    if (m_pSpecification && m_pSpecification->m_DataDesc.m_nItemTitleOption == 1) {
        const auto& definitions = m_pSpecification->m_DataDesc.m_vecItemDefs;
        CStringList titles{"DataTime"};
        if (selection.empty()) {
            for (const CItemDefinition& definition : definitions)
                titles.push_back(definition.m_strTitle);
        } else {
            for (unsigned k : selection)
                if (k < definitions.size())
                    titles.push_back(definitions[k].m_strTitle);
        }
        return titles;
    }
    if (m_pSpecification && m_pSpecification->m_DataDesc.m_nItemTitleOption != 0)
        return {};
    if (selection.empty())
        return m_vecItemNames;
    CStringList titles;
    if (!m_vecItemNames.empty())
        titles.push_back(m_vecItemNames.front());
    for (unsigned k : selection)
        if (static_cast<size_t>(k) + 1 < m_vecItemNames.size())
            titles.push_back(m_vecItemNames[k + 1]);
    return titles;
}

int CFilePreviewParser::ShowPreview(const CString& title)
{
    // Without a selection the dialog reads the parser's own table; only a selection is built anew.
    const bool selected = !EffectiveSelection().empty();
    const ui::Rows picked = selected ? BuildPreviewRows() : ui::Rows();
    const CStringList headers = BuildPreviewTitles();
    ui::PreviewContent content;
    content.resultRows = selected ? picked : m_vecRows;
    content.headers = headers;
    content.inputLines = m_vecRawLines;
    if (content.inputLines.empty() && content.headers.empty() && content.resultRows.empty())
        return 0;
    content.title = title.empty() && !m_strFileTitle.empty() ? m_strFileTitle : title;
    ui::Current().ShowPreview(content);
    return 1;
}

void CFilePreviewParser::SetFile(const CString& path)
{
    m_strFile = path;
    if (!path.empty())
        m_strFileTitle = sys::FileTitle(path);
}

int CFilePreviewParser::Fail(const CString& file, long line, const CString& reason)
{
    m_strFailure = line > 0 ? text::Format("%s:%ld: %s", file.c_str(), line, reason.c_str()) : file + ": " + reason;
    return 0;
}

int CFilePreviewParser::Refuse(int stringId, long line)
{
    ui::ShowStringMessage(stringId);
    return Fail(m_strFile, line, text::Trim(res::LoadString(stringId)));
}
