// velmora check DOC: holds the setup stored in a parameter document against the real files, the way
// the wizard does before it lets the user go on, and prints one verdict per check.
#include "apps/velmora/Commands.h"
#include "converter/ConversionJob.h"
#include "converter/RunPlan.h"
#include "engine/Engine.h"
#include "platform/bridge/BridgeVerdict.h"
#include "platform/system/FileFormat.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

#include <cstdio>
#include <vector>

namespace {

struct CheckResult {
    const char* name;
    bool passed;
    CString message;
};

CString Quoted(const CString& path) { return "\"" + path + "\""; }

void PrintHelp()
{
    std::printf(
        "Usage: velmora check DOC\n\n"
        "Runs the checks the setup wizard runs on the setup stored in parameter document DOC and prints\n"
        "one line per check, \"PASS <check>: <message>\" or \"FAIL <check>: <message>\":\n"
        "  input     the input file exists and has an extension its format accepts, or the input\n"
        "            folder exists and holds such a file\n"
        "  template  (ASCII and Excel input) the template loads and fits the input file, or at least one\n"
        "            file of the input folder\n"
        "  preview   the preview parser reads the input file (or the folder's first fitting file)\n"
        "  output    the output file name is valid and has an extension the output format accepts, or\n"
        "            the output folder exists; and the engine program would write every output: none\n"
        "            is an input, the template, the setup document or the log, or the output of two\n"
        "            inputs, or anything but a regular file, and this user may write it (the log too\n"
        "            must not be a file the run reads)\n"
        "Checks that depend on a failed one are reported as failed too.\n\n"
        "Exit status: 0 when every check passes, 1 when one fails or DOC holds no setup, 2 for bad usage.\n");
}

// Reads the setup of a host document (target, "Setup", sections) or of an engine file (target,
// sections). False when the document has neither.
bool ReadStoredSetup(WPXHANDLE document, CEngine& engine)
{
    WPXHANDLE target = wpxTargetByNum(document, 1);
    if (WPXHANDLE setup = wpxSectionByNameNum(target, "Setup", 1)) {
        CString name;
        wpxGetParam(setup, "Name", &name, 1, 1);
        engine.SetSetupName(name);
        engine.ReadSetupSections(setup);
        return true;
    }
    if (wpxSectionByNameNum(target, "INPUT", 1)) {
        engine.ReadSetupSections(target);
        return true;
    }
    return false;
}

CheckResult CheckInput(CEngine& engine)
{
    if (engine.m_nInputType == 1) {
        const CString& file = engine.m_strInputFile;
        CString message;
        if (sys::IsRegularFile(file) && engine.CheckFileExtension(file, engine.m_nInputFormat, message))
            return {"input", true, "the file " + Quoted(file) + " exists and its extension fits the format"};
        return {"input", false, (message.empty() ? res::LoadString(res::IDS_FILE_INVALID) : message) + " (" + Quoted(file) + ")"};
    }
    const CString& folder = engine.m_strInputFolder;
    CString first;
    if (engine.FolderExists(folder) && engine.FindMatchingFile(folder, first, engine.m_nInputFormat, CString()))
        return {"input", true, "the folder " + Quoted(folder) + " exists; first acceptable file " + Quoted(first)};
    return {"input", false, res::LoadString(res::IDS_FOLDER_INVALID) + " (" + Quoted(folder) + ")"};
}

// Binds the new working objects to the file the preview will read.
void BindPreviewFile(CEngine& engine)
{
    if (engine.m_nInputType == 1) {
        engine.SetPreviewFile(engine.m_strInputFile);
        return;
    }
    CString first;
    if (engine.FindMatchingFile(engine.m_strInputFolder, first, engine.m_nInputFormat, CString()))
        engine.SetPreviewFile(first);
}

CString BridgeReason(const CEngine& engine, const CString& templatePath)
{
    CString bridgeName;
    CEngine::GetBridgeName(engine.m_nInputFormat, bridgeName);
    const bridge::Verdict verdict =
        bridge::Judge({bridgeName, "TemplateFilePath=" + templatePath, engine.m_strInputFile, false});
    return verdict.reason.empty() ? CString("the bridge component rejects the file") : verdict.reason;
}

CheckResult CheckTemplate(CEngine& engine)
{
    const int option = engine.m_nTemplateOption;
    const CString templatePath = engine.m_strTemplateName;
    if (option == 3)
        return {"template", true, "the template is described by hand; there is no file to check"};
    if (templatePath.empty())
        return {"template", false, res::LoadString(res::IDS_NO_TEMPLATE_SELECTED)};
    if (!engine.LoadTemplate(templatePath)) {
        const CString why = engine.m_pSpecification ? engine.m_pSpecification->LastError() : CString();
        return {"template", false, "the template " + Quoted(templatePath) + " does not load" + (why.empty() ? "" : ": " + why)};
    }
    CString message;
    if (engine.VerifyTemplate(option, templatePath, message))
        return {"template", true, "the template " + Quoted(templatePath) + " loads and fits the input"};
    if (!message.empty())
        return {"template", false, message + " (" + Quoted(templatePath) + ")"};
    if (engine.m_nInputType == 1)
        message = BridgeReason(engine, templatePath);
    return {"template", false, message};
}

CheckResult CheckPreview(CEngine& engine)
{
    CString file;
    if (!engine.GetPreviewFile(file))
        return {"preview", false, "there is no input file to preview"};
    if (engine.m_nTemplateOption == 3 && engine.m_pSpecification)
        return {"preview", true, "not parsed: the template is still to be described by hand"};
    ui::ScriptedUserInterface recorder; // parsers report problems in boxes; collect them instead
    ui::ScopedUserInterface scoped(recorder);
    if (engine.ParseInputFile(file))
        return {"preview", true, "the parser reads " + Quoted(file)};
    if (!engine.m_pParser)
        return {"preview", false, Quoted(file) + ": there is no parser for the input format"};
    return {"preview", false, engine.m_pParser->m_strFailure};
}

// The setup as the engine program would take it, with the document as its setup file.
converter::JobSetup JobSetupOf(const CEngine& engine, const std::string& document)
{
    converter::JobSetup job;
    job.inputType = engine.m_nInputType;
    job.inputFormat = engine.m_nInputFormat;
    job.inputFile = engine.m_strInputFile;
    job.inputFolder = engine.m_strInputFolder;
    job.templateOption = engine.m_nTemplateOption;
    job.templateName = engine.m_strTemplateName;
    job.items = engine.m_arrItems;
    job.outputFormat = engine.m_nOutputFormat;
    job.outputFile = engine.m_strOutputFile;
    job.outputFolder = engine.m_strOutputFolder;
    job.title = engine.m_strOutputTitle;
    engine.GetLogFileDir(job.logFile);
    job.setupFile = document;
    return job;
}

// What the engine program would refuse to write, judged by the plan it makes before writing.
CString PlanRefusal(const CEngine& engine, const std::string& document)
{
    const converter::JobSetup job = JobSetupOf(engine, document);
    const std::string logPath = converter::LogPathFor(job.logFile);
    const converter::RunPlan plan(job, logPath);
    size_t refused = 0;
    CString first;
    for (const converter::PlannedFile& file : plan.Files())
        if (file.outputRefused && refused++ == 0)
            first = file.input + ": " + file.refusal;
    if (refused > 1)
        first += text::Format(" (and %zu more output%s refused)", refused - 1, refused > 2 ? "s" : "");
    if (refused == 0)
        if (const std::string what = plan.ReadFileAt(logPath); !what.empty())
            first = "the log file " + Quoted(logPath) + " is " + what + "; the engine would log to standard error";
    return first;
}

CheckResult CheckOutput(CEngine& engine, const std::string& document)
{
    const bool single = engine.m_nInputType == 1;
    const CString& named = single ? engine.m_strOutputFile : engine.m_strOutputFolder;
    CString message;
    if (!engine.VerifyOutput(engine.m_nOutputFormat, engine.m_strOutputFile, engine.m_strOutputFolder,
                             engine.m_strOutputTitle, message)) {
        if (message.empty())
            return {"output", false,
                    text::Format("the output format %d is not 1 (rbx0), 2 (ASCII) or 3 (Excel)", engine.m_nOutputFormat)};
        return {"output", false, message + " (" + Quoted(named) + ")"};
    }
    if (const CString refusal = PlanRefusal(engine, document); !refusal.empty())
        return {"output", false, refusal};
    return {"output", true,
            single ? "the output file " + Quoted(named) + " is acceptable" : "the output folder " + Quoted(named) + " exists"};
}

std::vector<CheckResult> RunChecks(CEngine& engine, const std::string& document)
{
    std::vector<CheckResult> results;
    const CheckResult input = CheckInput(engine);
    results.push_back(input);
    const bool usesTemplate = engine.m_nInputFormat != sys::Number(sys::FileFormat::Rbx0) && sys::FindFormat(engine.m_nInputFormat);
    if (input.passed) {
        engine.SetInput(engine.m_nInputType, engine.m_nInputFormat, engine.m_strInputFile, engine.m_strInputFolder);
        BindPreviewFile(engine);
        bool templateFits = true;
        if (usesTemplate) {
            results.push_back(CheckTemplate(engine));
            templateFits = results.back().passed;
        }
        if (templateFits)
            results.push_back(CheckPreview(engine));
        else
            results.push_back({"preview", false, "not tried: the template check failed"});
    } else {
        if (usesTemplate)
            results.push_back({"template", false, "not tried: the input check failed"});
        results.push_back({"preview", false, "not tried: the input check failed"});
    }
    results.push_back(CheckOutput(engine, document));
    return results;
}

int Check(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    if (argc != 2)
        return host::UsageError("check", argc < 2 ? "no parameter document given" : "more than one argument");
    if (argv[1][0] == '-')
        return host::UsageError("check", std::string("unknown option ") + argv[1]);

    WPXHANDLE document = nullptr;
    CString error;
    if (!wpxRead(argv[1], &document, &error)) {
        std::fprintf(stderr, "velmora check: %s\n", text::EscapeControls(error).c_str());
        return host::kFailed;
    }
    CEngine engine;
    const bool read = ReadStoredSetup(document, engine);
    wpxClose(&document);
    if (!read) {
        std::fprintf(stderr,
                     "velmora check: %s: no setup; expected a target holding a section \"Setup\" or the sections "
                     "INPUT, TEMPLATE and OUTPUT\n",
                     text::EscapeControls(argv[1]).c_str());
        return host::kFailed;
    }
    bool allPassed = true;
    for (const CheckResult& result : RunChecks(engine, argv[1])) {
        // Names from the setup and the files are shown escaped: one line a check, whatever they hold.
        std::printf("%s %s: %s\n", result.passed ? "PASS" : "FAIL", result.name,
                    text::EscapeControls(result.message).c_str());
        allPassed = allPassed && result.passed;
    }
    return allPassed ? host::kSuccess : host::kFailed;
}

} // namespace

VELMORA_REGISTER_COMMAND("check", "check a stored setup against its files, as the wizard would", Check)
