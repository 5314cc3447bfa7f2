#pragma once
// A setup made from the command line the way the wizard makes it: the same pages in the same order,
// each with its own checks and messages (wizard/*Form.h), on the road of a template used as it is.
// `setup new` writes it into a parameter document as Finish does; `convert` hands it to the engine.
#include "engine/Engine.h"
#include "guess/TemplateGuess.h"

#include <optional>
#include <string>
#include <vector>

namespace host {

struct SetupRequest {
    std::string input;        // a file or a folder
    int inputFormat = 0;      // 1 rbx0, 2 ASCII, 3 Excel; 0: told by the extension (of the folder's files)
    std::string templatePath; // empty: a template is guessed (ASCII and Excel input)
    std::string guessedTemplate; // where a guessed template is saved
    std::optional<CUIntArray> items; // none: as the item selection page ticks them
    std::string output;       // a file or a folder, as the input; a folder for a file input puts
                              // the output there under the input's name
    int outputFormat = 0;     // 0: told by the output's extension
    std::string outputFormatOption = "--output-format"; // named when the output format is needed
    std::string title;
    bool keepTemplateFile = false; // do not write the selection into the template file, as the wizard does
};

struct SetupOutcome {
    std::vector<std::string> messages; // what the pages showed, in order
    std::string failure;               // why the setup was refused, when no page said it
    std::optional<guess::TemplateGuess> guess;
    bool usage = false;                // the request itself is wrong (exit status 2)
};

// "0,2,5" (positions from 0, in output order); false for anything else or an empty list.
bool ReadItemList(const std::string& text, CUIntArray& items);

// 1 rbx0, 2 ASCII, 3 Excel by the extension of `path` (no extension: ASCII); 0 for other extensions.
int FormatOfExtension(const std::string& path);
// The format named on the command line ("rbx0", "ascii", "excel"), 0 for any other name.
int FormatOfName(const std::string& name);

// Why the bridge component refuses the input file of `engine` with the template at `templatePath`.
std::string BridgeRefusal(const CEngine& engine, const CString& templatePath);

// `path` from the root (a final "/" kept); empty stays empty.
std::string AbsolutePath(const std::string& path);

// Walks the pages for `request` and leaves the setup in `engine`; false with `outcome` saying why.
bool BuildSetup(const SetupRequest& request, CEngine& engine, SetupOutcome& outcome);

// "velmora setup: 2282 ..." lines of the messages shown, then the failure.
void PrintRefusal(const char* command, const SetupOutcome& outcome);

} // namespace host
