#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

/// How a long watch and its outputs are.

namespace velmora {

/// How an output is that keeps a connection, and what it holds back itself.
struct OutputState
{
    std::optional<bool> up;               ///< whether the connection stands; empty for an output without one
    std::optional<std::uint64_t> waiting; ///< records that it holds back
};

/// What became of the records that an output was given.
struct OutputCounts
{
    std::uint64_t accepted = 0; ///< taken into its queue
    std::uint64_t written = 0;  ///< that arrived
    std::uint64_t dropped = 0;  ///< the oldest of a full queue
    std::uint64_t failures = 0; ///< attempts that failed
    std::size_t queued = 0;     ///< waiting; those of a write under way, too
    bool failing = false;       ///< the last attempt failed
    OutputState state;          ///< of its connection
    std::string lastError;      ///< of the last attempt that failed
};

/// How a watch is.
struct Health
{
    bool linkUp = false;            ///< adapter and vehicle answer
    std::string state;              ///< "running", "parked", "connecting", ...
    std::string trouble;            ///< why there is no link or no vehicle; empty while both are there
    std::uint64_t requests = 0;     ///< to control modules
    std::uint64_t errors = 0;       ///< requests without an answer
    std::uint64_t linkLosses = 0;   ///< since it began
    std::uint64_t wakeRequests = 0; ///< made to a parked car, because the settings ask for it
    std::vector<std::pair<std::string, OutputCounts>> outputs; ///< by their addresses
};

} // namespace velmora
