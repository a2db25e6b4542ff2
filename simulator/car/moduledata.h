#pragma once

#include "simulator/bus/frame.h"
#include "simulator/bytes.h"
#include "simulator/car/drivemodel.h"

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace obdsim {

/// Readiness of the monitors in bits of bytes B, C and D of PIDs 01 and 41: a
/// monitor exists, and it has not completed. Byte B keeps them in its low and
/// high nibble, C and D are all bits of one kind each.
struct MonitorBits
{
    std::uint8_t continuous = 0;           ///< misfire, fuel system, components
    std::uint8_t continuousIncomplete = 0; ///< the same three bits
    std::uint8_t once = 0;                 ///< byte C
    std::uint8_t onceIncomplete = 0;       ///< byte D
};

struct Monitors
{
    MonitorBits sinceCleared;
    MonitorBits thisCycle;
};

/// What a module kept of the moment at which a code was stored (service 02).
struct FreezeFrame
{
    std::uint8_t number = 0;
    std::uint16_t code = 0;               ///< 0: empty, for the codes were cleared
    Time takenAt{};                       ///< moment of the drive, for the live PIDs
    std::vector<std::uint8_t> pids;       ///< taken from the drive model or the fixed values
    std::map<std::uint8_t, Bytes> values; ///< given byte for byte
};

/// One result of service 05; the buses without CAN only.
struct SensorTest
{
    std::uint8_t test = 0;
    std::uint8_t sensor = 0;
    Bytes value; ///< the value alone for a constant, or value, minimum, maximum
};

/// One result of service 06. On CAN `id` is the monitor and `test` the test
/// within it; on the other buses `id` is the test and `test` the component.
struct MonitorTest
{
    std::uint8_t id = 0;
    std::uint8_t test = 0;
    std::uint8_t scaling = 0;         ///< CAN only
    std::vector<std::uint16_t> words; ///< CAN: value, minimum, maximum; else value, limit
};

/// One routine of service 08.
struct Routine
{
    Bytes data;           ///< what follows the test id in the reply of the buses without CAN
    std::uint8_t refusal; ///< response code of a refusal on CAN, 0 if accepted
};

/// Items of service 09.
struct VehicleInfo
{
    std::string vin;
    std::vector<std::string> calibrations;
    std::vector<Bytes> verifications;
    std::string ecuName; ///< up to 20 characters, such as "ECM\0-EngineControl"
    std::string serial;
    std::string typeApproval;
    std::vector<std::uint16_t> sparkCounters;
    std::vector<std::uint16_t> compressionCounters;
};

/// A request whose answer is announced by 7F xx 78 first.
struct Pending
{
    int times = 1;        ///< 0: it is only late
    Time delay = Ms(100); ///< before each further message
};

/// What a module makes of a request of service 01 for more PIDs than it takes.
enum class MorePids : int
{
    Silence, ///< SAE J1979 has no rule for it on the buses without CAN
    Refuse,  ///< 7F 01 12
    First    ///< answers as many as it takes
};

/// A value of the drive within the data of a signal: value * scale + offset, high byte first.
struct SignalField
{
    std::size_t at = 0; ///< first byte of it
    std::size_t bytes = 1;
    std::string value; ///< a name of Drive::value()
    double scale = 1;
    double offset = 0;
};

/// Data that a module tells beyond OBD by one request, such as 22 1E1C.
struct SignalData
{
    Bytes data; ///< behind the echo of the request
    std::vector<SignalField> fields;
};

/// A trouble code of service 19 (ISO 14229-1): two bytes as in service 03, the failure type, the status.
struct UdsCode
{
    std::uint16_t code = 0;
    std::uint8_t failureType = 0;
    std::uint8_t status = 0;
};

/// A trouble code of service 18 (ISO 14230-3): two bytes and a status of the maker's.
struct KwpCode
{
    std::uint16_t code = 0;
    std::uint8_t status = 0;
};

/// All that a vehicle file says of one control module.
struct ModuleData
{
    std::uint32_t id = 0;                 ///< CAN identifier of its replies, or its address
    std::optional<std::uint32_t> request; ///< CAN identifier that it listens to; else the usual one of id
    std::optional<std::uint8_t> address;  ///< extended address: first byte of the frames to it
    std::uint8_t tester = 0xF1;           ///< with an extended address: first byte of its own frames
    bool functional = true;               ///< answers requests to all modules
    Time latency = Ms(15);
    std::optional<Time> frameGap; ///< between the frames of a long message on CAN; else as usual on that bus
    int mostPids = 6;             ///< in one request of service 01
    MorePids morePids = MorePids::First;
    bool refuses = false; ///< answers requests it does not know with 7F
    bool lamp = false;
    bool clearsWhileRunning = true;
    int warmUps = 12;
    double kilometresSinceCleared = 640;
    std::vector<std::uint8_t> live;
    std::map<std::uint8_t, Bytes> fixed;
    std::optional<Monitors> monitors;
    bool hasStored = false; ///< answers service 03; likewise the next two
    bool hasPending = false;
    bool hasPermanent = false;
    std::vector<std::uint16_t> stored;
    std::vector<std::uint16_t> pending;
    std::vector<std::uint16_t> permanent;
    std::vector<FreezeFrame> frames;
    std::vector<SensorTest> sensorTests;
    std::vector<MonitorTest> monitorTests;
    std::map<std::uint8_t, Routine> routines;
    VehicleInfo info;
    std::map<Bytes, std::vector<Bytes>> raw; ///< recorded messages by request
    std::map<Bytes, Pending> delays;
    std::map<Bytes, std::uint8_t> refusals; ///< response codes by request
    std::map<Bytes, SignalData> signals;    ///< by request: service 22 with identifier, 21 or 1A with local identifier
    bool uds = false;                       ///< answers services 3E and 19
    std::vector<UdsCode> udsCodes;
    bool hasKwpCodes = false; ///< answers service 18
    std::vector<KwpCode> kwpCodes;
};

/// The least that ISO 9141-2 has for its W4.
constexpr Time shortestAddressPause = Ms(25);

/// A whole vehicle file.
struct VehicleData
{
    std::string name;
    int protocol = 6;
    std::optional<double> volts; ///< fixed adapter voltage; else that of the drive
    Padding padding;
    Time addressPause = shortestAddressPause; ///< see Vehicle::addressPause
    EngineData engine;
    std::vector<ModuleData> modules;
};

} // namespace obdsim
