#include "converter/DryRun.h"

#include "converter/ConversionJob.h"
#include "converter/NumberText.h"
#include "converter/RunPlan.h"
#include "converter/SheetLayout.h"
#include "converter/StampText.h"
#include "converter/XlsSeriesWriter.h"
#include "converter/XlsxSeriesWriter.h"
#include "platform/system/Text.h"
#include "templates/Specification.h"

#include <algorithm>
#include <atomic>
#include <map>
#include <thread>

namespace converter {
namespace {

constexpr size_t kKeptFindings = 1000; // of each kind, per file; the counts go on
constexpr size_t kMostStepRuns = 10000; // a series with more changes of step has no one step

std::string Escaped(std::string_view text) { return text::EscapeControls(text); }

std::string Number(double value)
{
    char buffer[40];
    return std::string(buffer, FormatValue(value, buffer));
}

// The steps between stamps as runs of equal steps, for the gaps of an equidistant series.
class StepRuns {
public:
    void Add(Stamp previous, Stamp stamp, long line)
    {
        const Stamp step = stamp - previous;
        if (m_overflow)
            return;
        if (!m_runs.empty() && m_runs.back().step == step) {
            ++m_runs.back().count;
            return;
        }
        if (m_runs.size() == kMostStepRuns) {
            m_overflow = true;
            m_runs.clear();
            return;
        }
        m_runs.push_back({step, 1, line, previous, stamp});
    }

    // The series' step when every rising step is a whole number of its commonest one; then the
    // gaps of `check` are filled in.
    void FindGaps(FileCheck& check) const
    {
        std::map<Stamp, std::uint64_t> totals;
        for (const Run& run : m_runs)
            if (run.step > 0)
                totals[run.step] += run.count;
        Stamp step = 0;
        std::uint64_t most = 0;
        for (const auto& [s, count] : totals)
            if (count > most)
                step = s, most = count;
        if (m_overflow || step == 0)
            return;
        for (const auto& [s, count] : totals)
            if (s % step != 0)
                return;
        check.step = step;
        for (const Run& run : m_runs) {
            if (run.step <= step)
                continue;
            const std::uint64_t missing = static_cast<std::uint64_t>(run.step / step - 1) * run.count;
            check.missingSteps += missing;
            if (check.gaps.size() < kKeptFindings)
                check.gaps.push_back({run.line, run.from, run.to, missing, run.count});
        }
    }

private:
    struct Run {
        Stamp step;
        std::uint64_t count;
        long line; // of the row ending the first step of the run
        Stamp from, to;
    };
    std::vector<Run> m_runs;
    bool m_overflow = false;
};

// What the rows say beyond their values: order, gaps and accumulated values.
class RowWatch {
public:
    RowWatch(const SeriesHeader& header, const std::vector<size_t>& selection)
    {
        for (size_t slot = 0; slot < selection.size(); ++slot) {
            const ItemInfo& item = header.items[selection[slot]];
            if (text::EqualsNoCase(item.valueType, "Accumulated"))
                m_accumulated.push_back({slot, item.name, kMissing});
        }
    }

    // `afterRejected`: rows that did not read stand between this row and the one before, so the
    // step between them says nothing about missing steps.
    void Add(const Row& row, long line, bool afterRejected, FileCheck& check)
    {
        if (check.rows > 0) {
            if (row.stamp <= m_previous) {
                (row.stamp == m_previous ? check.repeatedStamps : check.decreasingStamps) += 1;
                if (check.stampFaults.size() < kKeptFindings)
                    check.stampFaults.push_back({line, m_previousLine, row.stamp, m_previous});
            } else if (!afterRejected) {
                m_steps.Add(m_previous, row.stamp, line);
            }
        }
        for (Accumulated& item : m_accumulated) {
            const double value = row.values[item.slot];
            if (IsMissing(value))
                continue;
            if (!IsMissing(item.last) && value < item.last) {
                ++check.decreaseCount;
                if (check.decreases.size() < kKeptFindings)
                    check.decreases.push_back({line, item.name, item.last, value});
            }
            item.last = value;
        }
        m_previous = row.stamp;
        m_previousLine = line;
    }

