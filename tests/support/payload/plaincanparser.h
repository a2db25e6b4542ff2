#pragma once

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

#include <vector>

namespace support {

// The CAN reading of a reply at its plainest: all text that is left is decoded for every frame, every frame is cut off
// a copy of the text, and every consecutive frame looks for its slot from the first round on. It shares no code with
// the parser but the decoding of digits, and logs nothing. Its cost is quadratic; what it gives is the measure for the
// parser.
bool parsePlainly(obd::ObdProtocol protocol, std::vector<unsigned char> text, obd::ResponseMap& responses);

} // namespace support
