#pragma once

namespace velmora {

// What the program tells its caller; documented in the README.
enum class ExitCode : int
{
    Done = 0,
    Failed = 1,
    WrongUse = 2,
    PortFailed = 3,    // the port could not be opened
    AdapterSilent = 4, // nothing that looks like an adapter answers
    VehicleSilent = 5, // the adapter works, no control module answers
    NotSupported = 6,  // the vehicle does not offer what was asked for
    Refused = 7,       // the vehicle said no
    LinkLost = 8,      // the connection broke
    Findings = 10,     // with --check: the lamp is on or a code is stored
    Interrupted = 130, // Ctrl-C
};

} // namespace velmora
