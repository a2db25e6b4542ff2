#pragma once

#include "libvelmora/report/json.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// One link of the chain from the port to the control modules.
struct DoctorCheck
{
    enum class Verdict
    {
        Good,
        Note, // works, but is worth knowing
        Bad,
    };

    std::string link; // "port", "adapter", ...
    Verdict verdict = Verdict::Good;
    std::string finding;
    std::string advice; // the likeliest thing to do; empty where there is nothing
};

// What was measured of a vehicle that answers; times in milliseconds.
struct DoctorFigures
{
    std::size_t requests = 0;
    double minimum = 0.0;
    double median = 0.0;
    double high = 0.0; // 95 % are not above it
    double maximum = 0.0;
    std::size_t longestReply = 0;   // bytes of a payload that came whole
    std::optional<bool> countWorks; // nothing where it was not tried
    std::size_t pidsPerRequest = 1;
    double valuesPerSecond = 0.0; // that can be reached
};

struct DoctorReport
{
    std::vector<DoctorCheck> checks; // along the chain, up to the first link that is dead
    std::optional<DoctorFigures> figures;
    // Habits of adapter and vehicle that were met, and how often: what was dropped or healed on the way.
    std::vector<std::pair<std::string, unsigned int>> habits;
    std::vector<std::string> missing; // commands that the adapter's version should know and this one does not

    bool isHealthy() const;
    std::string verdict() const; // one sentence
};

std::string toText(DoctorReport const& report);
Json toJson(DoctorReport const& report);

} // namespace velmora
