// The plain-text summary the overview page shows before Finish.
#include "engine/Engine.h"
#include "platform/system/Text.h"

namespace {

constexpr const char* kEol = "\r\n";

void Heading(CString& text, const char* title) { text += CString(title) + kEol; }

void Line(CString& text, const char* label, const CString& value) { text += "\t" + CString(label) + value + kEol; }

void Line(CString& text, const char* label, int value) { Line(text, label, text::Format("%d", value)); }

CString ItemsText(const CUIntArray& items)
{
    CString out;
    for (size_t i = 0; i < items.size(); ++i)
        out += text::Format(i == 0 ? "%d" : ",%d", static_cast<int>(items[i]));
    return items.empty() ? CString() : "Items: " + out;
}

} // namespace

void CEngine::GetOverviewText(CString& text)
{
    Heading(text, "Selected Tool");
    Line(text, "", CString("Velmora"));
    text += kEol;

    Heading(text, "Input Data");
    GetBridgeName(m_nInputFormat, m_strInputBridge);
    Line(text, "Type: ", m_nInputType);
    Line(text, "File_format: ", m_nInputFormat);
    Line(text, "Bridge: ", m_strInputBridge);
    Line(text, "File_name: ", m_strInputFile);
    Line(text, "Folder_name: ", m_strInputFolder);
    text += kEol;

    Heading(text, "TEMPLATE");
    Line(text, "Template_option: ", m_nTemplateOption);
    Line(text, "Template_name: ", StoredTemplateName());
    Line(text, "", ItemsText(m_arrItems));
    text += kEol;

    Heading(text, "OUTPUT");
    GetBridgeName(m_nOutputFormat, m_strOutputBridge);
    CString logFile;
    GetLogFileDir(logFile);
    Line(text, "File_format: ", m_nOutputFormat);
    Line(text, "Bridge: ", m_strOutputBridge);
    Line(text, "File_name: ", m_strOutputFile);
    Line(text, "Folder_name: ", m_strOutputFolder);
    Line(text, "File_title: ", m_strOutputTitle);
    Line(text, "Log_file: ", logFile);
}
