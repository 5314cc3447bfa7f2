#pragma once
// The time-series bridge component: asked whether a template fits a data file, it reads the file with
// the conversion engine's own readers and answers with a verdict. Its shape follows the toolbox's
// component model: a factory makes the component (and may fail), the component hands out a bridge
// object, the bridge object takes its inputs one call at a time and gives the verdict.
//
//     std::unique_ptr<bridge::ITimeSeriesComponent> component = bridge::CreateComponent();
//     std::unique_ptr<bridge::ITimeSeriesBridge> ts;
//     component->GetBridge(ts);
//     ts->SetBridgeName("ASCII Timeseries Bridge (General)");
//     ts->SetParameters("TemplateFilePath=/data/rain.xml");
//     ts->SetDataFile("/data/rain.txt");
//     ts->SetFolderScan(0);
//     unsigned short verdict = 0;
//     ts->GetVerdict(&verdict); // 65535: the engine would convert the file with this template
//
// Calls return 1 when done and 0 when not; callers may ignore them, as the verdict says it all.
#include "platform/system/Types.h"

#include <functional>
#include <memory>

namespace bridge {

inline constexpr unsigned short kVerdictTrue = 65535;
inline constexpr unsigned short kVerdictFalse = 0;
inline constexpr short kFolderScan = -1; // all bits set, as a 16-bit true
inline constexpr short kSingleFile = 0;

class ITimeSeriesBridge {
public:
    virtual ~ITimeSeriesBridge() = default;
    // Selects the reader: "rbx Timeseries Bridge", "ASCII Timeseries Bridge (General)" or
    // "Excel Timeseries Bridge". Another name gives a false verdict.
    virtual int SetBridgeName(const CString& name) = 0;
    // "TemplateFilePath=" followed by the template file's path.
    virtual int SetParameters(const CString& parameters) = 0;
    virtual int SetDataFile(const CString& path) = 0;
    // Nonzero when the file is judged as one of a folder the engine converts file by file.
    virtual int SetFolderScan(short scan) = 0;
    // Reads the file and sets `verdict` to kVerdictTrue or kVerdictFalse.
    virtual int GetVerdict(unsigned short* verdict) = 0;
    // Why the last verdict was false ("file:line: what was expected"); empty after a true one.
    virtual CString GetReason() const = 0;
};

class ITimeSeriesComponent {
public:
    virtual ~ITimeSeriesComponent() = default;
    // A new bridge object; `bridge` stays null when none can be made.
    virtual int GetBridge(std::unique_ptr<ITimeSeriesBridge>& bridge) = 0;
};

// Creates the component; null when it cannot be created.
std::unique_ptr<ITimeSeriesComponent> CreateComponent();

using ComponentFactory = std::function<std::unique_ptr<ITimeSeriesComponent>()>;

// Makes CreateComponent use `factory` for the lifetime of this object, process-wide; an empty
// factory makes creation fail. Tests put a recording component, or none, in place of the real one.
class ScopedComponentFactory {
public:
    explicit ScopedComponentFactory(ComponentFactory factory);
    ~ScopedComponentFactory();
    ScopedComponentFactory(const ScopedComponentFactory&) = delete;
    ScopedComponentFactory& operator=(const ScopedComponentFactory&) = delete;

private:
    ComponentFactory m_previous;
};

} // namespace bridge
