#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/linefile.h"

#include <map>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// One column a sensor and one row a round: a row ends when a sensor comes again, or a second after its first value. A
// sensor that was not read in a row leaves its field empty; one that told nothing has "-".
class CsvOutput : public IOutput
{
public:
    explicit CsvOutput(OutputAddress const& address) : m_file(address) {}

    void open() override {}
    void write(Records records) override;
    void close() override;

private:
    using Key = std::pair<unsigned int, std::string>; // module and sensor

    struct Table
    {
        std::vector<std::string> titles;
        std::map<Key, std::size_t> columns;
        std::vector<std::string> row;
        WallTime rowTime;
        bool rowBegun = false;
    };

    void select(SensorList const& list);
    void take(Reading const& reading);
    void addColumn(SensorEntry const& sensor);
    std::string header() const;
    void finishRow();
    void flush();

    LineFile m_file;
    Table m_table;
    std::string m_lines; // of the write under way
    WallTime m_now;      // of the latest reading
};

// One line a reading: time, vehicle, module, PID, sensor, name, value, unit.
class CsvLongOutput : public IOutput
{
public:
    explicit CsvLongOutput(OutputAddress const& address) : m_file(address) {}

    void open() override;
    void write(Records records) override;
    void close() override { m_file.close(); }

private:
    LineFile m_file;
};

} // namespace velmora
