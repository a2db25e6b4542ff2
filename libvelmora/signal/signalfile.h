#pragma once

#include "libvelmora/signal/signal.h"

#include <nlohmann/json_fwd.hpp>

#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// A signal file as it was read: what is right of it, and all that is wrong.
struct SignalFileReading
{
    SignalFile file; // without the signals that hold a mistake
    std::vector<SignalMistake> mistakes;
};

// The largest file that is read.
inline constexpr std::size_t largestSignalFile = 16U << 20U;

// Reads the text of a signal file (TOML, docs/signals.md). Never throws for what the text holds.
SignalFileReading readSignals(std::string_view text, std::string const& path);

// Reads a file. Throws Error (wrong use) for one that can't be opened, is no regular file or is too large, and for one
// with mistakes, which it lists.
SignalFile loadSignalFile(std::string const& path);

// The same without throwing for mistakes.
SignalFileReading checkSignalFile(std::string const& path);

// The file as TOML, which readSignals reads again as it was.
std::string toToml(SignalFile const& file);

// The whole text of a file. Throws Error (wrong use) for one that can't be opened, is no regular file or is too large.
std::string readSignalText(std::string const& path);

nlohmann::ordered_json toJsonValue(SignalFile const& file);

} // namespace velmora
