// Opening the file preview dialog on a large rbx0 file: what the dialog adds, in time and memory,
// to the parse that fills the table it shows. The dialog's lists read the parser's rows in place,
// so opening it should cost next to nothing however long the file is.
#include "bench/RbxBenchFiles.h"
#include "parsers/RbxPreviewFileParser.h"
#include "wizard/FilePreviewDlg.h"

#include <QApplication>
#include <QTableView>

#include <benchmark/benchmark.h>

#include <chrono>
#include <cstdio>

namespace {

using benchfiles::StatusBytes;
using Clock = std::chrono::steady_clock;

double SecondsSince(Clock::time_point start) { return std::chrono::duration<double>(Clock::now() - start).count(); }

void BM_OpenPreviewDialog(benchmark::State& state)
{
    const std::string path = benchfiles::MakeRbxFile(state.range(0));
    if (path.empty()) {
        state.SkipWithError("cannot write the rbx0 file");
        return;
    }
    for (auto _ : state) {
        state.PauseTiming();
        benchfiles::ResetPeak();
        const double start = StatusBytes("VmRSS:");
        CRbxPreviewFileParser parser;
        const Clock::time_point parseStart = Clock::now();
        if (!parser.Parse(path)) {
            state.SkipWithError("the parse failed");
            return;
        }
        const double parseSeconds = SecondsSince(parseStart);
        const double parsed = StatusBytes("VmHWM:");
        const CStringList titles = parser.BuildPreviewTitles();
        state.ResumeTiming();

        // What ShowPreview does through the Qt interface, up to the dialog's first paint.
        const Clock::time_point openStart = Clock::now();
        {
            CFilePreviewDlg dialog;
            dialog.m_vecHeader = titles;
            dialog.m_vecInputLines = parser.m_vecRawLines;
            dialog.m_vecResultRows = parser.m_vecRows;
            dialog.show();
            dialog.OnInitDialog();
            QApplication::processEvents();
            dialog.m_listResult->repaint();
            state.PauseTiming();
            state.counters["open_s"] = SecondsSince(openStart);
            state.counters["rows_shown"] = dialog.m_listResult->model()->rowCount();
            state.counters["dialog_adds_MB"] = (StatusBytes("VmHWM:") - parsed) / 1e6;
            state.ResumeTiming();
        }
        state.PauseTiming();
        state.counters["parse_s"] = parseSeconds;
        state.counters["parse_MB"] = (parsed - start) / 1e6;
        state.counters["open_per_parse"] = state.counters["open_s"] / parseSeconds;
        state.counters["memory_per_parse"] = state.counters["dialog_adds_MB"] / state.counters["parse_MB"];
        state.ResumeTiming();
    }
    std::remove(path.c_str());
}

} // namespace

BENCHMARK(BM_OpenPreviewDialog)->Arg(1000000)->Iterations(1)->Unit(benchmark::kMillisecond);

int main(int argc, char** argv)
{
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication application(argc, argv);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
