#include "platform/system/Process.h"

#include <cerrno>
#include <cctype>
#include <cstdlib>
#include <fstream>
#include <signal.h>
#include <sstream>
#include <unistd.h>

namespace sys {

namespace {

constexpr size_t kBootTagLength = 8;
// Start times count in clock ticks; a process seen in the same second as its start is not later.
constexpr std::int64_t kStartSlackSeconds = 1;

std::string FirstLine(const char* path)
{
    std::ifstream in(path);
    std::string line;
    std::getline(in, line);
    return line;
}

// When process `pid` started, in seconds since 1970; 0 when the system does not say.
std::int64_t StartTime(long pid)
{
    const std::string stat = FirstLine(("/proc/" + std::to_string(pid) + "/stat").c_str());
    // The command name in parentheses may hold blanks: the fields count from the last ')'.
    const size_t close = stat.rfind(')');
    const long ticksPerSecond = ::sysconf(_SC_CLK_TCK);
    const std::int64_t boot = BootTime();
    if (close == std::string::npos || ticksPerSecond <= 0 || boot == 0)
        return 0;
    std::istringstream fields(stat.substr(close + 1));
    std::string field;
    for (int n = 3; n <= 22 && fields >> field; ++n)
        if (n == 22)
            return boot + static_cast<std::int64_t>(std::strtoull(field.c_str(), nullptr, 10) /
                                                  static_cast<unsigned long long>(ticksPerSecond));
    return 0;
}

} // namespace

std::string BootTag()
{
    static const std::string tag = [] {
        std::string digits;
        for (char c : FirstLine("/proc/sys/kernel/random/boot_id")) {
            if (digits.size() == kBootTagLength)
                break;
            if (std::isxdigit(static_cast<unsigned char>(c)))
                digits += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        }
        return digits.size() == kBootTagLength ? digits : std::string(kBootTagLength, '0');
    }();
    return tag;
}

std::int64_t BootTime()
{
    static const std::int64_t boot = [] {
        std::ifstream in("/proc/stat");
        for (std::string key; in >> key;) {
            if (key == "btime") {
                std::int64_t seconds = 0;
                in >> seconds;
                return seconds;
            }
            in.ignore(1 << 20, '\n');
        }
        return std::int64_t{0};
    }();
    return boot;
}

bool MayStillRun(long pid, std::int64_t seenAt)
{
    if (pid <= 0)
        return false;
    if (::kill(static_cast<pid_t>(pid), 0) != 0 && errno == ESRCH)
        return false;
    const std::int64_t started = StartTime(pid);
    return started == 0 || started <= seenAt + kStartSlackSeconds;
}

} // namespace sys
