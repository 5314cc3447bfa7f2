#pragma once
// A dry run: every input file of a setup read with its template exactly as a conversion would read
// it, nothing written. Each file's report says what a run would make of it (converted, failed,
// skipped) and everything worth knowing on the way: its rows, first and last stamp, every row that
// does not read (file:line:column and why), missing steps of an equidistant series, stamps that
// repeat or go back, and accumulated values that decrease.
#include "converter/Converter.h"

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

namespace converter {

struct JobSetup;

struct FileCheck {
    enum class Verdict { Converts, Fails, Skipped };

    struct Gap {
        long line = 0; // the row after the gap
        Stamp from = 0, to = 0;
        std::uint64_t missing = 0; // steps missing in this gap (all its gaps when `gaps` > 1)
        std::uint64_t gaps = 1;    // equal gaps one after the other
    };
    struct StampFault {
        long line = 0, previousLine = 0;
        Stamp stamp = 0, previous = 0; // equal: a repeated stamp; less: a stamp that goes back
    };
    struct Decrease {
        long line = 0;
        std::string item;
        double from = 0, to = 0;
    };

    std::string input;
    std::string output;
    Verdict verdict = Verdict::Converts;
    std::string reason; // why it fails or is skipped
    std::uint64_t rows = 0;
    size_t items = 0;
    std::string firstStamp, lastStamp;
    Stamp step = 0; // the step of an equidistant series; 0 when the series has none

    std::vector<sys::Problem> rejected; // rows that do not read, the first few
    std::uint64_t rejectedCount = 0;
    std::vector<Gap> gaps;
    std::uint64_t missingSteps = 0;
    std::vector<StampFault> stampFaults;
    std::uint64_t repeatedStamps = 0, decreasingStamps = 0;
    std::vector<Decrease> decreases;
    std::uint64_t decreaseCount = 0;
    std::vector<std::string> notes;
};

// Reads `job.input` as ConvertFile would (the output named in the job is only named, never
// written) and reports on it; never throws.
FileCheck CheckFile(const FileJob& job);

// The report of one file for people: a first line "ok FILE: ...", "FAIL FILE: ..." or
// "SKIP FILE: ...", then one indented line per finding, each "FILE:LINE[:COLUMN]: ...".
std::string DescribeCheck(const FileCheck& check);
// "dry run: N files: ... would convert, ... would fail, ... would be skipped; ...; nothing was written"
std::string DescribeChecks(const std::vector<FileCheck>& checks);
// One JSON object {"files": [...], "summary": {...}}.
std::string ChecksJson(const std::vector<FileCheck>& checks);

// Every file a run of `setup` would convert (a share of them with `shard` K of `shards`), checked
// on `threads` threads (0: one per core). False with `setupError` when the setup cannot run.
bool CheckJobFiles(const JobSetup& setup, unsigned threads, unsigned shard, unsigned shards,
                   std::vector<FileCheck>& checks, std::string& setupError);
// 0 when every file would convert (and there was one, unless a share is checked), else 1.
int DryRunStatus(const std::vector<FileCheck>& checks, bool sharded);

// The whole setup as a dry run: the files a run would convert (a share of them with `shard` K of
// `shards`), each checked, the reports printed to `out` (text or JSON). The exit status a run
// would have: 0 when every file would convert, 1 when one would not, 3 when the setup cannot run.
int DryRunJob(const JobSetup& setup, std::FILE* out, bool json, unsigned threads = 0, unsigned shard = 0,
              unsigned shards = 0);

} // namespace converter