    void Finish(FileCheck& check) const { m_steps.FindGaps(check); }

private:
    struct Accumulated {
        size_t slot;
        std::string name;
        double last;
    };
    std::vector<Accumulated> m_accumulated;
    Stamp m_previous = 0;
    long m_previousLine = 0;
    StepRuns m_steps;
};

FileCheck& Refuse(FileCheck& check, FileCheck::Verdict verdict, const std::string& reason)
{
    check.verdict = verdict;
    check.reason = reason;
    return check;
}

std::string Count(std::uint64_t n, const char* one, const char* many)
{
    return std::to_string(n) + " " + (n == 1 ? one : many);
}

// What the writer of the output would refuse of a file that reads: its own limits.
std::string WriterRefusal(const FileJob& job, const FileCheck& check)
{
    if (job.outputFormat == sys::FileFormat::Rbx0 && check.repeatedStamps + check.decreasingStamps > 0)
        return "an rbx0 file needs rising time stamps, and " +
               Count(check.repeatedStamps + check.decreasingStamps, "does not rise", "do not rise");
    if (job.outputFormat != sys::FileFormat::Excel)
        return {};
    const bool xls = text::EqualsNoCase(sys::FileExtension(job.output), ".xls");
    const std::uint64_t columns = xls ? XlsSeriesWriter::kMaxColumns : XlsxSeriesWriter::kMaxColumns;
    const std::uint64_t rows = (xls ? XlsSeriesWriter::kMaxRows : XlsxSeriesWriter::kMaxRows) - sheet_layout::kHeaderRows;
    if (check.items + 1 > columns)
        return std::to_string(check.items) + " items do not fit the sheet's " + std::to_string(columns - 1) + " value columns";
    if (check.rows > rows)
        return std::to_string(check.rows) + " rows do not fit the sheet (at most " + std::to_string(rows) + ")";
    return {};
}

FileCheck Check(const FileJob& job)
{
    FileCheck check;
    check.input = job.input;
    check.output = job.output;
    std::unique_ptr<SeriesReader> reader = MakeReader(job.inputFormat, job.spec);
    if (!reader)
        return Refuse(check, FileCheck::Verdict::Skipped, std::string(sys::FormatInfo(job.inputFormat).name) + " input needs a template");
    const bool throughTemplate = job.inputFormat != sys::FileFormat::Rbx0;
    if (sys::Status opened = reader->Open(job.input); !opened)
        return Refuse(check, throughTemplate ? FileCheck::Verdict::Skipped : FileCheck::Verdict::Fails,
                      opened.problem().Describe());
    const size_t count = reader->Header().items.size();
    std::vector<size_t> selection;
    if (job.items.empty()) {
        for (size_t i = 0; i < count; ++i)
            selection.push_back(i);
    } else if (const std::string problem = SelectionProblem(job.items, count); !problem.empty()) {
        return Refuse(check, FileCheck::Verdict::Fails, job.input + ": " + problem);
    } else {
        selection.assign(job.items.begin(), job.items.end());
    }
    if (selection.empty())
        return Refuse(check, FileCheck::Verdict::Skipped, job.input + ": the file has no items");
    check.items = selection.size();
    reader->Select(selection);
    reader->PassOverFaultyRows(true);

    RowWatch watch(reader->Header(), selection);
    Row row;
    bool faultBeforeFirstRow = false;
    std::uint64_t rejectedBefore = 0;
    while (reader->Next(row)) {
        faultBeforeFirstRow = faultBeforeFirstRow || (check.rows == 0 && reader->RejectedCount() > 0);
        watch.Add(row, reader->Location(), reader->RejectedCount() > rejectedBefore, check);
        rejectedBefore = reader->RejectedCount();
        if (check.rows++ == 0)
            check.firstStamp = FormatStamp(row.stamp);
        check.lastStamp = FormatStamp(row.stamp);
    }
    faultBeforeFirstRow = faultBeforeFirstRow || (check.rows == 0 && reader->RejectedCount() > 0);
    watch.Finish(check);
    check.rejected = reader->Rejected();
    check.rejectedCount = reader->RejectedCount();
    check.notes = reader->Notes();
    if (!reader->status())
        return Refuse(check, check.rows == 0 && throughTemplate ? FileCheck::Verdict::Skipped : FileCheck::Verdict::Fails,
                      reader->status().problem().Describe());
    // The rows themselves are listed below the file's line.
    if (check.rejectedCount > 0)
        return Refuse(check, faultBeforeFirstRow && throughTemplate ? FileCheck::Verdict::Skipped : FileCheck::Verdict::Fails,
                      Count(check.rejectedCount, "row does not read", "rows do not read"));
    if (const std::string refusal = WriterRefusal(job, check); !refusal.empty())
        return Refuse(check, FileCheck::Verdict::Fails, refusal);
    return check;
}

const char* VerdictWord(FileCheck::Verdict verdict)
{
    switch (verdict) {
    case FileCheck::Verdict::Fails: return "FAIL";
    case FileCheck::Verdict::Skipped: return "SKIP";
    default: return "ok";
    }
}

const char* VerdictJson(FileCheck::Verdict verdict)
{
    switch (verdict) {
    case FileCheck::Verdict::Fails: return "fails";
    case FileCheck::Verdict::Skipped: return "skipped";
    default: return "converts";
    }
}

// "every 15 minutes", "every 1 day", "every 90 seconds"
std::string StepText(Stamp step)
{
    struct Unit {
        Stamp seconds;
        const char* name;
    } units[] = {{86400, "day"}, {3600, "hour"}, {60, "minute"}, {1, "second"}};
    for (const Unit& unit : units)
        if (step % unit.seconds == 0)
            return "every " + std::to_string(step / unit.seconds) + " " + unit.name + (step == unit.seconds ? "" : "s");
    return {};
}

std::string Where(const std::string& file, long line)
{
    return Escaped(file) + (line > 0 ? ":" + std::to_string(line) : std::string());
}

std::string More(std::uint64_t count, size_t kept, const std::string& what)
{
    return count > kept ? "  ... and " + std::to_string(count - kept) + " more " + what + "\n" : std::string();
}

void AppendField(std::string& out, const char* name, std::string_view value)
{
    out += "\"";
    out += name;
    out += "\":";
    text::AppendJsonString(out, value);
}

struct Totals {
    size_t converts = 0, fails = 0, skipped = 0;
    std::uint64_t rejected = 0, gaps = 0, missing = 0, repeated = 0, decreasing = 0, decreases = 0;
};

Totals Sum(const std::vector<FileCheck>& checks)
{
    Totals totals;
    for (const FileCheck& check : checks) {
        (check.verdict == FileCheck::Verdict::Converts ? totals.converts
         : check.verdict == FileCheck::Verdict::Fails  ? totals.fails
                                                       : totals.skipped) += 1;
        totals.rejected += check.rejectedCount;
        for (const FileCheck::Gap& gap : check.gaps)
            totals.gaps += gap.gaps;
        totals.missing += check.missingSteps;
        totals.repeated += check.repeatedStamps;
        totals.decreasing += check.decreasingStamps;
        totals.decreases += check.decreaseCount;
    }
    return totals;
}

std::string FileJson(const FileCheck& check)
{
    std::string out = "{";
    AppendField(out, "input", check.input);
    out += ",";
    AppendField(out, "output", check.output);
    out += ",\"verdict\":\"" + std::string(VerdictJson(check.verdict)) + "\",";
    AppendField(out, "reason", check.reason);
    out += ",\"rows\":" + std::to_string(check.rows) + ",";
    AppendField(out, "first", check.firstStamp);
    out += ",";
    AppendField(out, "last", check.lastStamp);
    out += ",\"step\":" + (check.step > 0 ? std::to_string(check.step) : std::string("null"));
    out += ",\"rejectedCount\":" + std::to_string(check.rejectedCount) + ",\"rejected\":[";
    for (size_t i = 0; i < check.rejected.size(); ++i) {
        const sys::Problem& problem = check.rejected[i];
        out += (i ? ",{" : "{") + text::Format("\"line\":%ld,\"column\":%d,", problem.line, problem.column);
        AppendField(out, "reason", problem.message);
        out += "}";
    }
    out += "],\"missingSteps\":" + std::to_string(check.missingSteps) + ",\"gaps\":[";
    for (size_t i = 0; i < check.gaps.size(); ++i) {
        const FileCheck::Gap& gap = check.gaps[i];
        out += (i ? "," : "") + text::Format("{\"line\":%ld,\"from\":\"%s\",\"to\":\"%s\",\"missing\":%llu,\"gaps\":%llu}",
                                              gap.line, FormatStamp(gap.from).c_str(), FormatStamp(gap.to).c_str(),
                                              static_cast<unsigned long long>(gap.missing),
                                              static_cast<unsigned long long>(gap.gaps));
    }
    out += "],\"repeatedStamps\":" + std::to_string(check.repeatedStamps) +
           ",\"decreasingStamps\":" + std::to_string(check.decreasingStamps) + ",\"stampFaults\":[";
    for (size_t i = 0; i < check.stampFaults.size(); ++i) {
        const FileCheck::StampFault& fault = check.stampFaults[i];
        out += (i ? "," : "") +
               text::Format("{\"line\":%ld,\"previousLine\":%ld,\"stamp\":\"%s\",\"previous\":\"%s\",\"kind\":\"%s\"}",
                            fault.line, fault.previousLine, FormatStamp(fault.stamp).c_str(),
                            FormatStamp(fault.previous).c_str(), fault.stamp == fault.previous ? "repeated" : "decreasing");
    }
    out += "],\"decreaseCount\":" + std::to_string(check.decreaseCount) + ",\"decreases\":[";
    for (size_t i = 0; i < check.decreases.size(); ++i) {
        const FileCheck::Decrease& decrease = check.decreases[i];
        out += (i ? ",{" : "{") + text::Format("\"line\":%ld,", decrease.line);
        AppendField(out, "item", decrease.item);
        out += ",\"from\":" + Number(decrease.from) + ",\"to\":" + Number(decrease.to) + "}";
    }
    out += "],\"notes\":[";
    for (size_t i = 0; i < check.notes.size(); ++i) {
        out += i ? "," : "";
        text::AppendJsonString(out, check.notes[i]);
    }
    return out + "]}";
}

} // namespace

FileCheck CheckFile(const FileJob& job)
{
    try {
        return Check(job);
    } catch (const std::exception& e) {
        FileCheck check;
        check.input = job.input;
        check.output = job.output;
        return Refuse(check, FileCheck::Verdict::Fails, job.input + ": the file cannot be read: " + e.what());
    }
}

std::string DescribeCheck(const FileCheck& check)
{
    std::string out = std::string(VerdictWord(check.verdict)) + " " + Escaped(check.input) + ": ";
    if (check.rows > 0 || check.verdict == FileCheck::Verdict::Converts) {
        out += Count(check.rows, "row", "rows");
        if (check.rows > 0)
            out += ", " + check.firstStamp + " to " + check.lastStamp;
        if (check.step > 0)
            out += ", " + StepText(check.step);
    }
    if (check.verdict != FileCheck::Verdict::Converts)
        out += std::string(check.rows > 0 ? "; " : "") +
               (check.verdict == FileCheck::Verdict::Skipped ? "the template does not fit: " : "") + Escaped(check.reason);
    out += "\n";
    for (const sys::Problem& problem : check.rejected)
        out += "  " + Where(problem.file, problem.line) + (problem.column > 0 ? ":" + std::to_string(problem.column) : "") +
               ": rejected: " + Escaped(problem.message) + "\n";
    out += More(check.rejectedCount, check.rejected.size(), "rejected rows");
    for (const FileCheck::Gap& gap : check.gaps)
        out += "  " + Where(check.input, gap.line) + ": " + Count(gap.missing, "missing step", "missing steps") +
               (gap.gaps > 1 ? " in " + std::to_string(gap.gaps) + " gaps from " : " between ") + FormatStamp(gap.from) +
               (gap.gaps > 1 ? "" : " and " + FormatStamp(gap.to)) + "\n";
    for (const FileCheck::StampFault& fault : check.stampFaults)
        out += "  " + Where(check.input, fault.line) + ": the stamp " + FormatStamp(fault.stamp) +
               (fault.stamp == fault.previous ? " repeats that of line " + std::to_string(fault.previousLine)
                                              : " comes before " + FormatStamp(fault.previous) + " of line " +
                                                    std::to_string(fault.previousLine)) +
               "\n";
    out += More(check.repeatedStamps + check.decreasingStamps, check.stampFaults.size(), "stamps that do not rise");
    for (const FileCheck::Decrease& decrease : check.decreases)
        out += "  " + Where(check.input, decrease.line) + ": the accumulated item '" + Escaped(decrease.item) +
               "' decreases from " + Number(decrease.from) + " to " + Number(decrease.to) + "\n";
    out += More(check.decreaseCount, check.decreases.size(), "decreases");
    for (const std::string& note : check.notes)
        out += "  note: " + Escaped(note) + "\n";
    return out;
}

std::string DescribeChecks(const std::vector<FileCheck>& checks)
{
    const Totals totals = Sum(checks);
    return "dry run: " + Count(checks.size(), "file", "files") + ": " + std::to_string(totals.converts) +
           " would convert, " + std::to_string(totals.fails) + " would fail, " + std::to_string(totals.skipped) +
           " would be skipped; " + Count(totals.rejected, "rejected row", "rejected rows") + ", " +
           Count(totals.gaps, "gap", "gaps") + " (" + Count(totals.missing, "missing step", "missing steps") + "), " +
           Count(totals.repeated, "repeated stamp", "repeated stamps") + ", " +
           Count(totals.decreasing, "decreasing stamp", "decreasing stamps") + ", " +
           Count(totals.decreases, "decrease", "decreases") + " of accumulated items; nothing was written\n";
}

std::string ChecksJson(const std::vector<FileCheck>& checks)
{
    std::string out = "{\"files\":[";
    for (size_t i = 0; i < checks.size(); ++i)
        out += (i ? "," : "") + FileJson(checks[i]);
    const Totals totals = Sum(checks);
    out += text::Format("],\"summary\":{\"files\":%zu,\"converts\":%zu,\"fails\":%zu,\"skipped\":%zu,\"rejected\":%llu,"
                        "\"gaps\":%llu,\"missingSteps\":%llu,\"repeatedStamps\":%llu,\"decreasingStamps\":%llu,"
                        "\"decreases\":%llu}}\n",
                        checks.size(), totals.converts, totals.fails, totals.skipped,
                        static_cast<unsigned long long>(totals.rejected), static_cast<unsigned long long>(totals.gaps),
                        static_cast<unsigned long long>(totals.missing), static_cast<unsigned long long>(totals.repeated),
                        static_cast<unsigned long long>(totals.decreasing),
                        static_cast<unsigned long long>(totals.decreases));
    return out;
}

bool CheckJobFiles(const JobSetup& setup, unsigned threads, unsigned shard, unsigned shards,
                   std::vector<FileCheck>& checks, std::string& setupError)
{
    checks.clear();
    if (setupError = CheckJobSetup(setup); !setupError.empty())
        return false;
    const sys::FileFormat in = static_cast<sys::FileFormat>(setup.inputFormat);
    const sys::FileFormat outFormat = static_cast<sys::FileFormat>(setup.outputFormat);
    sys::Status loaded;
    std::unique_ptr<CSpecification> spec = LoadTemplate(in, setup.templateName, loaded);
    if (!loaded) {
        setupError = loaded.problem().Describe();
        return false;
    }
    const RunPlan runPlan(setup, LogPathFor(setup.logFile));
    std::vector<PlannedFile> plan;
    for (const PlannedFile& file : runPlan.Files())
        if (shards == 0 || InShare(file.input, shard, shards))
            plan.push_back(file);

    checks.resize(plan.size());
    std::atomic<size_t> next{0};
    auto work = [&] {
        for (size_t i = next++; i < plan.size(); i = next++) {
            if (!plan[i].refusal.empty()) {
                checks[i].input = plan[i].input;
                checks[i].output = plan[i].output;
                Refuse(checks[i], FileCheck::Verdict::Fails, plan[i].refusal);
                continue;
            }
            checks[i] = CheckFile({in, plan[i].input, spec.get(), setup.items, outFormat, plan[i].output, setup.title});
        }
    };
    const unsigned count = static_cast<unsigned>(std::min<size_t>(
        threads ? threads : std::max(1u, std::thread::hardware_concurrency()), std::max<size_t>(plan.size(), 1)));
    std::vector<std::thread> workers;
    for (unsigned t = 1; t < count; ++t)
        workers.emplace_back(work);
    work();
    for (std::thread& worker : workers)
        worker.join();
    return true;
}

int DryRunStatus(const std::vector<FileCheck>& checks, bool sharded)
{
    const bool allConvert = std::all_of(checks.begin(), checks.end(),
                                        [](const FileCheck& check) { return check.verdict == FileCheck::Verdict::Converts; });
    return allConvert && (!checks.empty() || sharded) ? kExitOk : kExitSomeFailed;
}

int DryRunJob(const JobSetup& setup, std::FILE* out, bool json, unsigned threads, unsigned shard, unsigned shards)
{
    std::vector<FileCheck> checks;
    std::string setupError;
    if (!CheckJobFiles(setup, threads, shard, shards, checks, setupError)) {
        std::fprintf(out, "setup error: %s\n", Escaped(setupError).c_str());
        return kExitSetup;
    }
    if (json) {
        std::fputs(ChecksJson(checks).c_str(), out);
    } else {
        for (const FileCheck& check : checks)
            std::fputs(DescribeCheck(check).c_str(), out);
        std::fputs(DescribeChecks(checks).c_str(), out);
    }
    return DryRunStatus(checks, shards > 0);
}

} // namespace converter
