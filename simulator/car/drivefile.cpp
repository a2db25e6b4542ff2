#include "simulator/car/course.h"
#include "simulator/car/drive.h"
#include "simulator/error.h"
#include "simulator/textfile.h"
#include "simulator/textnumber.h"

#include <algorithm>
#include <iterator>
#include <sstream>
#include <string_view>

namespace obdsim {

namespace {

constexpr std::size_t mostRows = 200000;

/// Stop and go between lights, up to 50 km/h.
constexpr std::string_view town = R"(seconds,speed
0,0
12,0
19,32
31,48
44,49
52,0
78,0
86,38
104,50
121,47
128,22
133,30
149,50
158,0
171,0
176,12
181,5
186,14
192,0
203,0
212,44
236,50
249,31
262,50
274,0
300,0
)";

/// Up a slip road, along at 130 km/h with traffic ahead now and then, and off again.
constexpr std::string_view motorway = R"(seconds,speed
0,0
8,0
16,40
27,78
38,118
46,130
210,131
226,102
262,97
281,130
470,128
484,88
530,84
560,121
575,130
820,130
846,82
858,50
872,0
900,0
)";

/// A winter morning: the engine idles fast before a short way through a quarter.
constexpr std::string_view coldStart = R"(seconds,speed
0,0
75,0
86,24
110,31
118,0
131,0
142,33
190,48
240,50
252,0
270,0
280,36
360,50
378,0
420,0
)";

struct BuiltIn
{
    char const* name;
    std::string_view text;
    std::optional<double> ambientCelsius = {};
    std::optional<double> startCoolantCelsius = {};
};

constexpr BuiltIn builtIn[] = {
    {"town", town},
    {"motorway", motorway},
    {"cold-start", coldStart, -7, -7},
};

/// The cells of a line, without blanks around them.
std::vector<std::string> cells(std::string const& line)
{
    std::vector<std::string> all;
    std::stringstream in(line);
    for (std::string cell; std::getline(in, cell, ',');) {
        auto const first = cell.find_first_not_of(" \t\r");
        all.push_back(first == std::string::npos ? "" : cell.substr(first, cell.find_last_not_of(" \t\r") - first + 1));
    }
    return all;
}

/// Reads one file, and names the line of what is wrong with it.
class DriveReader
{
public:
    DriveReader(std::string const& text, std::string origin) : m_in(text), m_origin(std::move(origin)) {}

    Course read()
    {
        readNames();
        for (std::string line; std::getline(m_in, line);) {
            ++m_line;
            if (line.find_first_not_of(" \t\r") != std::string::npos) {
                readRow(cells(line));
            }
        }
        if (m_moments.size() < 2) {
            fail("a drive needs two rows of numbers at least");
        }
        return {std::move(m_moments), std::move(m_columns)};
    }

private:
    [[noreturn]] void fail(std::string const& why) const
    {
        throw SimulatorError(m_origin + ":" + std::to_string(m_line) + ": " + why);
    }

    void readNames()
    {
        std::string line;
        std::getline(m_in, line);
        ++m_line;
        std::vector<std::string> const names = cells(line);
        if (names.size() < 2 || names[0] != "seconds" || names[1] != "speed") {
            fail("the first line must begin with seconds,speed");
        }
        std::vector<std::string> const known = Drive::names();
        for (auto name = names.begin() + 1; name != names.end(); ++name) {
            if (std::find(known.begin(), known.end(), *name) == known.end()) {
                fail("there is no value \"" + *name + "\"; `hold` has the same names");
            }
            m_columns.push_back({*name, {}});
        }
    }

    void readRow(std::vector<std::string> const& row)
    {
        if (row.size() != m_columns.size() + 1) {
            fail("the line needs " + std::to_string(m_columns.size() + 1) + " numbers");
        }
        if (m_moments.size() == mostRows) {
            fail("more than " + std::to_string(mostRows) + " rows");
        }
        double const moment = number(row[0]);
        if (m_moments.empty() ? moment != 0 : moment <= m_moments.back()) {
            fail("the seconds must begin with 0 and rise");
        }
        m_moments.push_back(moment);
        for (std::size_t i = 0; i < m_columns.size(); ++i) {
            m_columns[i].values.push_back(number(row[i + 1]));
        }
        if (m_columns.front().values.back() < 0) {
            fail("the speed is below 0");
        }
    }

    double number(std::string const& text) const
    {
        std::optional<double> const value = parseDecimal(text);
        if (!value) {
            fail("\"" + text + "\" is no number");
        }
        return *value;
    }

    std::istringstream m_in;
    std::string m_origin;
    int m_line = 0;
    std::vector<double> m_moments;
    std::vector<Course::Column> m_columns;
};

} // namespace

std::vector<std::string> driveNames()
{
    std::vector<std::string> names;
    for (BuiltIn const& each : builtIn) {
        names.emplace_back(each.name);
    }
    return names;
}

DrivePlan parseDrive(std::string const& text, std::string const& origin)
{
    return {DriveReader(text, origin).read()};
}

DrivePlan loadDrive(std::string const& nameOrPath)
{
    for (BuiltIn const& each : builtIn) {
        if (each.name == nameOrPath) {
            return {DriveReader(std::string(each.text), each.name).read(), each.ambientCelsius,
                    each.startCoolantCelsius};
        }
    }
    std::optional<std::string> const text = readTextFile(nameOrPath);
    if (!text) {
        std::string names;
        for (std::string const& each : driveNames()) {
            names += names.empty() ? each : ", " + each;
        }
        throw SimulatorError("no drive and no readable file \"" + nameOrPath + "\"; the drives are " + names);
    }
    return parseDrive(*text, nameOrPath);
}

} // namespace obdsim
