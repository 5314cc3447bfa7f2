// Writes the example data files and templates under examples/: a river gauge as tab-delimited text
// with its template, a rain gauge as blank-separated text with item definitions in its template,
// and the river gauge again as an rbx0 file. Run: make_parser_examples EXAMPLES_FOLDER
#include "platform/rbx/RbxWriter.h"
#include "platform/units/Units.h"
#include "templates/AsciiSpecification.h"

#include <cmath>
#include <cstdio>
#include <fstream>
#include <string>

namespace {

constexpr int kHours = 72;

// A small flood wave: level in metres, discharge from a rating curve, one gap in the record.
double Level(int hour) { return 1.20 + 0.85 * std::exp(-std::pow((hour - 12) / 6.0, 2)); }
double Discharge(double level) { return 14.2 * std::pow(level - 0.35, 1.6); }
bool Missing(int hour) { return hour == 15 || hour == 16; }

bool WriteRiverText(const std::string& path)
{
    std::ofstream out(path, std::ios::binary);
    out << "# Velm at Oldbridge, gauge 4711, hourly values (-999 = no record)\n"
        << "Water Level\tDischarge\n"
        << "[m]\t[m^3/s]\n"
        << "Level:Instantaneous\tFlow:Mean_Step_Accumulated\n"
        << "Time\tLevel\tFlow\n";
    for (int hour = 0; hour < kHours; ++hour) {
        COleDateTime stamp = COleDateTime(2024, 3, 1, 0, 0, 0).AddDays(hour / 24.0);
        char line[128];
        if (Missing(hour))
            std::snprintf(line, sizeof(line), "%s\t-999\t-999\n", stamp.Format("%Y/%m/%d %H:%M:%S").c_str());
        else
            std::snprintf(line, sizeof(line), "%s\t%.3f\t%.2f\n", stamp.Format("%Y/%m/%d %H:%M:%S").c_str(),
                          Level(hour), Discharge(Level(hour)));
        out << line;
    }
    return static_cast<bool>(out);
}

bool WriteRiverTemplate(const std::string& path)
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = "Tab";
    spec.m_TimeDesc.m_nDateTimeOption = 0;
    spec.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD HH:mm:ss";
    spec.m_TimeDesc.m_nDateTimeCol = 1;
    spec.m_DataDesc.m_nUnitTypeRow = 2;
    spec.m_DataDesc.m_nUnitRow = 3;
    spec.m_DataDesc.m_nValueTypeRow = 4;
    spec.m_DataDesc.m_nItemDescriptionRow = 5;
    spec.m_DataDesc.m_nStartRow = 6;
    spec.m_DataDesc.m_nDeleteValueCheck = 1;
    spec.m_DataDesc.m_nDeleteValueRadio = 0;
    spec.m_DataDesc.m_strDeleteValue = "-999";
    if (!spec.Save(path)) {
        std::fprintf(stderr, "make_parser_examples: %s\n", spec.LastError().c_str());
        return false;
    }
    return true;
}

bool WriteRainText(const std::string& path)
{
    std::ofstream out(path, std::ios::binary);
    out << "Rain gauge Heath Farm, 10-minute totals\n"
        << "date time north south\n";
    for (int step = 0; step < 36; ++step) {
        COleDateTime stamp = COleDateTime(2024, 3, 1, 6, 0, 0).AddDays(step * 10 / 1440.0);
        const double north = step >= 6 && step < 20 ? 0.2 * ((step * 7) % 5) : 0.0;
        const double south = step >= 9 && step < 24 ? 0.1 * ((step * 3) % 7) : 0.0;
        char line[96];
        std::snprintf(line, sizeof(line), "%s %.1f %.1f\n", stamp.Format("%d.%m.%Y %H:%M").c_str(), north, south);
        out << line;
    }
    return static_cast<bool>(out);
}

bool WriteRainTemplate(const std::string& path)
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = "Space";
    spec.m_bIgnoreConsecutiveDelimiters = 0;
    spec.m_TimeDesc.m_nDateTimeOption = 0;
    spec.m_TimeDesc.m_strDateTimeFormat = "DD.MM.YYYY HH:mm";
    spec.m_TimeDesc.m_nDateTimeCol = 1;
    spec.m_DataDesc.m_nUnitTypeOption = 2;
    spec.m_DataDesc.m_nUnitOption = 2;
    spec.m_DataDesc.m_nValueTypeOption = 2;
    spec.m_DataDesc.m_nItemTitleOption = 1;
    spec.m_DataDesc.m_nItemDescriptionRow = 2;
    spec.m_DataDesc.m_nStartRow = 3;
    spec.m_DataDesc.m_vecItemDefs = {{"Rain North", "Rainfall", "mm", "Step_Accumulated"},
                                     {"Rain South", "Rainfall", "mm", "Step_Accumulated"}};
    spec.m_arrSelItems = {1, 0};
    if (!spec.Save(path)) {
        std::fprintf(stderr, "make_parser_examples: %s\n", spec.LastError().c_str());
        return false;
    }
    return true;
}

bool WriteRiverRbx(const std::string& path)
{
    rbx::FileDefinition definition;
    definition.title = "Velm at Oldbridge";
    definition.calendar = true;
    definition.timeUnitKey = units::kUnitSecond;
    definition.timeUnitText = "second";
    definition.calendarStart = COleDateTime(2024, 3, 1, 0, 0, 0);
    rbx::ItemInfo level;
    level.name = "Level";
    level.itemTypeKey = 100;
    level.itemTypeText = "Water Level";
    level.unitKey = 1000;
    level.unitText = "meter";
    level.dataType = rbx::kFloat32;
    level.deleteValue = -999;
    rbx::ItemInfo flow = level;
    flow.name = "Flow";
    flow.itemTypeKey = 102;
    flow.itemTypeText = "Discharge";
    flow.unitKey = 1300;
    flow.unitText = "cubic meter per second";
    flow.dataType = rbx::kFloat64;
    flow.valueType = rbx::kMeanStepAccumulated;
    definition.items = {level, flow};

    rbx::CRbxWriter writer;
    if (!writer.Open(path, definition)) {
        std::fprintf(stderr, "make_parser_examples: %s\n", writer.status().problem().Describe().c_str());
        return false;
    }
    for (int hour = 0; hour < kHours; ++hour) {
        const double values[2] = {Missing(hour) ? NAN : Level(hour), Missing(hour) ? NAN : Discharge(Level(hour))};
        if (!writer.WriteStep(hour * 3600.0, values))
            break;
    }
    if (!writer.Close()) {
        std::fprintf(stderr, "make_parser_examples: %s\n", writer.status().problem().Describe().c_str());
        return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2) {
        std::fprintf(stderr, "Usage: make_parser_examples EXAMPLES_FOLDER\n");
        return 2;
    }
    const std::string folder = argv[1];
    const bool ok = WriteRiverText(folder + "/data/river_gauge.txt") &&
                    WriteRiverTemplate(folder + "/templates/river_gauge.xml") &&
                    WriteRainText(folder + "/data/rain_gauge.txt") &&
                    WriteRainTemplate(folder + "/templates/rain_gauge.xml") &&
                    WriteRiverRbx(folder + "/data/river_gauge.rbx0");
    return ok ? 0 : 1;
}
