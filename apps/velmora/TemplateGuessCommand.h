#pragma once
// `velmora template guess`: the sub-command's arguments after the word "guess".
#include <string>
#include <vector>

namespace host {

// Prints the usage lines of `template guess` and what its options do.
void PrintTemplateGuessHelp();
// Runs it; returns the exit status.
int RunTemplateGuess(const std::vector<std::string>& args);

} // namespace host
