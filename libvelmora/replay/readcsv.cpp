#include "common/text/text.h"
#include "libvelmora/replay/recordingfile.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <string>

namespace velmora {

namespace {

constexpr char const* longCsvHeader = "time,vehicle,module,pid,sensor,name,value,unit";

// The fields of a line, with their quotes taken off. Nothing where a quote is not closed.
std::optional<std::vector<std::string>> fieldsOf(std::string const& line)
{
    std::vector<std::string> fields(1);
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        char const each = line[i];
        if (quoted && each == '"' && i + 1 < line.size() && line[i + 1] == '"') {
            fields.back() += '"';
            ++i;
        } else if (each == '"') {
            quoted = !quoted;
        } else if (each == ',' && !quoted) {
            fields.emplace_back();
        } else {
            fields.back() += each;
        }
    }
    return quoted ? std::nullopt : std::optional(fields);
}

// "Engine RPM (rpm)" of live, "7E8 RPM (rpm)" of watch.
SensorEntry sensorOfTitle(std::string const& title)
{
    SensorEntry entry;
    entry.name = title;
    std::size_t const unit = title.rfind(" (");
    if (unit != std::string::npos && title.ends_with(')')) {
        entry.unit = title.substr(unit + 2, title.size() - unit - 3);
        entry.name = title.substr(0, unit);
    }
    std::size_t const blank = entry.name.find(' ');
    std::optional<unsigned int> const module =
        blank != std::string::npos ? parseHex(entry.name.substr(0, blank), 0x1FFFFFFF) : std::nullopt;
    bool const plain = entry.name.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_", blank + 1) ==
                       std::string::npos; // without a blank, that is from the beginning on
    entry.sensor = entry.name;
    if (module && plain) {
        entry.module = *module;
        entry.sensor = entry.name.substr(blank + 1);
    }
    return entry;
}

[[noreturn]] void failCsv(std::size_t line, std::string const& why)
{
    throw Error(ErrorKind::WrongUse, fmt::format("Line {} can't be played: {}", line, why),
                {"a recording of live --csv, or of the outputs csv and csv-long, is wanted"});
}

class CsvReader
{
public:
    CsvReader(std::vector<std::string> const& header, bool isLong, std::size_t mostValues)
        : m_long(isLong), m_maker(mostValues)
    {
        for (std::size_t i = 1; !isLong && i < header.size(); ++i) {
            m_columns.push_back(m_maker.sensor(sensorOfTitle(header[i])));
        }
        m_fields = header.size();
    }

    std::size_t fields() const { return m_fields; }
    bool add(std::vector<std::string> const& fields, std::int64_t time)
    {
        if (m_long) {
            SensorEntry const entry{parseHex(fields[2], 0x1FFFFFFF).value_or(0), fields[4], fields[3], fields[5],
                                    fields[7]};
            return m_maker.add(m_maker.sensor(entry), time, fields[6]);
        }
        for (std::size_t i = 0; i < m_columns.size(); ++i) {
            // An empty field means that the row has no reading of it, a dash that there was none.
            if (!fields[i + 1].empty() && !m_maker.add(m_columns[i], time, fields[i + 1])) {
                return false;
            }
        }
        return true;
    }
    Recording finish() { return m_maker.finish(); }

private:
    bool const m_long;
    std::size_t m_fields = 0;
    RecordingMaker m_maker;
    std::vector<std::size_t> m_columns; // their sensors
};

} // namespace

Recording readCsv(std::istream& in, std::size_t mostValues)
{
    std::string line;
    std::getline(in, line);
    std::optional<std::vector<std::string>> const header = fieldsOf(line);
    if (!header || header->size() < 2 || header->front() != "time") {
        failCsv(1, "it is no header that begins with time");
    }
    CsvReader reader(*header, line == longCsvHeader, mostValues);
    for (std::size_t number = 2; std::getline(in, line); ++number) {
        bool const torn = in.eof();
        std::optional<std::vector<std::string>> const fields = fieldsOf(line);
        std::optional<std::int64_t> const time = fields ? timeIn(fields->front()) : std::nullopt;
        if (!time || fields->size() != reader.fields()) {
            if (torn || line.empty()) {
                continue;
            }
            failCsv(number, !time ? "it begins with no time" : "it has other columns than the header");
        }
        if (!reader.add(*fields, *time)) {
            break;
        }
    }
    return reader.finish();
}

} // namespace velmora
