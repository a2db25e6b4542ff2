#pragma once

#include <stdexcept>

namespace obdsim {

/// Base of all that the simulator throws: a broken file, a wrong name or option.
/// what() is meant for the user.
class SimulatorError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

} // namespace obdsim
