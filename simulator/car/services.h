#pragma once

#include "simulator/car/module.h"

#include <set>

namespace obdsim {

/// Response codes of a negative answer (ISO 14229).
namespace refusal {
constexpr std::uint8_t serviceNotSupported = 0x11;
constexpr std::uint8_t subfunctionNotSupported = 0x12;
constexpr std::uint8_t conditionsNotCorrect = 0x22;
constexpr std::uint8_t outOfRange = 0x31;
constexpr std::uint8_t pending = 0x78;
} // namespace refusal

/// A request on its way through a module.
struct ServiceCall
{
    Module& module;
    Bytes const& request; ///< service byte first, never empty
    Time now;

    bool onCan() const;

    /// The service byte of a positive answer.
    std::uint8_t positiveService() const { return static_cast<std::uint8_t>(request[0] + 0x40); }

    /// Byte `index` of the request; nothing behind its end.
    std::optional<std::uint8_t> at(std::size_t index) const;
};

/// One of the services 01 to 0A of SAE J1979.
struct Service
{
    std::uint8_t id;
    Answer (*answer)(ServiceCall const& call);
    bool (*present)(ModuleData const& data); ///< the module has anything to tell there
};

/// Null for a number that is no service.
Service const* findService(std::uint8_t id);

bool hasService(Module const& module, std::uint8_t id);

/// The four bytes that tell which of base + 1 to base + 32 are in `ids`; the last
/// bit also stands for anything beyond. Nothing if there is nothing above a base
/// other than 0: such a range is not answered.
std::optional<Bytes> supportedMask(std::set<std::uint8_t> const& ids, std::uint8_t base);

/// The byte that stands before the mask on the buses without CAN; services 01, 02
/// and 05 have none.
std::optional<std::uint8_t> rangeFiller(std::uint8_t service);

/// The answer to a request for a range. Silent if `ids` has nothing to tell there.
Answer tellRange(ServiceCall const& call, std::set<std::uint8_t> const& ids);

/// The same for a module with recorded answers, of which that to the request was
/// not recorded: from the ids of those that were.
Answer recordedRange(ServiceCall const& call);

/// True for 00, 20, 40, ... E0: the ids that ask for a range.
bool isRangeRequest(std::uint8_t id);

// The services, in files of their own; see the table in services.cpp.
Answer currentData(ServiceCall const& call);
Answer freezeFrame(ServiceCall const& call);
Answer storedCodes(ServiceCall const& call);
Answer clearCodes(ServiceCall const& call);
Answer sensorTests(ServiceCall const& call);
Answer monitorTests(ServiceCall const& call);
Answer pendingCodes(ServiceCall const& call);
Answer runRoutine(ServiceCall const& call);
Answer vehicleInformation(ServiceCall const& call);
Answer permanentCodes(ServiceCall const& call);
bool hasVehicleInformation(ModuleData const& data);

// Beyond OBD: ISO 14229-1 and ISO 14230-3.
Answer identifiedData(ServiceCall const& call);
Answer localData(ServiceCall const& call);
Answer testerPresent(ServiceCall const& call);
Answer udsCodes(ServiceCall const& call);
Answer kwpCodes(ServiceCall const& call);

} // namespace obdsim
