#pragma once

#include "libvelmora/output/record.h"
#include "libvelmora/output/valuetext.h"

#include <string>
#include <utility>
#include <vector>

// Records as the outputs' tests need them.
namespace testsupport {

inline constexpr long long march = 1772352900250; // 2026-03-01T08:15:00.250Z

inline velmora::Reading reading(std::string const& sensor, velmora::Reading::Value value, long long millis = march)
{
    velmora::Reading result;
    result.time = velmora::fromMillis(millis);
    result.vehicle = "van";
    result.module = 0x7E8;
    result.sensor = sensor;
    result.pid = "010C";
    result.name = "Name of " + sensor;
    result.value = std::move(value);
    result.unit = "rpm";
    result.raw = {0x41, 0x0C, 0x1A, 0xF8};
    return result;
}

template <typename... Each>
std::vector<velmora::SharedRecord> records(Each&&... each)
{
    return {std::make_shared<velmora::Record const>(std::forward<Each>(each))...};
}

} // namespace testsupport
