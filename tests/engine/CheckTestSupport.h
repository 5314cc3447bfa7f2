#pragma once
// Shared pieces of the setup-check tests: scratch folders, environment switches and a bridge
// component that records what it is asked and answers as told.
#include "platform/bridge/BridgeComponent.h"
#include "platform/system/Types.h"
#include "tests/support/ScopedEnv.h"
#include "tests/support/ScratchFolder.h"

#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace checktest {

using testsupport::ScratchFolder;

// Sets (or, with nullopt, removes) an environment variable for the lifetime of the object.
using ScopedEnv = testsupport::ScopedEnv;

// The spreadsheet application present in a given version, or absent.
inline ScopedEnv SpreadsheetVersion(const char* version) { return ScopedEnv("VELMORA_SPREADSHEET_VERSION", version); }

struct BridgeCall {
    std::vector<std::string> order; // the setters in the order they were called
    CString name;
    CString parameters;
    CString file;
    short folderScan = 0;
};

// A bridge component that records every bridge object's inputs and answers with `verdict(call)`.
struct RecordingBridge {
    std::vector<BridgeCall> calls;
    int componentsCreated = 0;
    std::function<unsigned short(const BridgeCall&)> verdict = [](const BridgeCall&) { return bridge::kVerdictTrue; };
    bool throwOnVerdict = false;
    bool noBridgeObject = false;

    bridge::ComponentFactory Factory();
};

namespace detail {

class RecordingBridgeObject : public bridge::ITimeSeriesBridge {
public:
    explicit RecordingBridgeObject(RecordingBridge& owner) : m_owner(owner), m_index(owner.calls.size())
    {
        owner.calls.emplace_back();
    }
    int SetBridgeName(const CString& name) override { return Record("name", [&](BridgeCall& c) { c.name = name; }); }
    int SetParameters(const CString& parameters) override
    {
        return Record("parameters", [&](BridgeCall& c) { c.parameters = parameters; });
    }
    int SetDataFile(const CString& path) override { return Record("file", [&](BridgeCall& c) { c.file = path; }); }
    int SetFolderScan(short scan) override { return Record("scan", [&](BridgeCall& c) { c.folderScan = scan; }); }
    int GetVerdict(unsigned short* verdict) override
    {
        Record("verdict", [](BridgeCall&) {});
        if (m_owner.throwOnVerdict)
            throw std::runtime_error("the component failed");
        *verdict = m_owner.verdict(m_owner.calls[m_index]);
        return 1;
    }
    CString GetReason() const override { return CString(); }

private:
    int Record(const char* what, const std::function<void(BridgeCall&)>& set)
    {
        BridgeCall& call = m_owner.calls[m_index];
        call.order.push_back(what);
        set(call);
        return 1;
    }
    RecordingBridge& m_owner;
    size_t m_index;
};

class RecordingComponent : public bridge::ITimeSeriesComponent {
public:
    explicit RecordingComponent(RecordingBridge& owner) : m_owner(owner) {}
    int GetBridge(std::unique_ptr<bridge::ITimeSeriesBridge>& object) override
    {
        if (m_owner.noBridgeObject)
            return 0;
        object = std::make_unique<RecordingBridgeObject>(m_owner);
        return 1;
    }

private:
    RecordingBridge& m_owner;
};

} // namespace detail

inline bridge::ComponentFactory RecordingBridge::Factory()
{
    return [this]() -> std::unique_ptr<bridge::ITimeSeriesComponent> {
        ++componentsCreated;
        return std::make_unique<detail::RecordingComponent>(*this);
    };
}

} // namespace checktest
