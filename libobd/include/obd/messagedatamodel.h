#pragma once

#include <string>

namespace obd {

/// One row of the traffic log.
struct MessageDataModel
{
    static constexpr int Received = 0;
    static constexpr int Sent = 1;

    /// ">>" towards the adapter, "<<" from it.
    std::string getDirectionStr() const { return direction == Sent ? ">>" : "<<"; }

    std::string time; // local time of day, "09:05:02"
    int direction = Received;
    std::string data; ///< the text without line ends and prompts
};

} // namespace obd
