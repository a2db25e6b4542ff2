#pragma once

#include "libvelmora/channel/busline.h"
#include "libvelmora/channel/ichannelcontrol.h"

#include <string>
#include <vector>

namespace velmora {

// One whole message of a module, as ISO 15765-2 puts it together.
struct ModuleReply
{
    unsigned int id = 0;                // of its frames
    std::vector<unsigned char> payload; // from the service on
};

// What the lines of an adapter's reply hold.
struct ReplyContent
{
    std::vector<ModuleReply> messages;
    bool broken = false; // frames that make no whole message
    std::string error;   // the adapter's first word of trouble, without blanks; "NODATA" is silence
};

// Reads the lines of a reply, headers shown and address bytes left out.
ReplyContent readReply(AddressedReply const& reply, BusKind bus);

} // namespace velmora
