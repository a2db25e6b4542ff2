#include "libvelmora/dash/dashstate.h"
#include "libvelmora/output/valuetext.h"

#include <algorithm>

namespace velmora {

// Of each run of points that share a place only the first, the lowest, the highest and the last are kept.
Json DashState::history(std::string const& id, std::size_t points) const
{
    std::lock_guard const lock(m_mutex);
    Json times = Json::array();
    Json values = Json::array();
    auto const found = m_sensors.find(id);
    if (found != m_sensors.end()) {
        std::deque<Point> const& all = found->second.points;
        std::size_t const run = std::max<std::size_t>(1, 4 * all.size() / std::max<std::size_t>(points, 4));
        for (std::size_t begin = 0; begin < all.size(); begin += run) {
            auto const first = all.begin() + static_cast<long>(begin);
            auto const end = all.begin() + static_cast<long>(std::min(begin + run, all.size()));
            auto const [low, high] =
                std::minmax_element(first, end, [](Point const& a, Point const& b) { return a.value < b.value; });
            std::set<std::deque<Point>::const_iterator> const chosen = {first, low, high, end - 1};
            for (auto const& each : chosen) {
                times.push_back(each->time);
                values.push_back(Json::parse(numberText(each->value)));
            }
        }
    }
    return {{"id", id}, {"t", times}, {"v", values}};
}

} // namespace velmora
