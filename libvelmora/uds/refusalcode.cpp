#include "libvelmora/uds/refusalcode.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

struct RefusalName
{
    unsigned char code;
    char const* name;
};

// ISO 14229-1; reserved codes have no name.
constexpr RefusalName refusalNames[] = {
    {0x10, "General Reject"},
    {0x11, "Service Not Supported"},
    {0x12, "Subfunction Not Supported"},
    {0x13, "Incorrect Message Length or Invalid Format"},
    {0x14, "Response Too Long"},
    {0x21, "Busy, Repeat Request"},
    {0x22, "Conditions Not Correct"},
    {0x24, "Request Sequence Error"},
    {0x25, "No Response From Subnet Component"},
    {0x26, "Failure Prevents Execution of Requested Action"},
    {0x31, "Request Out of Range"},
    {0x33, "Security Access Denied"},
    {0x34, "Authentication Required"},
    {0x35, "Invalid Key"},
    {0x36, "Exceeded Number of Attempts"},
    {0x37, "Required Time Delay Not Expired"},
    {0x38, "Secure Data Transmission Required"},
    {0x39, "Secure Data Transmission Not Allowed"},
    {0x3A, "Secure Data Verification Failed"},
    {0x50, "Certificate Verification Failed: Invalid Time Period"},
    {0x51, "Certificate Verification Failed: Invalid Signature"},
    {0x52, "Certificate Verification Failed: Invalid Chain of Trust"},
    {0x53, "Certificate Verification Failed: Invalid Type"},
    {0x54, "Certificate Verification Failed: Invalid Format"},
    {0x55, "Certificate Verification Failed: Invalid Content"},
    {0x56, "Certificate Verification Failed: Invalid Scope"},
    {0x57, "Certificate Verification Failed: Invalid Certificate (Revoked)"},
    {0x58, "Ownership Verification Failed"},
    {0x59, "Challenge Calculation Failed"},
    {0x5A, "Setting Access Rights Failed"},
    {0x5B, "Session Key Creation or Derivation Failed"},
    {0x5C, "Configuration Data Usage Failed"},
    {0x5D, "Deauthentication Failed"},
    {0x70, "Upload or Download Not Accepted"},
    {0x71, "Transfer Data Suspended"},
    {0x72, "General Programming Failure"},
    {0x73, "Wrong Block Sequence Counter"},
    {0x78, "Response Pending"},
    {0x7E, "Subfunction Not Supported in Active Session"},
    {0x7F, "Service Not Supported in Active Session"},
    {0x81, "RPM Too High"},
    {0x82, "RPM Too Low"},
    {0x83, "Engine Is Running"},
    {0x84, "Engine Is Not Running"},
    {0x85, "Engine Run Time Too Low"},
    {0x86, "Temperature Too High"},
    {0x87, "Temperature Too Low"},
    {0x88, "Vehicle Speed Too High"},
    {0x89, "Vehicle Speed Too Low"},
    {0x8A, "Throttle or Pedal Too High"},
    {0x8B, "Throttle or Pedal Too Low"},
    {0x8C, "Transmission Range Not in Neutral"},
    {0x8D, "Transmission Range Not in Gear"},
    {0x8F, "Brake Switch Not Closed"},
    {0x90, "Shifter Lever Not in Park"},
    {0x91, "Torque Converter Clutch Locked"},
    {0x92, "Voltage Too High"},
    {0x93, "Voltage Too Low"},
    {0x94, "Resource Temporarily Not Available"},
};

static_assert(std::ranges::adjacent_find(refusalNames, std::ranges::greater_equal{}, &RefusalName::code) ==
                  std::ranges::end(refusalNames),
              "codes must rise, none twice");

struct ActionRange
{
    unsigned char first;
    unsigned char last;
    RefusalAction action;
};

constexpr ActionRange actionRanges[] = {
    {0x11, 0x13, RefusalAction::StopAbsent}, {0x14, 0x14, RefusalAction::Split},
    {0x21, 0x21, RefusalAction::RetrySoon},  {0x22, 0x22, RefusalAction::RetryLater},
    {0x24, 0x26, RefusalAction::RetryLater}, {0x31, 0x31, RefusalAction::StopAbsent},
    {0x33, 0x3A, RefusalAction::StopLocked}, {0x50, 0x5D, RefusalAction::StopLocked},
    {0x78, 0x78, RefusalAction::Wait},       {0x7E, 0x7F, RefusalAction::StopSession},
    {0x81, 0x94, RefusalAction::RetryLater}, {0xF0, 0xFE, RefusalAction::RetryLater},
};

} // namespace

RefusalAction refusalAction(unsigned char code)
{
    auto const* const found = std::ranges::find_if(
        actionRanges, [code](ActionRange const& range) { return code >= range.first && code <= range.last; });
    return found != std::end(actionRanges) ? found->action : RefusalAction::StopAfterThree;
}

std::string refusalName(unsigned char code)
{
    auto const* const found = std::ranges::lower_bound(refusalNames, code, {}, &RefusalName::code);
    if (found != std::end(refusalNames) && found->code == code) {
        return found->name;
    }
    return code >= 0xF0 && code <= 0xFE ? "Vehicle Maker's Specific Conditions Not Correct"
                                        : fmt::format("code {:02X}", code);
}

} // namespace velmora
