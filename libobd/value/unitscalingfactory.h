#pragma once

#include "libobd/value/linearscaling.h"

#include <obd/unitsystem.h>

#include <memory>

namespace obd::UnitScalingFactory {

// By the unit and scaling identifier of a result on CAN. Null, with a log line, for one that is not known.
std::unique_ptr<IUnitScaling> createForCan(unsigned char scalingId, UnitSystem system);

// By the test identifier of a result on the legacy buses, which carry no scaling. Always metric; never null: the
// numbers of a test that is not known are shown as they came.
std::unique_ptr<IUnitScaling> createForTest(unsigned char testId);

} // namespace obd::UnitScalingFactory
