#pragma once

#include "libobd/bytes/bytes.h"

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

#include <vector>

namespace obd {

// Reads a reply of the legacy buses into responses: ISO 14230 frames, which tell their length, for
// ObdProtocolIso14230, and frames that end where the next header begins for ObdProtocolIso9141 and ObdProtocolJ1850.
// The frames of one module are joined; those of the latter kind keep their checksum bytes. On the K lines (ISO 14230
// and ISO 9141-2) a "response pending", 7F xx 78, gives way to the module's next frame. False if no module's frame
// could be read. Cost is linear in the text.
bool parseLegacyMessages(ObdProtocol protocol, std::vector<unsigned char> const& text, ResponseMap& responses);

} // namespace obd
