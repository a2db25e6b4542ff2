#pragma once

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

#include <vector>

namespace obd {

// Turns the adapter's reply to one request into the payload of each control module that answered. Keeps nothing between
// calls; any thread.
class MessageParser
{
public:
    // text is the whole reply as hexadecimal characters, with headers and without line ends and blanks, on CAN without
    // the data length. A module's payload replaces the one that responses may already hold for it; other entries stay.
    // Returns whether the reply could be used: false for an unknown protocol, and if no module's frames could be read.
    // A frame that cannot be read ends the reading with a log line, and what came before it counts.
    // Throws, after a log line with the text, what an inner check or the memory throws.
    static bool parseResponseMessage(ObdProtocol protocol, std::vector<unsigned char> const& text,
                                     ResponseMap& responses);
};

} // namespace obd
