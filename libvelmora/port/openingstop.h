#pragma once

#include <velmora/error.h>

#include <functional>

namespace velmora {

// Asked now and then while a port is opened: true ends the attempt.
using OpeningStop = std::function<bool()>;

[[noreturn]] inline void failInterruptedOpening()
{
    throw Error(ErrorKind::Interrupted, "Interrupted");
}

} // namespace velmora
