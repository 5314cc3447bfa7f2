#pragma once
// A guess told to people (the evidence of each choice, the ambiguities and what decided them) and
// to programs (one JSON object).
#include "guess/TemplateGuess.h"

#include <string>

namespace guess {

// "Read the first 12 lines (412 bytes) of FILE, the whole file." and one block per choice.
std::string ExplainGuess(const TemplateGuess& guess);
// "FILE:LINE: cannot be read as a time series: REASON"
std::string DescribeRefusal(const TemplateGuess& guess);
// {"ok", "file", "kind", "read", "template" (as `velmora template show --json`), "findings", "refusal"}
std::string GuessJson(const TemplateGuess& guess);

} // namespace guess
