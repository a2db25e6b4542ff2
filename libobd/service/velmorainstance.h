#pragma once

namespace obd {

class IObdVelmora;

// The top-level object that was built last: the one on which services are built. Not owned, and never cleared: see
// IObdVelmora.
class VelmoraInstance
{
public:
    static IObdVelmora* get();
    static void set(IObdVelmora* instance);
};

} // namespace obd
