#include "platform/bridge/BridgeComponent.h"

#include "platform/bridge/BridgeVerdict.h"

#include <mutex>

namespace bridge {

namespace {

class CTimeSeriesBridge : public ITimeSeriesBridge {
public:
    int SetBridgeName(const CString& name) override
    {
        m_request.bridgeName = name;
        return 1;
    }
    int SetParameters(const CString& parameters) override
    {
        m_request.parameters = parameters;
        return 1;
    }
    int SetDataFile(const CString& path) override
    {
        m_request.dataFile = path;
        return 1;
    }
    int SetFolderScan(short scan) override
    {
        m_request.folderScan = scan != 0;
        return 1;
    }
    int GetVerdict(unsigned short* verdict) override
    {
        if (!verdict)
            return 0;
        const Verdict judged = Judge(m_request);
        m_reason = judged.reason;
        *verdict = judged.accepted ? kVerdictTrue : kVerdictFalse;
        return 1;
    }
    CString GetReason() const override { return m_reason; }

private:
    Request m_request;
    CString m_reason;
};

class CTimeSeriesComponent : public ITimeSeriesComponent {
public:
    int GetBridge(std::unique_ptr<ITimeSeriesBridge>& bridge) override
    {
        bridge = std::make_unique<CTimeSeriesBridge>();
        return 1;
    }
};

std::mutex g_factoryMutex;
ComponentFactory g_factory; // empty: the real component

} // namespace

std::unique_ptr<ITimeSeriesComponent> CreateComponent()
{
    ComponentFactory factory;
    {
        std::lock_guard<std::mutex> lock(g_factoryMutex);
        factory = g_factory;
    }
    if (factory)
        return factory();
    return std::make_unique<CTimeSeriesComponent>();
}

ScopedComponentFactory::ScopedComponentFactory(ComponentFactory factory)
{
    std::lock_guard<std::mutex> lock(g_factoryMutex);
    m_previous = std::move(g_factory);
    g_factory = factory ? std::move(factory) : [] { return std::unique_ptr<ITimeSeriesComponent>(); };
}

ScopedComponentFactory::~ScopedComponentFactory()
{
    std::lock_guard<std::mutex> lock(g_factoryMutex);
    g_factory = std::move(m_previous);
}

} // namespace bridge
