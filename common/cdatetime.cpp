#include <common/cdatetime.h>
#include <common/localtime.h>

#include <iomanip>
#include <locale>
#include <sstream>

namespace obd {

CDateTime::CDateTime(int secondsSinceEpoch)
    : CDateTime(tervex::toLocalTime(static_cast<std::time_t>(secondsSinceEpoch)))
{}

CDateTime::CDateTime(std::tm const& fields)
    : CDateTime(fields.tm_year + 1900, fields.tm_mon + 1, fields.tm_mday, fields.tm_hour, fields.tm_min, fields.tm_sec)
{}

CDateTime::CDateTime(int year, int month, int day, int hour, int minute, int second)
    : m_year(static_cast<unsigned int>(year)), m_month(static_cast<unsigned int>(month)),
      m_day(static_cast<unsigned int>(day)), m_hour(static_cast<unsigned int>(hour)),
      m_minute(static_cast<unsigned int>(minute)), m_second(static_cast<unsigned int>(second))
{}

CDateTime CDateTime::currentDateTime()
{
    return CDateTime(tervex::toLocalTime(tervex::clock().wallSeconds()));
}

unsigned int CDateTime::toSeconds() const
{
    std::tm fields{};
    fields.tm_year = static_cast<int>(m_year) - 1900;
    fields.tm_mon = static_cast<int>(m_month) - 1;
    fields.tm_mday = static_cast<int>(m_day);
    fields.tm_hour = static_cast<int>(m_hour);
    fields.tm_min = static_cast<int>(m_minute);
    fields.tm_sec = static_cast<int>(m_second);
    fields.tm_isdst = 0;
    std::time_t const seconds = tervex::fromLocalTime(fields);
    return seconds < 0 ? 0 : static_cast<unsigned int>(seconds);
}

std::string CDateTime::toString() const
{
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << std::setfill('0') << m_year << "-" << std::setw(2) << m_month << "-" << std::setw(2) << m_day << " "
         << std::setw(2) << m_hour << ":" << std::setw(2) << m_minute << ":" << std::setw(2) << m_second;
    return text.str();
}

} // namespace obd
