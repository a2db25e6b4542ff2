#include "libobd/bytes/bytes.h"

#include <obd/nack.h>

namespace obd {

std::string NackToString(Nack nack)
{
    struct Row
    {
        Nack nack;
        char const* text;
    };
    static constexpr Row rows[] = {
        {NackAcknowledged, "Acknowledged"},
        {NackGeneralReject, "General reject"},
        {NackServiceNotSupported, "Service not supported"},
        {NackSubfunctionNotSupported, "Subfunction not supported"},
        {NackBusy, "Busy"},
        {NackConditionsNotCorrect, "Conditions not correct"},
        {NackResponsePending, "Response pending"},
    };
    for (Row const& row : rows) {
        if (row.nack == nack) {
            return row.text;
        }
    }
    return "Unknown";
}

std::string OidToString(unsigned char oid)
{
    return "$" + upperHex(oid, 2);
}

} // namespace obd
