#pragma once
// A German locale built for the tests with localedef in a scratch folder and reached through
// LOCPATH, so that tests of "User Locale" need no locale installed on the machine.
#include "tests/support/ScopedEnv.h"

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <string>

namespace testsupport {

class ScratchLocale {
public:
    static constexpr const char* kName = "de_DE.UTF-8";

    // Built once per test program; Available() is false when the system has no localedef or no
    // locale sources, and tests then skip saying so.
    static const ScratchLocale& German()
    {
        static const ScratchLocale locale;
        return locale;
    }
    ~ScratchLocale()
    {
        std::error_code ignored;
        if (!m_folder.empty())
            std::filesystem::remove_all(m_folder, ignored);
    }

    bool Available() const { return m_available; }
    const std::string& Folder() const { return m_folder; }

private:
    ScratchLocale()
    {
        std::string pattern = (std::filesystem::temp_directory_path() / "velmora-locale-XXXXXX").string();
        if (!::mkdtemp(pattern.data()))
            return;
        m_folder = pattern;
        const std::string command = "localedef -i de_DE -f UTF-8 '" + m_folder + "/" + kName + "' >/dev/null 2>&1";
        // localedef may end with a warning status and still have built the locale.
        [[maybe_unused]] const int status = std::system(command.c_str());
        m_available = std::filesystem::exists(m_folder + "/" + kName + "/LC_NUMERIC");
    }

    std::string m_folder;
    bool m_available = false;
};

// The user's locale as the environment names it (a null value removes the variable), with LOCPATH
// pointing at the scratch locales.
class LocaleEnvironment {
public:
    LocaleEnvironment(const ScratchLocale& locale, const char* lcAll, const char* lcNumeric, const char* lang)
        : m_path("LOCPATH", locale.Folder()), m_all("LC_ALL", Value(lcAll)), m_numeric("LC_NUMERIC", Value(lcNumeric)),
          m_lang("LANG", Value(lang))
    {
    }

private:
    static std::optional<std::string> Value(const char* text) { return text ? std::optional<std::string>(text) : std::nullopt; }
    ScopedEnv m_path, m_all, m_numeric, m_lang;
};

} // namespace testsupport
