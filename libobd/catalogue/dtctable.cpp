#include "libobd/catalogue/dtctable.h"

#include "libobd/catalogue/packeddtcrow.h"

namespace obd {

std::size_t DtcTable::size() noexcept
{
    return packedDtcRowCount;
}

DtcRow DtcTable::row(std::size_t index) noexcept
{
    PackedDtcRow const& packed = packedDtcRows[index];
    return {packed.maker, packed.code, dtcTextBlocks[packed.textBlock] + packed.textOffset};
}

} // namespace obd
