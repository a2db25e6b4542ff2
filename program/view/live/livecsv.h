#pragma once

#include "program/view/live/livetable.h"

#include <cstdio>
#include <memory>
#include <string>

namespace velmora::cli {

// The header row: the time, then one column a sensor with its unit.
std::string toCsvHeader(std::vector<LiveRow> const& rows);

// The values of all sensors at a time, "-" for one without.
std::string toCsvRow(std::vector<LiveRow> const& rows, std::string const& time);

// A recording of live values. Reaches the disk every second, so that a power cut loses no more.
class LiveCsv
{
public:
    using WallTime = std::chrono::system_clock::time_point;

    // "-" is standard output, which goes on from where it is. A file that exists already is left alone until begin;
    // replaced tells what happens to it then. Throws Error if the file can't be opened.
    explicit LiveCsv(std::string const& file, bool replaced = false);

    bool toStandardOutput() const { return m_file == "-"; }
    std::string const& file() const { return m_file; }

    // Writes the header. A file that holds the same header already is added to; one that holds anything else is
    // replaced, or Error is thrown. start is the time of day at now: the rows count on from it, for a
    // clock that is set in the middle of a drive would tear the recording.
    void begin(LiveTable const& table, LiveTime now, WallTime start);
    // Writes a row when a round of all sensors has ended, or a second after the last row if there is anything new.
    // Throws Error when the file can't be written. False if the reader of standard output has gone.
    bool update(LiveTable const& table, LiveTime now);
    // Writes what has come since the last row.
    bool finish(LiveTable const& table, LiveTime now);

private:
    struct Close
    {
        void operator()(std::FILE* file) const;
    };

    bool joins(std::string const& header) const;
    void goOn();
    bool writeRow(LiveTable const& table, LiveTime now);
    bool write(std::string const& text);
    void sync(LiveTime now);

    std::string m_file;
    bool m_replaced;
    std::unique_ptr<std::FILE, Close> m_stream;
    unsigned long m_rounds = 0;   // at the last row
    unsigned long m_readings = 0; // at the last row
    LiveTime m_begin;
    WallTime m_start; // at m_begin
    LiveTime m_rowTime;
    LiveTime m_syncTime;
};

} // namespace velmora::cli
