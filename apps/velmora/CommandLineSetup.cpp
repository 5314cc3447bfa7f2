#include "apps/velmora/CommandLineSetup.h"

#include "converter/ConversionJob.h"
#include "converter/RunPlan.h"
#include "guess/GuessReport.h"
#include "platform/bridge/BridgeVerdict.h"
#include "platform/system/FileFormat.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "wizard/DefineTemplateForm.h"
#include "wizard/ItemSelectionForm.h"
#include "wizard/OutputForm.h"
#include "wizard/SelectInputForm.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>

namespace host {
namespace {

bool Refused(SetupOutcome& outcome, const std::string& failure = {})
{
    outcome.failure = failure;
    return false;
}

bool Misused(SetupOutcome& outcome, const std::string& failure)
{
    outcome.usage = true;
    return Refused(outcome, failure);
}

// The files of `folder` a run would take, by name: the engine's own listing.
std::vector<std::string> FolderFiles(const std::string& folder, int format)
{
    converter::JobSetup setup;
    setup.inputType = 2;
    setup.inputFormat = format;
    setup.inputFolder = folder;
    setup.outputFormat = format;
    const converter::RunPlan plan(setup, {});
    std::vector<std::string> files;
    for (const converter::PlannedFile& file : plan.Files())
        files.push_back(file.input);
    return files;
}

// The one format whose files the folder holds; 0 when it holds none or files of several formats.
int FormatOfFolder(const std::string& folder, std::string& formats)
{
    int found = 0, kinds = 0;
    for (int format : {1, 2, 3})
        if (!FolderFiles(folder, format).empty()) {
            found = format;
            ++kinds;
            formats += std::string(formats.empty() ? "" : ", ") + sys::FindFormat(format)->name;
        }
    return kinds == 1 ? found : 0;
}

bool SelectInput(const SetupRequest& request, bool folder, int format, CEngine& engine)
{
    SelectInputState state = InitialSelectInput();
    if (folder) {
        ClickFolder(state, &engine);
        ClickFormat(state, format);
        // The page's folder browser ends the folder with "/".
        state.folder = request.input.back() == '/' ? request.input : request.input + "/";
    } else {
        ClickSingleFile(state, &engine);
        ClickFormat(state, format);
        state.file = request.input;
    }
    return AcceptSelectInput(state, &engine);
}

// The template file: the one named, or one guessed from the input (a folder's first file by name).
bool TemplateFile(const SetupRequest& request, bool folder, int format, SetupOutcome& outcome, std::string& path)
{
    path = request.templatePath;
    if (!path.empty())
        return true;
    const std::vector<std::string> files = folder ? FolderFiles(request.input, format) : std::vector{request.input};
    if (files.empty())
        return Refused(outcome, request.input + ": the folder holds no file to guess a template from");
    outcome.guess = guess::GuessTemplate(files.front(), format == 3 ? guess::InputKind::Excel : guess::InputKind::Ascii);
    if (!outcome.guess->spec)
        return Refused(outcome, guess::DescribeRefusal(*outcome.guess));
    if (!outcome.guess->spec->Save(request.guessedTemplate))
        return Refused(outcome, outcome.guess->spec->LastError());
    path = request.guessedTemplate;
    return true;
}

bool DefineTemplate(const std::string& path, CEngine& engine, SetupOutcome& outcome)
{
    DefineTemplateState state;
    LoadDefineTemplate(state, engine);
    ClickExistingTemplate(state, 1);
    state.path = path;
    if (AcceptDefineTemplate(state, &engine))
        return true;
    // For a single file the page stays without a message when the bridge refuses; say why.
    return Refused(outcome, engine.m_nInputType == 1 ? BridgeRefusal(engine, path) : std::string());
}

bool SelectItems(const SetupRequest& request, CEngine& engine, SetupOutcome& outcome)
{
    ItemSelection selection = LoadItemSelection(&engine);
    // With no items read, the page's own check (2300) refuses whatever was asked.
    if (request.items && !selection.names.empty()) {
        selection.ticked.assign(selection.names.size(), false);
        for (unsigned item : *request.items) {
            if (item >= selection.names.size())
                return Misused(outcome, text::Format("--items names item %u, but the input has %zu items (0 to %zu)", item,
                                                     selection.names.size(), selection.names.size() - 1));
            selection.ticked[item] = true;
        }
    }
    if (selection.names.empty())
        outcome.failure = "the items of the input cannot be read";
    if (!request.keepTemplateFile)
        return AcceptItemSelection(selection.ticked, &engine);
    const CUIntArray items = TickedPositions(selection.ticked);
    if (items.empty()) {
        ui::ShowStringMessage(res::IDS_SELECT_MORE_ITEMS);
        return false;
    }
    engine.SetItems(items);
    return true;
}

bool ChooseOutput(const SetupRequest& request, int format, CEngine& engine)
{
    OutputState state;
    LoadOutput(state, engine);
    ClickOutputFormat(state, format);
    (engine.m_nInputType == 1 ? state.file : state.folder) = request.output;
    state.title = request.title;
    return ValidateOutput(state, &engine, ExcelVersionFor(format)) != 0;
}

// An output folder named for a single input file: the input's name with the format's extension.
bool NamesFolder(const std::string& path) { return !path.empty() && (path.back() == '/' || sys::IsDirectory(path)); }

std::string OutputInFolder(const std::string& folder, const std::string& input, int format)
{
    std::string name = sys::FileTitle(input);
    if (const size_t dot = name.rfind('.'); dot != std::string::npos && dot > 0)
        name.erase(dot);
    return sys::JoinPath(folder, name + sys::FindFormat(format)->outputExtension);
}

// The input format: named, or told by the extension of the file (of the folder's files).
bool InputFormat(const SetupRequest& request, bool folder, int& format, SetupOutcome& outcome)
{
    format = request.inputFormat;
    if (format != 0)
        return true;
    if (folder) {
        std::string formats;
        format = FormatOfFolder(request.input, formats);
        if (format == 0 && !formats.empty())
            return Misused(outcome, request.input + " holds " + formats + " files; name the one to convert with --format");
        format = format == 0 ? 2 : format; // an empty folder: the input page says so
        return true;
    }
    format = FormatOfExtension(request.input);
    return format != 0 || Misused(outcome, "the extension of " + request.input + " names no input format; name it with --format");
}

// The output format and name: a folder named for a single file gets the file of the input's name.
bool Output(const SetupRequest& request, bool folder, int& format, std::string& output, SetupOutcome& outcome)
{
    const bool outputFolder = folder || NamesFolder(request.output);
    format = request.outputFormat;
    if (format == 0 && outputFolder)
        return Misused(outcome, "the output " + request.output + " is a folder; name its format with " +
                                    request.outputFormatOption);
    if (format == 0 && (format = FormatOfExtension(request.output)) == 0)
        return Misused(outcome, "the extension of " + request.output + " names no output format; name it with " +
                                    request.outputFormatOption);
    output = !folder && outputFolder ? OutputInFolder(request.output, request.input, format) : request.output;
    return true;
}

bool Walk(const SetupRequest& request, CEngine& engine, SetupOutcome& outcome)
{
    const bool folder = sys::IsDirectory(request.input);
    int format = 0, outputFormat = 0;
    SetupRequest named = request;
    if (!InputFormat(request, folder, format, outcome) || !Output(request, folder, outputFormat, named.output, outcome))
        return false;
    if (!SelectInput(request, folder, format, engine))
        return false;
    if (format != 1) {
        std::string templatePath;
        if (!TemplateFile(request, folder, format, outcome, templatePath) || !DefineTemplate(templatePath, engine, outcome))
            return false;
    }
    if (!SelectItems(request, engine, outcome))
        return false;
    outcome.failure.clear();
    return ChooseOutput(named, outputFormat, engine);
}

} // namespace

bool ReadItemList(const std::string& text, CUIntArray& items)
{
    items.clear();
    size_t start = 0;
    while (start <= text.size()) {
        const size_t comma = std::min(text.find(',', start), text.size());
        const std::string_view field = std::string_view(text).substr(start, comma - start);
        int position = 0;
        if (field.empty() || field.size() > 9 || field.find_first_not_of("0123456789") != std::string_view::npos ||
            !text::ScanInt(field, position))
            return false;
        items.push_back(static_cast<unsigned>(position));
        start = comma + 1;
    }
    return !items.empty();
}

int FormatOfExtension(const std::string& path)
{
    if (sys::FileExtension(path).empty())
        return sys::Number(sys::FileFormat::Ascii);
    for (const sys::FileFormatInfo& info : sys::kFileFormats)
        if (sys::HasInputExtension(info.format, path))
            return sys::Number(info.format);
    return 0;
}

int FormatOfName(const std::string& name)
{
    const sys::FileFormatInfo* info = sys::FindFormatNamed(name);
    return info ? sys::Number(info->format) : 0;
}

std::string BridgeRefusal(const CEngine& engine, const CString& templatePath)
{
    CString bridgeName;
    CEngine::GetBridgeName(engine.m_nInputFormat, bridgeName);
    const bridge::Verdict verdict =
        bridge::Judge({bridgeName, "TemplateFilePath=" + templatePath, engine.m_strInputFile, false});
    return verdict.reason.empty() ? CString("the bridge component rejects the file") : verdict.reason;
}

std::string AbsolutePath(const std::string& path)
{
    if (path.empty())
        return path;
    std::error_code error;
    const std::filesystem::path absolute = std::filesystem::absolute(path, error);
    std::string text = error ? path : absolute.string();
    if (path.back() == '/' && (text.empty() || text.back() != '/'))
        text += '/';
    return text;
}

bool BuildSetup(const SetupRequest& given, CEngine& engine, SetupOutcome& outcome)
{
    // The setup is read away from here (beside the document, or in the temporary folder).
    SetupRequest request = given;
    request.input = AbsolutePath(given.input);
    request.output = AbsolutePath(given.output);
    request.templatePath = AbsolutePath(given.templatePath);
    // The pages show their messages in boxes; here they are collected and printed.
    ui::ScriptedUserInterface recorder;
    recorder.answers.assign(16, ui::IDNO); // a question is never answered yes for the user
    const bool built = [&] {
        ui::ScopedUserInterface scope(recorder);
        return Walk(request, engine, outcome);
    }();
    for (const ui::ScriptedUserInterface::Box& box : recorder.boxes)
        outcome.messages.push_back(box.text);
    return built;
}

void PrintRefusal(const char* command, const SetupOutcome& outcome)
{
    for (const std::string& message : outcome.messages)
        std::fprintf(stderr, "velmora %s: %s\n", command, text::EscapeControls(message).c_str());
    if (!outcome.failure.empty())
        std::fprintf(stderr, "velmora %s: %s\n", command, text::EscapeControls(outcome.failure).c_str());
    if (outcome.messages.empty() && outcome.failure.empty())
        std::fprintf(stderr, "velmora %s: the setup was refused\n", command);
}

} // namespace host
