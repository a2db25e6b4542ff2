#pragma once

#include <obd/export.h>
#include <obd/obdmode.h>

#include <string>

namespace obd {

/// What a negative reply begins with: the service that was asked and a response code follow.
inline constexpr unsigned char negativeReply = 0x7F;

/// What a positive reply to a service begins with.
constexpr unsigned char positiveReply(unsigned char service)
{
    return static_cast<unsigned char>(service + 0x40);
}

/// The same of an OBD service.
constexpr unsigned char positiveReply(ObdMode mode)
{
    return positiveReply(static_cast<unsigned char>(mode));
}

/// Response codes of a negative reply, 7F service code (ISO 14229-1, ISO 14230-3).
enum Nack : int
{
    NackAcknowledged = 0x00,
    NackGeneralReject = 0x10,
    NackServiceNotSupported = 0x11,
    NackSubfunctionNotSupported = 0x12,
    NackBusy = 0x21,
    NackConditionsNotCorrect = 0x22,
    NackResponsePending = 0x78,
};

/// The code's text, such as "Subfunction not supported"; "Unknown" for a code without a name here.
OBD_EXPORT std::string NackToString(Nack nack);

/// An identifier as it is written in SAE J1979, such as "$0C".
OBD_EXPORT std::string OidToString(unsigned char oid);

} // namespace obd
