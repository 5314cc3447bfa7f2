// velmora check DOC [--all] [--json]: holds the setup stored in a parameter document against the real
// files, the way the wizard does before it lets the user go on, and prints one verdict per check;
// with --all it also reads every input file as a run would (a dry run) and reports on each.
#include "apps/velmora/CommandLineSetup.h"
#include "apps/velmora/Commands.h"
#include "converter/ConversionJob.h"
#include "converter/DryRun.h"
#include "converter/RunPlan.h"
#include "engine/Engine.h"
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
        "Usage: velmora check DOC [--all] [--json]\n\n"
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
        "--all     then reads every input file of the setup with its template, as a run would, and writes\n"
        "          nothing: per file a line \"ok FILE: ROWS rows, FIRST to LAST\" (or FAIL, SKIP with the\n"
        "          reason) and below it each row that does not read (FILE:LINE:COLUMN: rejected: why),\n"
        "          the missing steps of an equidistant series, stamps that repeat or go back, and values\n"
        "          of Accumulated items that decrease; then a summary line \"dry run: ...\".\n"
        "--json    one JSON object {\"checks\": [{\"name\", \"passed\", \"message\"}], and with --all\n"
        "          \"files\" and \"summary\"}.\n\n"
        "Exit status: 0 when every check passes (and with --all every file would convert), 1 when one\n"
        "fails, a file would not convert or DOC holds no setup, 2 for bad usage.\n");
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
        message = host::BridgeRefusal(engine, templatePath);
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

std::string ChecksJson(const std::vector<CheckResult>& results)
{
    std::string out = "\"checks\":[";
    for (size_t i = 0; i < results.size(); ++i) {
        out += i ? ",{\"name\":" : "{\"name\":";
        text::AppendJsonString(out, results[i].name);
        out += results[i].passed ? ",\"passed\":true,\"message\":" : ",\"passed\":false,\"message\":";
        text::AppendJsonString(out, results[i].message);
        out += "}";
    }
    return out + "]";
}

// The dry run of --all: every input file read as the engine program would read it.
int DryRun(const CEngine& engine, const std::string& document, bool json, std::string& jsonOut)
{
    std::vector<converter::FileCheck> files;
    std::string setupError;
    if (!converter::CheckJobFiles(JobSetupOf(engine, document), 0, 0, 0, files, setupError)) {
        if (json) {
            jsonOut += ",\"setupError\":";
            text::AppendJsonString(jsonOut, setupError);
        } else {
            std::printf("dry run: the setup cannot run: %s\n", text::EscapeControls(setupError).c_str());
        }
        return host::kFailed;
    }
    if (json) {
        const std::string report = converter::ChecksJson(files);
        jsonOut += "," + report.substr(1, report.rfind('}') - 1);
    } else {
        for (const converter::FileCheck& file : files)
            std::fputs(converter::DescribeCheck(file).c_str(), stdout);
        std::fputs(converter::DescribeChecks(files).c_str(), stdout);
    }
    return converter::DryRunStatus(files, false) == converter::kExitOk ? host::kSuccess : host::kFailed;
}

int Check(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    const char* path = nullptr;
    bool all = false, json = false;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--all")
            all = true;
        else if (arg == "--json")
            json = true;
        else if (arg[0] == '-')
            return host::UsageError("check", "unknown option " + arg);
        else if (path)
            return host::UsageError("check", "more than one parameter document given");
        else
            path = argv[i];
    }
    if (!path)
        return host::UsageError("check", "no parameter document given");

    WPXHANDLE document = nullptr;
    CString error;
    if (!wpxRead(path, &document, &error)) {
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
                     text::EscapeControls(path).c_str());
        return host::kFailed;
    }
    bool allPassed = true;
    const std::vector<CheckResult> results = RunChecks(engine, path);
    for (const CheckResult& result : results) {
        allPassed = allPassed && result.passed;
        // Names from the setup and the files are shown escaped: one line a check, whatever they hold.
        if (!json)
            std::printf("%s %s: %s\n", result.passed ? "PASS" : "FAIL", result.name,
                        text::EscapeControls(result.message).c_str());
    }
    std::string jsonOut = "{" + ChecksJson(results);
    if (all && DryRun(engine, path, json, jsonOut) != host::kSuccess)
        allPassed = false;
    if (json)
        std::printf("%s}\n", jsonOut.c_str());
    return allPassed ? host::kSuccess : host::kFailed;
}

} // namespace

VELMORA_REGISTER_COMMAND("check", "check a stored setup against its files, as the wizard would; --all reads every file (a dry run)", Check)
