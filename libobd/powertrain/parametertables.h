#pragma once

#include "libobd/powertrain/parameterrow.h"

#include <obd/obdmode.h>

#include <cstddef>
#include <memory>
#include <vector>

namespace obd {

class PowertrainParameter;

// What the library can do with a PID that has a row in one of the tables: numericparameters.h, codedparameters.h,
// multisensorparameters.h, fueltrim.h, oxygensensors.h and oxygensensorspresent.h. All who make or list parameters take
// them from here, so a row is all that a PID needs.
struct ParameterEntry
{
    int pid{0};
    std::shared_ptr<PowertrainParameter> (*make)(ParameterRow const& row, ObdMode mode, unsigned char frame){nullptr};
    ParameterRow const* row{nullptr};
    bool growsByOne{false}; // a fuel trim, by the byte of a second pair of banks

    std::shared_ptr<PowertrainParameter> parameter(ObdMode mode, unsigned char frame) const
    {
        return make(*row, mode, frame);
    }
    std::size_t dataLength() const;
};

// Null for a PID without a row.
ParameterEntry const* findParameter(int pid);

// The PIDs with a row, rising.
std::vector<int> parameterPids();

// Adds one row for as long as it lives, which is what a row in a table does for good. Not while another thread makes
// parameters.
class AddedParameter
{
public:
    explicit AddedParameter(ParameterRow const& row);
    ~AddedParameter();
    AddedParameter(AddedParameter const&) = delete;
    AddedParameter& operator=(AddedParameter const&) = delete;

private:
    int m_pid;
};

} // namespace obd
