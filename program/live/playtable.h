#pragma once

#include "program/view/live/livetable.h"

#include <velmora/recording.h>

#include <cstddef>
#include <vector>

namespace velmora::cli {

// The live table of a recording: its sensors, or those that were chosen, with statistics from where it began.
class PlayTable
{
public:
    // The recording must outlive it.
    explicit PlayTable(Recording const& recording);

    // Those numbers of sensors, in that order, and nothing of them yet.
    void select(std::vector<std::size_t> const& sensors);
    std::vector<std::size_t> const& selected() const { return m_selected; }
    // Empties the statistics, as at the start.
    void restart() { select(m_selected); }

    // A value of one; of others than the selected ones nothing is taken. Gives its row, or null.
    LiveRow const* take(std::size_t sensor, RecordedValue const& value);
    // Lets grow old what has not come for long at a time of the recording.
    void expire(std::int64_t time);

    LiveTable& table() { return m_table; }
    std::vector<LiveRow> const& rows() const { return m_table.rows(); }

    // A time of the recording as the table's.
    static LiveTime timeOf(std::int64_t millis) { return LiveTime(std::chrono::milliseconds(millis)); }

private:
    struct Statistics
    {
        unsigned long count = 0;
        double lowest = 0.0;
        double highest = 0.0;
        double mean = 0.0;
    };

    Recording const& m_recording;
    std::vector<std::size_t> m_selected;
    std::vector<Statistics> m_statistics; // by the sensor's number
    LiveTable m_table;
};

} // namespace velmora::cli
