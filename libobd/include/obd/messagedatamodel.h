#pragma once

#include <string>

namespace obd {

/// One row of the traffic log.
struct MessageDataModel
{
    static constexpr int Received = 0; ///< a direction: from the adapter
    static constexpr int Sent = 1;     ///< a direction: towards the adapter

    /// ">>" towards the adapter, "<<" from it.
    std::string getDirectionStr() const { return direction == Sent ? ">>" : "<<"; }

    std::string time;         ///< local time of day, "09:05:02"
    int direction = Received; ///< Received or Sent
    std::string data;         ///< the text without line ends and prompts
};

} // namespace obd
