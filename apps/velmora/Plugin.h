#pragma once
// The plug-in as the host sees it: libvelmora.so loaded with dlopen and its entry points resolved.
#include <memory>
#include <string>

namespace host {

class Plugin {
public:
    // Loads the plug-in from $VELMORA_PLUGIN, else libvelmora.so beside this program. Null with
    // `error` set when it cannot be loaded or lacks an entry point.
    static std::unique_ptr<Plugin> Load(std::string& error);
    ~Plugin();
    Plugin(const Plugin&) = delete;
    Plugin& operator=(const Plugin&) = delete;

    const std::string& Path() const { return m_path; }

    // Reads a parameter document into the plug-in's handle table: its handle, or 0 with `error` set.
    int LoadDocument(const std::string& path, std::string& error) const;
    bool SaveDocument(int handle, const std::string& path) const { return m_save(handle, path.c_str()) != 0; }
    void CloseDocument(int handle) const { m_close(handle); }

    void SetWpxHandle(int handle) const { m_setHandle(handle); }
    int GetWpxHandle() const { return m_getHandle(); }
    int RunEngine() const { return m_runEngine(); }
    int RunEngineSilent() const { return m_runEngineSilent(); }
    int ShowSetupGUI() const { return m_showSetupGui(); }

private:
    Plugin() = default;
    bool Resolve(std::string& error);

    void* m_library = nullptr;
    std::string m_path;
    void (*m_setHandle)(int) = nullptr;
    int (*m_getHandle)() = nullptr;
    int (*m_runEngine)() = nullptr;
    int (*m_runEngineSilent)() = nullptr;
    int (*m_showSetupGui)() = nullptr;
    int (*m_load)(const char*, char*, int) = nullptr;
    int (*m_save)(int, const char*) = nullptr;
    int (*m_close)(int) = nullptr;
};

} // namespace host
