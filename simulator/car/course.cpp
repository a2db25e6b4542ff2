#include "simulator/car/course.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace obdsim {

namespace {

constexpr double secondsPerHour = 3600;

/// The way of each piece is that of its mean speed.
std::vector<double> wayAt(std::vector<double> const& moments, std::vector<double> const& kmh)
{
    std::vector<double> way{0};
    for (std::size_t i = 1; i < moments.size(); ++i) {
        way.push_back(way.back() + (kmh[i - 1] + kmh[i]) / 2 * (moments[i] - moments[i - 1]) / secondsPerHour);
    }
    return way;
}

} // namespace

Course::Course(std::vector<double> moments, std::vector<Column> columns)
    : m_moments(std::move(moments)), m_columns(std::move(columns)),
      m_kilometres(wayAt(m_moments, m_columns.front().values))
{}

Course::Place Course::place(double seconds) const
{
    double const within = std::fmod(seconds, m_moments.back());
    auto const next = std::upper_bound(m_moments.begin(), m_moments.end() - 1, within);
    auto const index = static_cast<std::size_t>(next - m_moments.begin()) - 1;
    return {index, (within - m_moments[index]) / (m_moments[index + 1] - m_moments[index])};
}

double Course::value(Column const& column, double seconds) const
{
    Place const at = place(seconds);
    double const from = column.values[at.index];
    return from + (column.values[at.index + 1] - from) * at.part;
}

double Course::kmh(double seconds) const
{
    return value(m_columns.front(), seconds);
}

double Course::kilometres(double seconds) const
{
    Place const at = place(seconds);
    double const from = m_columns.front().values[at.index];
    double const reached = kmh(seconds);
    double const since = (m_moments[at.index + 1] - m_moments[at.index]) * at.part;
    double const rounds = std::floor(seconds / m_moments.back());
    return rounds * m_kilometres.back() + m_kilometres[at.index] + (from + reached) / 2 * since / secondsPerHour;
}

} // namespace obdsim
