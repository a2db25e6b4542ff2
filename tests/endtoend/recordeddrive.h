#pragma once

#include "simulator/car/drivemodel.h"
#include "tests/endtoend/requestwindows.h"

#include <cmath>
#include <fstream>
#include <map>
#include <optional>
#include <string>
#include <vector>

// The lowest and the highest value of something within a time.
struct Range
{
    double low;
    double high;
};

// The drive model, asked often for the same moments.
class KnownDrive
{
public:
    explicit KnownDrive(obdsim::EngineData const& engine) : m_model(engine) {}

    template <class Value>
    Range range(obdsim::Ms from, obdsim::Ms to, Value value)
    {
        Range range{value(at(from)), value(at(from))};
        for (obdsim::Ms time = from; time <= to; ++time) {
            double const number = value(at(time));
            range = {std::min(range.low, number), std::max(range.high, number)};
        }
        return range;
    }

private:
    obdsim::DriveState const& at(obdsim::Ms time)
    {
        auto found = m_states.find(time.count());
        if (found == m_states.end()) {
            found = m_states.emplace(time.count(), m_model.at(time)).first;
        }
        return found->second;
    }

    obdsim::DriveModel m_model;
    std::map<long, obdsim::DriveState> m_states;
};

// The cells of a line of a CSV file.
inline std::vector<std::string> splitCsv(std::string const& line)
{
    std::vector<std::string> cells(1);
    bool quoted = false;
    for (char const each : line) {
        if (each == '"') {
            quoted = !quoted;
        } else if (each == ',' && !quoted) {
            cells.emplace_back();
        } else {
            cells.back() += each;
        }
    }
    return cells;
}

// "1970-01-01T00:01:02.345Z" as 62345 ms.
inline long millisOfDay(std::string const& time)
{
    long const minutes = std::stol(time.substr(11, 2)) * 60 + std::stol(time.substr(14, 2));
    return (minutes * 60 + std::stol(time.substr(17, 2))) * 1000 + std::stol(time.substr(20, 3));
}

// What one reading of a column says, in as many rows as it stands in.
struct Reading
{
    RequestWindow asked;
    std::string text;
    double number;
    double shown; // the step of its last digit
};

// By how much a text may be from the number behind it: a PID's step is rounded, whole numbers are cut off.
inline double tolerance(Reading const& reading, double step)
{
    return step / 2 + (reading.shown < 1.0 ? reading.shown / 2 : 1.0) + 1e-9;
}

inline double lastDigit(std::string const& text)
{
    std::size_t const point = text.find('.');
    return point == std::string::npos ? 1.0 : std::pow(10.0, -static_cast<double>(text.size() - point - 1));
}

// The windows of a row's readings, in the order of its columns behind the time.
using RowWindows = std::vector<RequestWindow>;

// A CSV file of live values, as anyone reads it, with the windows beside it.
class RecordedDrive
{
public:
    RecordedDrive(std::string const& file, std::map<long, RowWindows> const& windowsAt)
    {
        std::ifstream in(file);
        std::string line;
        std::getline(in, line);
        titles = splitCsv(line);
        while (std::getline(in, line)) {
            rows.push_back(splitCsv(line));
            windows.push_back(windowsAt.at(millisOfDay(rows.back().front())));
        }
    }

    std::optional<std::size_t> column(std::string const& title) const
    {
        for (std::size_t i = 0; i < titles.size(); ++i) {
            if (titles[i] == title) {
                return i;
            }
        }
        return std::nullopt;
    }
    // The readings of a column, each once.
    std::vector<Reading> readings(std::size_t column) const
    {
        std::vector<Reading> found;
        for (std::size_t i = 0; i < rows.size(); ++i) {
            std::string const& text = rows[i].at(column);
            RequestWindow const& asked = windows[i].at(column - 1);
            if (text != "-" && (found.empty() || found.back().asked.sent != asked.sent)) {
                found.push_back({asked, text, std::stod(text), lastDigit(text)});
            }
        }
        return found;
    }

    std::vector<std::string> titles;
    std::vector<std::vector<std::string>> rows;

private:
    std::vector<RowWindows> windows;
};
