#include "libvelmora/live/ratetext.h"

#include "libvelmora/poll/sensorwish.h"

#include <velmora/offers.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr double nearEnough = 0.9;

std::string describe(std::vector<PollRate> const& rates, double below)
{
    bool const several = std::any_of(rates.begin(), rates.end(),
                                     [&](PollRate const& each) { return each.module != rates.front().module; });
    std::string text;
    for (PollRate const& rate : rates) {
        if (rate.asked && rate.reached < *rate.asked * below) {
            text += fmt::format(
                "{}{}{} {} of {} Hz", text.empty() ? "" : ", ", several ? fmt::format("{:X} ", rate.module) : "",
                rate.sensor.empty() ? sensorKey(rate.pid) : rate.sensor, rateText(rate.reached), rateText(*rate.asked));
        }
    }
    return text;
}

} // namespace

std::string reachedRates(std::vector<PollRate> const& rates)
{
    return describe(rates, 1e9);
}

std::string missedRates(std::vector<PollRate> const& rates)
{
    return describe(rates, nearEnough);
}

} // namespace velmora
