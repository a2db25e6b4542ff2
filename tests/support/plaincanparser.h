#pragma once

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

#include <vector>

namespace support {

// The CAN reading of a reply at its plainest: all text that is left is decoded for every frame, and every frame is cut
// off a copy of the text. Its cost is quadratic; what it gives is the measure for the parser.
bool parsePlainly(obd::ObdProtocol protocol, std::vector<unsigned char> text, obd::ResponseMap& responses);

} // namespace support
