#pragma once

#include "libvelmora/output/record.h"

#include <velmora/health.h>

namespace velmora {

// Where values go. The calls come from one thread at a time and never overlap; queue, batching, pauses after a failure
// and counts stand around it, in OutputRunner.
class IOutput
{
public:
    IOutput() = default;
    IOutput(IOutput const&) = delete;
    IOutput& operator=(IOutput const&) = delete;
    virtual ~IOutput() = default;

    // Throws Error: of kind WrongUse if trying again makes no sense, of another if it does.
    virtual void open() = 0;
    // Takes all of them or none: throws Error after having undone what was begun, and is given the same ones again
    // later. Empty about once a second when there is nothing, for what has to be done by time.
    virtual void write(Records records) = 0;
    // After the last write. Throws Error if something was lost.
    virtual void close() = 0;
    // While it is open.
    virtual OutputState state() { return {}; }
};

} // namespace velmora
