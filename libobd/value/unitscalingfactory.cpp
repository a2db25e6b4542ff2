#include "libobd/value/unitscalingfactory.h"

#include "libobd/value/linearscaling.h"
#include "libobd/value/unitscalingtables.h"

#include <common/logrecord.h>

namespace obd::UnitScalingFactory {
namespace {

constexpr unsigned char temperatureId = 0x16;
constexpr unsigned char stateId = 0x2E;
constexpr unsigned char percentId = 0x39;

ScalingRow const* find(std::span<ScalingRow const> rows, unsigned char id)
{
    for (ScalingRow const& row : rows) {
        if (row.id == id) {
            return &row;
        }
    }
    return nullptr;
}

ScalingRow const* find(unsigned char id, UnitSystem system)
{
    if (system != UnitSystem::Metric && system != UnitSystem::Imperial) {
        return nullptr;
    }
    ScalingRow const* const imperial = system == UnitSystem::Imperial ? find(imperialScalings(), id) : nullptr;
    return imperial != nullptr ? imperial : find(metricScalings(), id);
}

std::unique_ptr<IUnitScaling> withOffset(ScalingRow const& row, float offset)
{
    return std::make_unique<LinearOffsetScaling>(static_cast<signed char>(row.id), row.factor, offset, row.decimals,
                                                 row.unit, row.conversion);
}

} // namespace

std::unique_ptr<IUnitScaling> createForCan(unsigned char scalingId, UnitSystem system)
{
    ScalingRow const* const row = find(scalingId, system);
    if (row == nullptr) {
        TERVEX_LOG(Error) << "Invalid scaling ID: " << static_cast<unsigned int>(scalingId);
        return nullptr;
    }
    switch (row->id) {
    case temperatureId:
        return withOffset(*row, -40.0F);
    case stateId:
        return std::make_unique<BoolScaling>();
    case percentId:
        return withOffset(*row, -327.68F);
    default:
        return std::make_unique<LinearScaling>(static_cast<signed char>(row->id), row->factor, row->decimals, row->unit,
                                               row->conversion);
    }
}

std::unique_ptr<IUnitScaling> createForTest(unsigned char testId)
{
    for (TestScalingRow const& row : testScalings()) {
        if (row.first <= testId && testId <= row.last) {
            return std::make_unique<LinearScaling>(static_cast<signed char>(testId), static_cast<double>(row.factor),
                                                   row.decimals, row.unit);
        }
    }
    return std::make_unique<DummyScaling>();
}

} // namespace obd::UnitScalingFactory
