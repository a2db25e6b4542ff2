#pragma once

#include "libvelmora/port/openingstop.h"

#include <array>
#include <cstdint>
#include <string>
#include <sys/socket.h>

namespace velmora {

// What became of a call to a classic Bluetooth device: an open, connected socket that now is the caller's, or an errno.
struct RfcommCall
{
    int socket = -1;
    int error = 0;
};

// Connects to the serial channels of classic Bluetooth devices (RFCOMM).
class IRfcommDialer
{
public:
    virtual ~IRfcommDialer() = default;

    // mac as readMacAddress returns it, channel from 1 to 30. ECANCELED when stop said so.
    virtual RfcommCall dial(std::string const& mac, unsigned int channel, OpeningStop const& stop) = 0;
};

// By the kernel's own socket, for which a user needs no rights.
class KernelRfcomm : public IRfcommDialer
{
public:
    RfcommCall dial(std::string const& mac, unsigned int channel, OpeningStop const& stop) override;
};

// The kernel's socket address of RFCOMM. Its header comes under a licence that we can't include; numbers and layout are
// its interface.
struct RfcommSocketAddress
{
    std::uint16_t family;
    std::array<std::uint8_t, 6> device; // the last byte of the written address first
    std::uint8_t channel;
    std::uint8_t padding;
};
static_assert(sizeof(RfcommSocketAddress) == 10);

constexpr int bluetoothFamily = 31;
constexpr int rfcommProtocol = 3;

RfcommSocketAddress makeRfcommAddress(std::string const& mac, unsigned int channel);

// Connects a socket that doesn't block. Returns 0 or an errno; ECANCELED when stop said so.
int connectSocket(int socket, sockaddr_storage const& address, socklen_t size, OpeningStop const& stop);

} // namespace velmora
