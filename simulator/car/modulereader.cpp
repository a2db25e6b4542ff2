#include "simulator/car/modulereader.h"

#include "simulator/car/codereader.h"
#include "simulator/car/inforeader.h"
#include "simulator/car/livepids.h"
#include "simulator/car/monitornames.h"
#include "simulator/car/udsreader.h"

namespace obdsim {

namespace {

constexpr int largestWord = 0xFFFF;
constexpr int longestDelayMs = 60000;
constexpr int mostPidsOnCan = 6; // SAE J1979; one on the other buses

void readMonitorNames(TableReader& table, std::string_view key, bool compression, bool incomplete, MonitorBits& bits)
{
    for (auto const& name : table.texts(key)) {
        if (!markMonitor(name, compression, incomplete, bits)) {
            table.fail(key, "\"" + name + "\" is no monitor of this kind of engine");
        }
    }
}

Monitors readMonitors(TableReader& table, bool compression)
{
    Monitors monitors;
    readMonitorNames(table, "supported", compression, false, monitors.sinceCleared);
    readMonitorNames(table, "incomplete", compression, true, monitors.sinceCleared);
    readMonitorNames(table, "this_cycle", compression, false, monitors.thisCycle);
    readMonitorNames(table, "this_cycle_incomplete", compression, true, monitors.thisCycle);
    return monitors;
}

/// Key and value of tables such as { "1C" = "06" }.
std::map<std::uint8_t, Bytes> readByteRows(TableReader& table)
{
    std::map<std::uint8_t, Bytes> rows;
    table.entries([&](Bytes const& key, std::vector<Bytes> const& values) {
        if (key.size() != 1 || values.size() != 1) {
            table.fail(hexText(key), "a row is one byte and its data");
        }
        rows[key[0]] = values[0];
    });
    return rows;
}

FreezeFrame readFrame(TableReader& table)
{
    FreezeFrame frame;
    frame.number = static_cast<std::uint8_t>(table.integer("number", 0, 0xFF, 0));
    frame.code = readCode(table, "code", table.text("code"));
    frame.takenAt = Ms(static_cast<std::int64_t>(table.number("taken_at", 0) * 1000));
    frame.pids = table.bytes("pids");
    table.table("values", [&](TableReader& values) { frame.values = readByteRows(values); });
    return frame;
}

MonitorTest readMonitorTest(TableReader& table, bool onCan)
{
    MonitorTest test;
    test.id = table.byte(onCan ? "monitor" : "test");
    test.test = table.byte(onCan ? "test" : "component");
    test.scaling = onCan ? table.byte("scaling") : std::uint8_t{0};
    using Keys = std::vector<std::string_view>;
    for (auto const key : onCan ? Keys{"value", "minimum", "maximum"} : Keys{"value", "limit"}) {
        test.words.push_back(static_cast<std::uint16_t>(table.integer(key, 0, largestWord)));
    }
    return test;
}

Routine readRoutine(TableReader& table)
{
    return {table.bytes("data"), table.has("refusal") ? table.byte("refusal") : std::uint8_t{0}};
}

std::vector<std::uint8_t> readLive(TableReader& table)
{
    Bytes pids = table.bytes("live");
    for (auto const pid : pids) {
        if (!isLivePid(pid)) {
            table.fail("live", "the drive model has no PID " + hexByte(pid));
        }
    }
    return pids;
}

void readCodesOf(ModuleData& module, TableReader& table)
{
    module.lamp = table.flag("lamp", module.lamp);
    module.clearsWhileRunning = table.flag("clears_while_running", module.clearsWhileRunning);
    module.warmUps = table.integer("warm_ups", 0, 0xFF, module.warmUps);
    module.kilometresSinceCleared = table.number("kilometres_since_cleared", module.kilometresSinceCleared);
    module.hasStored = table.has("stored");
    module.hasPending = table.has("pending");
    module.hasPermanent = table.has("permanent");
    module.stored = readCodes(table, "stored");
    module.pending = readCodes(table, "pending");
    module.permanent = readCodes(table, "permanent");
    table.tables("frames", [&](TableReader& frame) { module.frames.push_back(readFrame(frame)); });
}

void readTestsOf(ModuleData& module, TableReader& table, bool onCan)
{
    table.tables("monitor_tests",
                 [&](TableReader& test) { module.monitorTests.push_back(readMonitorTest(test, onCan)); });
    table.tables("sensor_tests", [&](TableReader& test) {
        std::uint8_t const id = test.byte("test");
        module.sensorTests.push_back({id, test.byte("sensor"), test.bytes("value")});
    });
    table.tables("routines", [&](TableReader& routine) {
        std::uint8_t const id = routine.byte("id");
        module.routines[id] = readRoutine(routine);
    });
}

void readRecordedOf(ModuleData& module, TableReader& table)
{
    table.table("raw", [&](TableReader& raw) {
        raw.entries([&](Bytes const& request, std::vector<Bytes> const& messages) { module.raw[request] = messages; });
    });
    table.table("delays", [&](TableReader& delays) {
        delays.tableEntries([&](Bytes const& request, TableReader& delay) {
            module.delays[request] = {delay.integer("times", 0, 100, 1),
                                      Ms(delay.integer("milliseconds", 0, longestDelayMs, 100))};
        });
    });
}

std::uint32_t readId(TableReader& table, Protocol const& protocol, std::string const& key)
{
    std::string const text = table.text(key);
    auto const id = parseHexNumber(text);
    std::size_t const digits = protocol.family == BusFamily::Can11 ? 3 : protocol.family == BusFamily::Can29 ? 8 : 2;
    if (!id || text.size() != digits) {
        table.fail(key, "\"" + key + "\" must have " + std::to_string(digits) + " hexadecimal digits on this bus");
    }
    return *id;
}

void readAddressOf(ModuleData& module, TableReader& table, Protocol const& protocol)
{
    if (isCan(protocol) && table.has("request")) {
        module.request = readId(table, protocol, "request");
    }
    if (isCan(protocol) && table.has("address")) {
        module.address = table.byte("address");
        module.tester = table.has("tester") ? table.byte("tester") : module.tester;
    }
    module.functional = table.flag("functional", module.functional);
}

MorePids readMorePids(TableReader& table, bool onCan)
{
    std::string const text = table.text("more_pids", onCan ? "first" : "silence");
    if (text == "silence") {
        return MorePids::Silence;
    }
    if (text == "refuse") {
        return MorePids::Refuse;
    }
    if (text != "first") {
        table.fail("more_pids", "\"more_pids\" must be \"silence\", \"refuse\" or \"first\"");
    }
    return MorePids::First;
}

/// How the module answers: when, and what it makes of several PIDs in one request.
void readMannersOf(ModuleData& module, TableReader& table, bool onCan)
{
    if (table.has("latency")) {
        module.latency = Ms(table.integer("latency", 0, longestDelayMs));
    }
    if (table.has("frame_gap")) {
        module.frameGap = Ms(table.integer("frame_gap", 0, longestDelayMs));
    }
    module.refuses = table.flag("refuses", module.refuses);
    module.mostPids = table.integer("most_pids", 1, mostPidsOnCan, onCan ? mostPidsOnCan : 1);
    module.morePids = readMorePids(table, onCan);
}

} // namespace

ModuleData readModule(TableReader& table, VehicleData const& vehicle)
{
    Protocol const& protocol = *findProtocol(vehicle.protocol);
    ModuleData module;
    module.id = readId(table, protocol, "id");
    readAddressOf(module, table, protocol);
    readMannersOf(module, table, isCan(protocol));
    module.live = readLive(table);
    table.table("fixed", [&](TableReader& fixed) { module.fixed = readByteRows(fixed); });
    table.table("monitors",
                [&](TableReader& monitors) { module.monitors = readMonitors(monitors, vehicle.engine.compression); });
    table.table("info", [&](TableReader& info) { module.info = readInfo(info); });
    readCodesOf(module, table);
    readTestsOf(module, table, isCan(protocol));
    readRecordedOf(module, table);
    readUdsOf(module, table);
    return module;
}

} // namespace obdsim
