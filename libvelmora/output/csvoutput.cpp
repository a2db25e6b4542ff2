#include "libvelmora/output/csvoutput.h"

#include "common/text/text.h"
#include "libvelmora/output/valuetext.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::chrono::seconds longestRow{1};

std::string valueField(Reading const& reading)
{
    if (std::string const* const text = std::get_if<std::string>(&reading.value)) {
        return csvField(*text);
    }
    std::optional<double> const number = numberOf(reading);
    return number ? numberText(*number) : "-";
}

std::string longLine(Reading const& reading)
{
    return utcTime(reading.time) + "," + csvField(reading.vehicle) + "," + moduleText(reading.module) + "," +
           csvField(reading.pid) + "," + csvField(reading.sensor) + "," + csvField(reading.name) + "," +
           valueField(reading) + "," + csvField(reading.unit) + "\n";
}

} // namespace

void CsvOutput::addColumn(SensorEntry const& sensor)
{
    Key const key(sensor.module, sensor.sensor);
    if (m_table.columns.emplace(key, m_table.titles.size()).second) {
        std::string const unit = sensor.unit.empty() ? "" : " (" + sensor.unit + ")";
        m_table.titles.push_back(moduleText(sensor.module) + " " + sensor.sensor + unit);
        m_table.row.emplace_back();
    }
}

void CsvOutput::select(SensorList const& list)
{
    flush();
    m_table = Table();
    for (SensorEntry const& each : list.sensors) {
        addColumn(each);
    }
}

void CsvOutput::take(Reading const& reading)
{
    m_now = reading.time;
    Key const key(reading.module, reading.sensor);
    if (!m_table.columns.contains(key)) {
        flush();
        addColumn({reading.module, reading.sensor, reading.pid, reading.name, reading.unit});
    }
    std::size_t const column = m_table.columns.at(key);
    bool const late =
        m_table.rowBegun && (reading.time - m_table.rowTime >= longestRow || reading.time < m_table.rowTime);
    if (late || !m_table.row[column].empty()) {
        finishRow();
    }
    if (!m_table.rowBegun) {
        m_table.rowBegun = true;
        m_table.rowTime = reading.time;
    }
    m_table.row[column] = valueField(reading);
}

std::string CsvOutput::header() const
{
    std::string text = "time";
    for (std::string const& title : m_table.titles) {
        text += "," + csvField(title);
    }
    return text + "\n";
}

void CsvOutput::finishRow()
{
    if (!m_table.rowBegun) {
        return;
    }
    m_lines += utcTime(m_table.rowTime);
    for (std::string& field : m_table.row) {
        m_lines += "," + field;
        field.clear();
    }
    m_lines += "\n";
    m_table.rowBegun = false;
}

// Before the columns change, all that stands under the old ones goes to their file.
void CsvOutput::flush()
{
    finishRow();
    if (!m_lines.empty()) {
        m_file.setHeader(header());
        m_file.add(m_lines, m_now);
        m_lines.clear();
    }
}

void CsvOutput::write(Records records)
{
    Table const before = m_table;
    m_lines.clear();
    try {
        for (SharedRecord const& record : records) {
            if (auto const* const reading = std::get_if<Reading>(record.get())) {
                take(*reading);
            } else if (auto const* const list = std::get_if<SensorList>(record.get())) {
                select(*list);
            }
        }
        if (records.empty()) {
            finishRow();
        }
        if (!m_lines.empty()) {
            m_file.setHeader(header());
            m_file.add(m_lines, m_now);
        }
    } catch (...) {
        m_table = before;
        throw;
    }
}

void CsvOutput::close()
{
    m_lines.clear();
    flush();
    m_file.close();
}

void CsvLongOutput::open()
{
    m_file.setHeader("time,vehicle,module,pid,sensor,name,value,unit\n");
}

void CsvLongOutput::write(Records records)
{
    std::string lines;
    WallTime now;
    for (SharedRecord const& record : records) {
        if (auto const* const reading = std::get_if<Reading>(record.get())) {
            lines += longLine(*reading);
            now = reading->time;
        }
    }
    m_file.add(lines, now);
}

} // namespace velmora
