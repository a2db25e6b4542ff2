#pragma once

#include <velmora/car.h>
#include <velmora/velmora.h>

#include <memory>
#include <new>
#include <optional>
#include <string>
#include <vector>

struct velmora_car
{
    std::optional<velmora::Car> car; // there once it is connected, for as long as a caller has the object
};

struct velmora_watch
{
    velmora::Watch watch;
};

struct velmora_error
{
    int code;
    std::string text;
    std::vector<std::string> hints;
};

namespace velmora::cface {

// Leaves an error object where the caller wants one, and returns the code.
int fail(velmora_error** error, int code, char const* text, std::vector<std::string> const& hints) noexcept;

// What an exception that is being handled says.
int failCaught(velmora_error** error) noexcept;

// Every function of the face runs its body in here, so that no exception crosses.
template <typename Body>
int guarded(velmora_error** error, Body const& body) noexcept
{
    if (error != nullptr) {
        *error = nullptr;
    }
    try {
        body();
        return VELMORA_OK;
    } catch (...) {
        return failCaught(error);
    }
}

// Throws Error of the kind WrongUse for a null pointer, which it calls by its name.
void require(void const* pointer, char const* name);

// The sensors of a caller, each checked.
std::vector<std::string> sensorNames(char const* const* names, std::size_t count);

// Calls back with a reading.
void tell(Reading const& reading, velmora_reading_fn fn, void* user);

} // namespace velmora::cface
