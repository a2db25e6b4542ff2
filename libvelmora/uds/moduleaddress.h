#pragma once

#include "libvelmora/channel/requestaddress.h"
#include "libvelmora/signal/signal.h"

#include <obd/obdprotocol.h>

#include <optional>
#include <string>

namespace velmora {

// How the module of a signal is reached on this bus; or why it can't be.
struct AddressOrReason
{
    std::optional<RequestAddress> address;
    std::string reason; // empty with an address
};

// Whether a signal goes to all modules, by the bus's standard request.
bool isBroadcast(Signal const& signal);

// Whether a header is one of the legacy buses, whose modules are told apart by a byte of it.
bool isLegacyHeader(std::string const& header);

// Who answers a request to this address, by the identifier or byte that replies carry.
unsigned int answeringModule(RequestAddress const& address);

AddressOrReason addressOf(Signal const& signal, obd::ObdProtocol protocol);

// Of a module by its identifiers alone: request and reply in hexadecimal, the reply empty where it follows from the
// request. ext is the module's address byte, if it has one.
AddressOrReason addressOf(std::string const& header, std::string const& reply, std::optional<unsigned char> ext,
                          obd::ObdProtocol protocol);

// Where a module that answers standard requests listens alone, by the identifier of its replies: "7E0" for 7E8
// (ISO 15765-4), "8011F1" for 11 (ISO 14230-4). Nothing for others.
std::optional<std::string> standardRequest(unsigned int reply, obd::ObdProtocol protocol);

// "7E0", "18DA10F1".
std::string identifierText(unsigned int id);

// The module of a reply's identifier or header as people are told it: "7E8", and "11" of 80F111.
std::string shownModule(std::string const& reply);

} // namespace velmora
