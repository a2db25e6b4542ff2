#pragma once

namespace velmora {

// The place of the one car of a process, as the core has one top-level object.
class OneCar
{
public:
    // Throws Error if it is taken.
    OneCar();
    ~OneCar();
    OneCar(OneCar const&) = delete;
    OneCar& operator=(OneCar const&) = delete;
};

} // namespace velmora
