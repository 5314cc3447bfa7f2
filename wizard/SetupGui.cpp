#include "wizard/SetupGui.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/ui/qt/QtUserInterface.h"
#include "wizard/Wizard.h"

#include <QApplication>

#include <memory>
#include <optional>

namespace {

// A Qt application for the call, unless the host runs one already.
class ApplicationForCall {
public:
    ApplicationForCall()
    {
        if (!QApplication::instance())
            m_application = std::make_unique<QApplication>(s_argc, s_argv);
    }

private:
    static inline int s_argc = 1;
    static inline char s_name[] = "velmora";
    static inline char* s_argv[] = {s_name, nullptr};
    std::unique_ptr<QApplication> m_application;
};

} // namespace

int ShowSetupWizard()
{
    ApplicationForCall application;
    std::optional<ui::QtUserInterface> qtInterface;
    std::optional<ui::ScopedUserInterface> installed;
    if (!ui::InstalledUserInterface()) {
        qtInterface.emplace();
        installed.emplace(*qtInterface);
    }
    CEngine engine;
    CWizard wizard; // built before the setup is read
    ReadSetup(engine);
    wizard.m_pEngine = &engine;
    const int result = wizard.DoModal();
    if (result == CHarborWizard::ID_WIZFINISH)
        WriteSetup(engine);
    // The working copy of the template served the checks and previews only.
    if (!engine.m_strWorkTemplate.empty())
        sys::DeleteFile(engine.m_strWorkTemplate);
    return result;
}
