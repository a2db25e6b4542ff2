#include <common/clock.h>
#include <common/localtime.h>
#include <common/tracelogger.h>

#include <iomanip>
#include <sstream>
#include <thread>

namespace tervex {
namespace {

char const* levelWord(int level)
{
    static constexpr char const* words[] = {"DEBUG", "INFO", "ERROR", "FATAL"};
    return level >= 0 && level < 4 ? words[level] : "";
}

} // namespace

void TraceLogger::log(char const* /*file*/, int /*line*/, int level, std::string const& message)
{
    if (!m_enabled) {
        return;
    }
    std::tm const now = toLocalTime(clock().wallSeconds());
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << std::setfill('0') << now.tm_year + 1900 << "-" << std::setw(2) << now.tm_mon + 1 << "-" << std::setw(2)
         << now.tm_mday << " " << std::setw(2) << now.tm_hour << ":" << std::setw(2) << now.tm_min << ":"
         << std::setw(2) << now.tm_sec << " " << std::this_thread::get_id() << " " << levelWord(level) << " - "
         << message << "\n";
    write(text.str());
}

} // namespace tervex
