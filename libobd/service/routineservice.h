#pragma once

#include "libobd/service/ask.h"

#include <obd/iroutineservice.h>

namespace obd {

class RoutineService : public BaseService, public IRoutineService
{
public:
    explicit RoutineService(IObdVelmora const* obd, Following following = Following::AtOnce);

    std::vector<std::shared_ptr<TestRoutineDataModel>> getRoutines() override;
    std::shared_ptr<TestRoutineDataModel> runRoutine(unsigned char id) override;
    Outcome<std::vector<std::shared_ptr<TestRoutineDataModel>>> askRoutines() override;
    Outcome<std::shared_ptr<TestRoutineDataModel>> askRoutine(unsigned char id) override;
};

} // namespace obd
