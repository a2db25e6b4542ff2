#pragma once

#include "libobd/value/linearscaling.h"

#include <span>

namespace obd {

// A unit and scaling identifier of on-board monitor results on CAN (SAE J1979).
struct ScalingRow
{
    unsigned char id; // signed numbers from 0x80 up
    double factor;
    int decimals;
    MeasurementUnit unit;                          // of the text
    LinearScaling::Conversion conversion{nullptr}; // from the value to the text
};

std::span<ScalingRow const> metricScalings();

// Only the identifiers whose unit differs.
std::span<ScalingRow const> imperialScalings();

// The scaling of a range of test identifiers on the legacy buses.
struct TestScalingRow
{
    unsigned char first;
    unsigned char last;
    float factor;
    int decimals;
    MeasurementUnit unit;
};

std::span<TestScalingRow const> testScalings();

} // namespace obd
