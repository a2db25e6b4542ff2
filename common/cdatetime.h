#pragma once

#include <common/clock.h>

#include <string>

namespace obd {

using tervex::currentMillis;
using tervex::sleepMillis;

// A date and time of day, broken down in local time.
class CDateTime
{
public:
    // Breaks seconds since the epoch down in local time; a negative value lies before the epoch.
    explicit CDateTime(int secondsSinceEpoch);

    // Stores the values unchecked.
    CDateTime(int year, int month, int day, int hour, int minute, int second);

    static CDateTime currentDateTime();

    unsigned int year() const { return m_year; }     // full, such as 2024
    unsigned int month() const { return m_month; }   // 1 to 12
    unsigned int day() const { return m_day; }       // 1 to 31
    unsigned int hour() const { return m_hour; }     // 0 to 23
    unsigned int minute() const { return m_minute; } // 0 to 59
    unsigned int second() const { return m_second; } // 0 to 60

    // The reverse of the first constructor, read as standard time: a summer time is an hour off. 0 for what the C
    // library cannot tell or what lies before the epoch.
    unsigned int toSeconds() const;

    // "2024-03-07 09:05:02"; the year stands as it is, the other fields take two digits.
    std::string toString() const;

private:
    explicit CDateTime(std::tm const& fields);

    unsigned int m_year;
    unsigned int m_month;
    unsigned int m_day;
    unsigned int m_hour;
    unsigned int m_minute;
    unsigned int m_second;
};

} // namespace obd
