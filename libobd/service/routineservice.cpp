#include "libobd/service/routineservice.h"

#include "libobd/parameters/testroutine.h"
#include "libobd/service/builtservice.h"

#include <obd/iecu.h>
#include <obd/nack.h>
#include <obd/sensorpids.h>

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

// How a run ended. A legacy bus refuses in a positive reply, which carries no code.
Verdict judgeRun(Verdict const& verdict, TestRoutine const& routine, IEcu const& ecu)
{
    if (verdict.kind != OutcomeKind::Answered) {
        return verdict;
    }
    return {routine.result(ecu) == TestRoutine::Accepted ? OutcomeKind::Answered : OutcomeKind::Refused};
}

std::shared_ptr<TestRoutineDataModel> makeModel(unsigned char id, Verdict const& verdict)
{
    auto model = makeModel(id);
    if (verdict.kind == OutcomeKind::Answered) {
        model->status = TestRoutineDataModel::Accepted;
    } else if (verdict.kind == OutcomeKind::Refused) {
        model->status = TestRoutineDataModel::Refused;
        model->message = NackToString(static_cast<Nack>(verdict.code)); // without a code the text of code 0
    }
    return model;
}

} // namespace

RoutineService::RoutineService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{}

Outcome<std::vector<std::shared_ptr<TestRoutineDataModel>>> RoutineService::askRoutines()
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    bool hasAny = false;
    std::vector<std::shared_ptr<TestRoutineDataModel>> routines;
    for (unsigned char const id : module->supportedIds(ObdMode::SystemControl, 0)) {
        hasAny |= !isSupportMask(id);
        if (findText(id) != nullptr) {
            routines.push_back(makeModel(id));
        }
    }
    if (hasAny) {
        return told(std::move(routines));
    }
    Verdict const detection = judged(*this, module->detection(ObdMode::SystemControl, 0));
    return detection.kind != OutcomeKind::Answered ? detection : Verdict{OutcomeKind::NotOffered};
}

std::vector<std::shared_ptr<TestRoutineDataModel>> RoutineService::getRoutines()
{
    return askRoutines().value;
}

Outcome<std::shared_ptr<TestRoutineDataModel>> RoutineService::askRoutine(unsigned char id)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    if (lacks(*module, Needed{ObdMode::SystemControl, id})) {
        return Verdict{OutcomeKind::NotOffered};
    }
    auto const routine = std::make_shared<TestRoutine>(id, module->protocol());
    Verdict const run = judgeRun(fetchFrom(routine, *module), *routine, *module);
    return {judged(*this, run), makeModel(id, run)};
}

// Asks also for what the module does not report.
std::shared_ptr<TestRoutineDataModel> RoutineService::runRoutine(unsigned char id)
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    if (module == nullptr) {
        return nullptr;
    }
    auto const routine = std::make_shared<TestRoutine>(id, module->protocol());
    Verdict run = judgeRun(fetchFrom(routine, *module), *routine, *module);
    // Where this module did not accept, the refusal of another is taken for its own.
    if (run.kind != OutcomeKind::Answered && routine->nack() != NackAcknowledged) {
        run = {OutcomeKind::Refused, routine->nack()};
    }
    return makeModel(id, run);
}

std::shared_ptr<IRoutineService> RoutineServiceBuilder::createRoutineService()
{
    return buildService<RoutineService>();
}

} // namespace obd
