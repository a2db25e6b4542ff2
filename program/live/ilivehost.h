#pragma once

#include "program/terminal/keyinput.h"
#include "program/view/framestyle.h"
#include "program/view/live/livetable.h"
#include "program/view/live/sensorpicker.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace velmora::cli {

// A key with what it does, for the help.
using KeyHelp = std::pair<std::string, std::string>;

// Whose values a panel shows, and who does what its keys ask for.
class ILiveHost
{
public:
    ILiveHost() = default;
    ILiveHost(ILiveHost const&) = delete;
    ILiveHost& operator=(ILiveHost const&) = delete;
    virtual ~ILiveHost() = default;

    virtual std::vector<LiveRow> const& rows() const = 0;
    // What the rows' ages are told by.
    virtual LiveTime now() const { return std::chrono::steady_clock::now(); }
    virtual std::string title() const = 0;
    // What the bottom line begins with; may be empty.
    virtual std::string state() const = 0;
    // Another page in the place of the values, with a note that is to be told on it; empty for none.
    virtual std::string page(std::string const& note, FrameStyle const& style) const = 0;
    // The sensors that can be chosen. Throws Error that tells why none can.
    virtual SensorPicker picker() const = 0;
    virtual void pick(std::vector<int> const& ids) = 0;
    // Does what a key asks for and gives what to tell of it, if anything; nothing for a key that it doesn't know.
    // Throws Error.
    virtual std::optional<std::string> handle(Key key) = 0;
    // The keys that handle knows.
    virtual std::vector<KeyHelp> keys() const = 0;
};

} // namespace velmora::cli
