#include "platform/bridge/BridgeVerdict.h"

#include "converter/Converter.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"

#include <exception>

namespace bridge {

namespace {

constexpr const char* kTemplateKey = "TemplateFilePath=";

// Shows nothing, but keeps the first message a reader raised: it is the reason of a false verdict.
class RecordingSilence : public ui::SilentUserInterface {
public:
    int MessageBox(const std::string& text, const std::string& caption, unsigned type) override
    {
        if (m_first.empty())
            m_first = text;
        return ui::SilentUserInterface::MessageBox(text, caption, type);
    }
    const CString& FirstMessage() const { return m_first; }

private:
    CString m_first;
};

Verdict Accept() { return Verdict{true, CString()}; }
Verdict Refuse(CString reason) { return Verdict{false, std::move(reason)}; }

CString Quoted(const CString& path) { return "\"" + path + "\""; }

Verdict JudgeSilently(const Request& request, const RecordingSilence& silence)
{
    const sys::FileFormatInfo* reader = sys::FindFormatOfBridge(request.bridgeName);
    if (!reader)
        return Refuse("unknown bridge name " + Quoted(request.bridgeName));
    const sys::FileFormat format = reader->format;
    if (request.dataFile.empty())
        return Refuse("no data file given");
    const CString templatePath = TemplatePathOf(request.parameters);
    // rbx0 files describe themselves; the other formats are read only through the given template.
    if (format != sys::FileFormat::Rbx0 && templatePath.empty())
        return Refuse("no template given; expected the parameter \"TemplateFilePath=<template file>\"");
    if (request.folderScan) {
        // A folder run passes over hidden entries, so none of them is a file it would convert.
        const auto attributes = sys::GetAttributes(request.dataFile);
        if (attributes && attributes->hidden)
            return Refuse(Quoted(request.dataFile) + " is hidden; a folder run passes over it");
    }
    const sys::Status verdict = converter::CanConvert(format, request.dataFile, templatePath);
    if (verdict)
        return Accept();
    std::string reason = verdict.problem().Describe();
    if (reason.empty())
        reason = silence.FirstMessage();
    return Refuse(reason.empty() ? Quoted(request.dataFile) + ": the engine would not convert it" : reason);
}

} // namespace

CString TemplatePathOf(const CString& parameters)
{
    const CString key = kTemplateKey;
    if (!text::StartsWithNoCase(parameters, key))
        return CString();
    return parameters.substr(key.size());
}

Verdict Judge(const Request& request)
{
    RecordingSilence silence;
    ui::ScopedUserInterface quiet(silence);
    try {
        return JudgeSilently(request, silence);
    } catch (const std::exception& error) {
        return Refuse(Quoted(request.dataFile) + ": " + error.what());
    } catch (...) {
        return Refuse(Quoted(request.dataFile) + ": the reader failed");
    }
}

} // namespace bridge
