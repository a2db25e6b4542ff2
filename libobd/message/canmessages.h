#pragma once

#include "libobd/bytes/bytes.h"

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

namespace obd {

// Reads a reply of ISO 15765-4 frames, ObdProtocolCan11 or ObdProtocolCan29, into responses. A module whose message is
// not complete is left out. False if no frame could be read, or if responses is empty in the end. Cost is linear in the
// text.
bool parseCanMessages(ObdProtocol protocol, ByteView text, ResponseMap& responses);

} // namespace obd
