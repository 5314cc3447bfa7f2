#pragma once
// Settings of the in-process spreadsheet application, and the switches that tests and users set
// through the environment (documented in docs/spreadsheet.md):
//   VELMORA_SPREADSHEET=absent          the application cannot be started
//   VELMORA_SPREADSHEET_VERSION=11.0    the version it reports (default "16.0")
#include "platform/spreadsheet/Spreadsheet.h"
#include "platform/spreadsheet/WorkbookModel.h"

#include <optional>
#include <string>

namespace sheet {

struct ApplicationSettings {
    std::string version = "16.0";
    LoadOptions load;                     // how much of an opened workbook is held
    long long maxArrayCells = 1'000'000;  // largest range whose values or texts are handed out
};

// The settings the environment asks for; nothing when the application is to be absent.
std::optional<ApplicationSettings> SettingsFromEnvironment();

// Starts an application with explicit settings, whatever the environment says.
std::shared_ptr<Application> StartApplication(const ApplicationSettings& settings);

} // namespace sheet
