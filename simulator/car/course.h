#pragma once

#include <optional>
#include <string>
#include <vector>

namespace obdsim {

/// What a car is driven like, over and over: values at moments, with straight lines between. Behind the last moment it
/// begins anew.
class Course
{
public:
    /// The first column is the speed in km/h. Each has a value for each moment.
    struct Column
    {
        std::string name; ///< as Drive::names() has it
        std::vector<double> values;
    };

    /// moments in seconds, rising from 0; at least two.
    Course(std::vector<double> moments, std::vector<Column> columns);

    double kmh(double seconds) const;
    double kilometres(double seconds) const;
    std::vector<Column> const& columns() const { return m_columns; }
    double value(Column const& column, double seconds) const;

private:
    struct Place
    {
        std::size_t index; ///< of the moment before
        double part;       ///< of the way to the next
    };
    Place place(double seconds) const;

    std::vector<double> m_moments;
    std::vector<Column> m_columns;
    std::vector<double> m_kilometres; ///< driven up to each moment
};

/// A course with what the weather and the engine have to be like for it.
struct DrivePlan
{
    Course course;
    std::optional<double> ambientCelsius = {};
    std::optional<double> startCoolantCelsius = {};
};

/// The drives that are built in.
std::vector<std::string> driveNames();

/// The drive of that name, or else of that CSV file: a row of names ("seconds", "speed" and any of Drive::names()),
/// then rows of numbers. Throws SimulatorError that names file and line.
DrivePlan loadDrive(std::string const& nameOrPath);

/// The same of the file's text.
DrivePlan parseDrive(std::string const& text, std::string const& origin);

} // namespace obdsim
