#include "libobd/parameters/dtctostring.h"

#include "libobd/bytes/bytereader.h"
#include "libobd/bytes/hexformat.h"

namespace obd {

std::string dtcToString(std::vector<unsigned char> const& bytes)
{
    unsigned int const code = readUint16(bytes, 0);
    if ((code & 0x0FFFU) == 0) {
        return {};
    }
    // The top two bits choose the system; the first digit, 0 to 3, has the two below them.
    return "PCBU"[code >> 14U] + upperHex(code & 0x3FFFU, 4);
}

} // namespace obd
