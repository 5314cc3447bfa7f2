#include "apps/velmora/Plugin.h"
#include "platform/system/FileSystem.h"

#include <cstdlib>
#include <dlfcn.h>

namespace host {

namespace {

constexpr const char* kLibraryName = "libvelmora.so";
constexpr int kErrorBufferSize = 2048;

std::string PluginPath()
{
    if (const char* chosen = std::getenv("VELMORA_PLUGIN"); chosen && *chosen)
        return chosen;
    return sys::JoinPath(sys::ModuleFolder(nullptr), kLibraryName);
}

template <typename Function>
bool Bind(void* library, const char* name, Function& function, std::string& error)
{
    function = reinterpret_cast<Function>(::dlsym(library, name));
    if (!function)
        error = std::string("the plug-in has no entry point ") + name;
    return function != nullptr;
}

} // namespace

std::unique_ptr<Plugin> Plugin::Load(std::string& error)
{
    std::unique_ptr<Plugin> plugin(new Plugin());
    plugin->m_path = PluginPath();
    // The plug-in brings Qt, whose libraries cannot be unloaded cleanly: it stays mapped until the
    // process ends, and dlclose only drops the reference.
    plugin->m_library = ::dlopen(plugin->m_path.c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NODELETE);
    if (!plugin->m_library) {
        const char* reason = ::dlerror();
        error = "cannot load the plug-in " + plugin->m_path + ": " + (reason ? reason : "unknown reason");
        return nullptr;
    }
    if (!plugin->Resolve(error)) {
        error = plugin->m_path + ": " + error;
        return nullptr;
    }
    return plugin;
}

Plugin::~Plugin()
{
    if (m_library)
        ::dlclose(m_library);
}

bool Plugin::Resolve(std::string& error)
{
    return Bind(m_library, "SetWpxHandle", m_setHandle, error) && Bind(m_library, "GetWpxHandle", m_getHandle, error) &&
           Bind(m_library, "RunEngine", m_runEngine, error) &&
           Bind(m_library, "RunEngineSilent", m_runEngineSilent, error) &&
           Bind(m_library, "ShowSetupGUI", m_showSetupGui, error) &&
           Bind(m_library, "LoadWpxDocument", m_load, error) && Bind(m_library, "SaveWpxDocument", m_save, error) &&
           Bind(m_library, "CloseWpxDocument", m_close, error);
}

int Plugin::LoadDocument(const std::string& path, std::string& error) const
{
    char buffer[kErrorBufferSize] = {};
    int handle = m_load(path.c_str(), buffer, kErrorBufferSize);
    if (!handle)
        error = buffer[0] ? buffer : path + ": cannot read the parameter document";
    return handle;
}

} // namespace host
