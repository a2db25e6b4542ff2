#include "libvelmora/port/bluetooth/propertychange.h"

#include <cstddef>
#include <string_view>

namespace velmora {

namespace {

// Calls take with the key of each changed property; it reads or skips the value, and returns what sd-bus said.
template <typename Take>
void forEachChange(sd_bus_message* message, Take take)
{
    if (sd_bus_message_skip(message, "s") < 0 || sd_bus_message_enter_container(message, 'a', "{sv}") < 0) {
        return;
    }
    while (sd_bus_message_enter_container(message, 'e', "sv") > 0) {
        char const* key = nullptr;
        if (sd_bus_message_read(message, "s", &key) < 0 || take(std::string_view(key)) < 0 ||
            sd_bus_message_exit_container(message) < 0) {
            return;
        }
    }
}

} // namespace

bool tellsDisconnected(sd_bus_message* message)
{
    bool gone = false;
    forEachChange(message, [&](std::string_view key) {
        if (key != "Connected") {
            return sd_bus_message_skip(message, "v");
        }
        int connected = 1;
        int const result = sd_bus_message_read(message, "v", "b", &connected);
        gone = connected == 0;
        return result;
    });
    return gone;
}

std::string changedValue(sd_bus_message* message)
{
    std::string value;
    forEachChange(message, [&](std::string_view key) {
        if (key != "Value") {
            return sd_bus_message_skip(message, "v");
        }
        void const* bytes = nullptr;
        std::size_t count = 0;
        if (sd_bus_message_enter_container(message, 'v', "ay") < 0 ||
            sd_bus_message_read_array(message, 'y', &bytes, &count) < 0) {
            return -1;
        }
        value.assign(static_cast<char const*>(bytes), count);
        return sd_bus_message_exit_container(message);
    });
    return value;
}

} // namespace velmora
