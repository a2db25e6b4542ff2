#pragma once

#include "libobd/powertrain/tableparameter.h"

#include <memory>

namespace obd {

// From where a module's air to fuel ratio can be read.
struct LambdaSource
{
    unsigned char pid;
    char const* text; // for the log
    // The parameter, whose first sensor is the equivalence ratio.
    std::unique_ptr<TableParameter> (*make)();
};

// The best source that the module has; null if it has none.
LambdaSource const* findLambdaSource(IEcu const& ecu);

// What is said about the source in the log.
char const* lambdaSourceText(LambdaSource const* source);

} // namespace obd
