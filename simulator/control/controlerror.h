#pragma once

#include "simulator/error.h"

namespace obdsim {

/// A control line that cannot be followed. what() names the word and what belongs there.
class ControlError : public SimulatorError
{
public:
    using SimulatorError::SimulatorError;
};

} // namespace obdsim
