#pragma once

#include <obd/dtcdatamodel.h>
#include <obd/export.h>
#include <obd/outcome.h>
#include <obd/parameteridentifier.h>
#include <obd/sensordatamodels.h>

#include <memory>
#include <vector>

namespace obd {

/// Trouble codes, malfunction indicator and freeze frames of the current control module. Every operation asks the
/// vehicle once, or a few times, and blocks its caller meanwhile; call from any thread but the dispatcher's worker.
/// Without a connection or a control module, and where the vehicle does not answer or refuses, lists are empty,
/// pointers null and booleans false; the log tells why, and so do the operations that begin with "ask".
///
///     auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
///     auto const outcome = codes->askConfirmedCodes();
///     for (auto const& code : outcome.value) std::cout << code->code << ' ' << code->description << '\n';
///     if (outcome.kind == obd::OutcomeKind::NothingStored) std::cout << "no codes\n";
///     if (outcome.kind == obd::OutcomeKind::ModuleSilent) std::cout << "no answer\n";
class ITroubleCodeService
{
public:
    /// The malfunction indicator lamp, as the control module commands it.
    enum class MilStatus : int
    {
        Off = 0,
        On = 1,
    };

    virtual ~ITroubleCodeService() = default;

    /// The codes in the order of the reply, each with all meanings that the catalogue knows.
    virtual std::vector<std::shared_ptr<DtcDataModel>> fetchConfirmedCodes() = 0;
    virtual std::vector<std::shared_ptr<DtcDataModel>> fetchPendingCodes() = 0;   ///< of this or the last driving cycle
    virtual std::vector<std::shared_ptr<DtcDataModel>> fetchPermanentCodes() = 0; ///< not to be cleared by a tool

    /// The malfunction indicator lamp.
    virtual std::shared_ptr<MilStatus> fetchMilStatus() = 0;

    /// The distance, and the engine's run time, since the lamp came on or else since the codes were cleared. Null also
    /// where the module does not offer it.
    virtual std::shared_ptr<SensorDataModel> fetchDistance(bool sinceMil) = 0;
    virtual std::shared_ptr<SensorDataModel> fetchRuntime(bool sinceMil) = 0; ///< the time

    /// The code that caused the freeze frame. Null also for a frame that holds none.
    virtual std::shared_ptr<DtcDataModel> fetchFreezeFrameTroubleCode(unsigned char frame) = 0;
    /// What the frame holds beside its code. Asks the vehicle only the first time for each frame.
    virtual std::vector<ParameterIdentifier::Id> fetchFreezeFramePids(unsigned char frame) = 0;
    /// The sensors of one parameter of the frame, with full names, such as "Fuel system status: Fuel system A".
    virtual std::vector<std::shared_ptr<SensorDataModel>> fetchFreezeFrameSensors(unsigned char frame,
                                                                                  ParameterIdentifier::Id id) = 0;
    /// The same as one parameter, whose sensors bear their own names only. A sensor without a reading has no value.
    virtual std::shared_ptr<ParameterDataModel> fetchFreezeFrameParameter(unsigned char frame,
                                                                          ParameterIdentifier::Id id) = 0;

    /// Clears the codes of all control modules, and with them freeze frames, readiness and test results. Asks nothing
    /// back. True if the current control module has done so.
    virtual bool resetCodes() const = 0;

    /// The same operations, each with how it went. What the module says it does not offer is not asked for. The lamp
    /// and the clearing are told or not: there is no "nothing stored" of them. NothingStored of a freeze frame's code
    /// and of its PIDs is a frame that is not there.
    virtual Outcome<std::vector<std::shared_ptr<DtcDataModel>>> askConfirmedCodes() = 0;
    virtual Outcome<std::vector<std::shared_ptr<DtcDataModel>>> askPendingCodes() = 0;   ///< fetchPendingCodes
    virtual Outcome<std::vector<std::shared_ptr<DtcDataModel>>> askPermanentCodes() = 0; ///< fetchPermanentCodes
    virtual Outcome<std::shared_ptr<MilStatus>> askMilStatus() = 0;                      ///< fetchMilStatus
    virtual Outcome<std::shared_ptr<SensorDataModel>> askDistance(bool sinceMil) = 0;    ///< fetchDistance
    virtual Outcome<std::shared_ptr<SensorDataModel>> askRuntime(bool sinceMil) = 0;     ///< fetchRuntime
    /// fetchFreezeFrameTroubleCode, with how it went.
    virtual Outcome<std::shared_ptr<DtcDataModel>> askFreezeFrameTroubleCode(unsigned char frame) = 0;
    /// fetchFreezeFramePids, with how it went.
    virtual Outcome<std::vector<ParameterIdentifier::Id>> askFreezeFramePids(unsigned char frame) = 0;
    /// fetchFreezeFrameSensors, with how it went.
    virtual Outcome<std::vector<std::shared_ptr<SensorDataModel>>>
    askFreezeFrameSensors(unsigned char frame, ParameterIdentifier::Id id) = 0;
    /// fetchFreezeFrameParameter, with how it went.
    virtual Outcome<std::shared_ptr<ParameterDataModel>> askFreezeFrameParameter(unsigned char frame,
                                                                                 ParameterIdentifier::Id id) = 0;
    virtual Outcome<bool> askResetCodes() const = 0; ///< resetCodes
};

namespace TroubleCodeServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<ITroubleCodeService> createTroubleCodeService();

} // namespace TroubleCodeServiceBuilder

} // namespace obd
