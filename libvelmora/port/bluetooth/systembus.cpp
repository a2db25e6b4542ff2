#include "libvelmora/port/bluetooth/systembus.h"

#include "libvelmora/port/bluetooth/bluetootherror.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <optional>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds busStopStep{100};

std::uint64_t microseconds(std::chrono::microseconds time)
{
    return static_cast<std::uint64_t>(time.count());
}

int keepAnswer(sd_bus_message* message, void* answer, sd_bus_error*)
{
    static_cast<BusMessage*>(answer)->reset(sd_bus_message_ref(message));
    return 0;
}

} // namespace

int checked(int result)
{
    if (result < 0) {
        throw BusError("System.Error", std::strerror(-result));
    }
    return result;
}

SystemBus::SystemBus(OpeningStop stop) : m_stop(std::move(stop))
{
    sd_bus* bus = nullptr;
    int const result = sd_bus_open_system(&bus);
    if (result < 0) {
        throw noBusError("The Bluetooth service can't be asked",
                         std::string("there is no system bus (") + std::strerror(-result) + ")");
    }
    m_bus.reset(bus);
}

BusMessage SystemBus::makeCall(std::string const& path, char const* interface, char const* method) const
{
    sd_bus_message* message = nullptr;
    checked(sd_bus_message_new_method_call(m_bus.get(), &message, "org.bluez", path.c_str(), interface, method));
    return BusMessage(message);
}

BusMessage SystemBus::call(BusMessage const& request, std::chrono::seconds limit)
{
    BusMessage answer;
    sd_bus_slot* slot = nullptr;
    checked(sd_bus_call_async(m_bus.get(), &slot, request.get(), keepAnswer, &answer, microseconds(limit)));
    BusSlot const pending(slot);
    // The bus answers in place of a service that doesn't, when the limit is over.
    if (!waitUntil([&answer] { return answer != nullptr; }, limit + std::chrono::seconds(5))) {
        throw BusError("org.freedesktop.DBus.Error.NoReply", "no answer");
    }
    if (sd_bus_error const* const error = sd_bus_message_get_error(answer.get())) {
        throw BusError(error->name, error->message != nullptr ? error->message : "");
    }
    return answer;
}

BusMessage SystemBus::call(std::string const& path, char const* interface, char const* method,
                           std::chrono::seconds limit)
{
    return call(makeCall(path, interface, method), limit);
}

bool SystemBus::waitUntil(std::function<bool()> const& done, std::chrono::milliseconds limit)
{
    auto const end = std::chrono::steady_clock::now() + limit;
    while (!done()) {
        if (m_stop && m_stop()) {
            failInterruptedOpening();
        }
        if (std::chrono::steady_clock::now() >= end) {
            return false;
        }
        if (checked(sd_bus_process(m_bus.get(), nullptr)) == 0) {
            int const waited = sd_bus_wait(m_bus.get(), microseconds(busStopStep));
            checked(waited == -EINTR ? 0 : waited);
        }
    }
    return true;
}

int takeDescriptor(int ofMessage)
{
    int const own = ::fcntl(ofMessage, F_DUPFD_CLOEXEC, 3);
    return checked(own < 0 ? -errno : own);
}

} // namespace velmora
