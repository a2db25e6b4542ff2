#include "libobd/service/routineservice.h"

#include "libobd/dispatch/fetcher.h"
#include "libobd/parameters/testroutine.h"
#include "libobd/service/builtservice.h"

#include <obd/iecu.h>
#include <obd/nack.h>

#include <algorithm>
#include <iterator>

namespace obd {

namespace {

struct RoutineText
{
    unsigned char id;
    char const* name;
    char const* description;
};

constexpr RoutineText routineTexts[] = {
    {1, "Evaporative system leak test",
     "This service enables the conditions required to conduct an evaporative system leak test, but does not actually "
     "run the test. The vehicle manufacturer is responsible to determine the criteria to automatically stop the test."},
    {2, "Particulate Filter Regeneration",
     "This service requests the vehicle to initiate a PF regeneration. The vehicle manufacturer is responsible to "
     "determine the criteria to enable, start and stop the test."},
    {3, "Inducement System Reinitialization",
     "This service requests the vehicle to initiate a reinitialize the inducement system. The vehicle manufacturer is "
     "responsible to determine the criteria to enable, start and stop the test."},
};

// Null for a routine of which nothing is known.
RoutineText const* findText(unsigned char id)
{
    auto const* const found = std::find_if(std::begin(routineTexts), std::end(routineTexts),
                                           [id](RoutineText const& text) { return text.id == id; });
    return found != std::end(routineTexts) ? found : nullptr;
}

// A routine that has not run.
std::shared_ptr<TestRoutineDataModel> makeModel(unsigned char id)
{
    RoutineText const* const text = findText(id);
    auto model = std::make_shared<TestRoutineDataModel>();
    model->id = id;
    model->name = text != nullptr ? text->name : "NA";
    model->description = text != nullptr ? text->description : "";
    return model;
}

TestRoutine::Result run(std::shared_ptr<TestRoutine> const& routine, IEcu const& ecu)
{
    if (fetch(routine)) {
        return routine->result(ecu);
    }
    // On CAN a refusal is a negative reply, and thus a failure.
    return routine->nack() != NackAcknowledged ? TestRoutine::Refused : TestRoutine::NoAnswer;
}

} // namespace

RoutineService::RoutineService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{}

std::vector<std::shared_ptr<TestRoutineDataModel>> RoutineService::getRoutines()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return {};
    }
    std::vector<std::shared_ptr<TestRoutineDataModel>> routines;
    for (unsigned char const id : module->supportedIds(ObdMode::SystemControl, 0)) {
        if (findText(id) != nullptr) {
            routines.push_back(makeModel(id));
        }
    }
    return routines;
}

std::shared_ptr<TestRoutineDataModel> RoutineService::runRoutine(unsigned char id)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return nullptr;
    }
    auto const routine = std::make_shared<TestRoutine>(id, module->protocol());
    auto model = makeModel(id);
    switch (run(routine, *module)) {
    case TestRoutine::Accepted:
        model->status = TestRoutineDataModel::Accepted;
        break;
    case TestRoutine::Refused:
        model->status = TestRoutineDataModel::Refused;
        // The older buses refuse in a positive reply, which carries no code: the text then is that of code 0.
        model->message = NackToString(static_cast<Nack>(routine->nack()));
        break;
    default:
        break;
    }
    return model;
}

std::shared_ptr<IRoutineService> RoutineServiceBuilder::createRoutineService()
{
    return buildService<RoutineService>();
}

} // namespace obd
