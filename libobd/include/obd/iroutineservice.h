#pragma once

#include <obd/export.h>
#include <obd/outcome.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// An on-board test routine of service 08 for the application, or what became of a run of it; a copy that keeps nothing
/// of the library alive.
struct TestRoutineDataModel
{
    /// What became of a run.
    enum Status : int
    {
        Accepted = 0,
        Refused = 1,
        NotRun = 2, ///< or no answer
    };

    int id{0};               ///< test identifier, 0 to 255
    int status{NotRun};      ///< a Status
    std::string message;     ///< why the vehicle refused, else empty
    std::string name;        ///< "NA" for a routine that the library does not know
    std::string description; ///< what the routine does
};

/// The on-board test routines of the current control module (service 08).
class IRoutineService
{
public:
    virtual ~IRoutineService() = default;

    /// The routines that both the module and the library know. Asks the vehicle nothing. Empty without a connection or
    /// a control module.
    virtual std::vector<std::shared_ptr<TestRoutineDataModel>> getRoutines() = 0;

    /// Starts a routine, any at all, and tells what the vehicle said. The routine acts on the vehicle: the standing
    /// engine may start to burn off a filter. Asks nothing back. Blocks; call from any thread but the dispatcher's
    /// worker. Null without a connection or a control module only.
    virtual std::shared_ptr<TestRoutineDataModel> runRoutine(unsigned char id) = 0;

    /// The routines, with how asking for them went when the connection was opened. NothingStored: the library knows
    /// none of those that the module has.
    virtual Outcome<std::vector<std::shared_ptr<TestRoutineDataModel>>> askRoutines() = 0;
    /// Runs a routine that the module says it has, and tells how it went: Answered is accepted, Refused is a refusal of
    /// this module. The value is that of runRoutine, null for one that was not asked for.
    virtual Outcome<std::shared_ptr<TestRoutineDataModel>> askRoutine(unsigned char id) = 0;
};

namespace RoutineServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<IRoutineService> createRoutineService();

} // namespace RoutineServiceBuilder

} // namespace obd
