#pragma once
// A complete template proposed from the head of a file: how its lines split, where its dates and
// times stand and how they read, which rows above the data hold item names, item types, units and
// value types, where the data start, and the missing-value marker. Each choice comes with its
// evidence; a file that is no time series is refused with the reason and the line.
#include "guess/Sample.h"
#include "templates/Specification.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace guess {

enum class InputKind { Ascii, Excel };

// How much of a file a guess reads: never more, whatever the file's size.
struct GuessLimits {
    size_t lines = 200;          // text lines, or worksheet rows
    size_t bytes = 1024 * 1024;  // of a text file
};

struct TemplateGuess {
    std::string file;
    InputKind kind = InputKind::Ascii;
    std::unique_ptr<CSpecification> spec; // null when refused
    std::vector<Finding> findings;
    std::optional<Refusal> refusal;
    long rowsRead = 0;           // lines or worksheet rows looked at
    std::uint64_t bytesRead = 0; // of a text file
    bool wholeFile = false;
    int sheet = 1;
};

// The kind a file's extension names: .xls and .xlsx are workbooks, anything else text.
InputKind KindOfFile(const std::string& path);

TemplateGuess GuessTemplate(const std::string& path, InputKind kind, const GuessLimits& limits = {});

} // namespace guess
