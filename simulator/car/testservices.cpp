#include "simulator/car/services.h"

namespace obdsim {

namespace {

constexpr std::size_t routineData = 5;

Bytes head(ServiceCall const& call, std::uint8_t id)
{
    return {call.positiveService(), id};
}

void append(Bytes& message, Bytes const& data)
{
    message.insert(message.end(), data.begin(), data.end());
}

std::set<std::uint8_t> testIds(std::vector<MonitorTest> const& tests)
{
    std::set<std::uint8_t> ids;
    for (auto const& test : tests) {
        ids.insert(test.id);
    }
    return ids;
}

/// CAN: one message with a record of nine bytes for each test of the monitor.
Answer tellMonitor(ServiceCall const& call, std::uint8_t id)
{
    Bytes message = {call.positiveService()};
    for (auto const& test : call.module.data().monitorTests) {
        if (test.id == id) {
            append(message, Bytes{id, test.test, test.scaling});
            for (auto const word : test.words) {
                appendWord(message, word);
            }
        }
    }
    return message.size() > 1 ? Answer{0, {message}} : Answer{};
}

/// The other buses: one message for each component of the test.
Answer tellComponents(ServiceCall const& call, std::uint8_t id)
{
    Answer answer;
    for (auto const& test : call.module.data().monitorTests) {
        if (test.id == id) {
            Bytes message = head(call, id);
            message.push_back(test.test);
            for (auto const word : test.words) {
                appendWord(message, word);
            }
            answer.messages.push_back(message);
        }
    }
    return answer;
}

Answer tellSensorRange(ServiceCall const& call, std::uint8_t base, std::uint8_t sensor)
{
    std::set<std::uint8_t> ids;
    for (auto const& test : call.module.data().sensorTests) {
        if (test.sensor == sensor) {
            ids.insert(test.test);
        }
    }
    auto const mask = supportedMask(ids, base);
    if (!mask || ids.empty()) {
        return {};
    }
    Bytes message = head(call, base);
    message.push_back(sensor);
    append(message, *mask);
    return {0, {message}};
}

} // namespace

Answer sensorTests(ServiceCall const& call)
{
    auto const id = call.at(1);
    auto const sensor = call.at(2);
    if (call.onCan() || !id || !sensor) {
        return {};
    }
    if (isRangeRequest(*id)) {
        return tellSensorRange(call, *id, *sensor);
    }
    for (auto const& test : call.module.data().sensorTests) {
        if (test.test == *id && test.sensor == *sensor) {
            Bytes message = head(call, *id);
            message.push_back(*sensor);
            append(message, test.value);
            return {0, {message}};
        }
    }
    return {};
}

Answer monitorTests(ServiceCall const& call)
{
    auto const id = call.at(1);
    if (!id) {
        return {};
    }
    if (isRangeRequest(*id)) {
        return tellRange(call, testIds(call.module.data().monitorTests));
    }
    return call.onCan() ? tellMonitor(call, *id) : tellComponents(call, *id);
}

Answer runRoutine(ServiceCall const& call)
{
    auto const id = call.at(1);
    if (!id) {
        return {};
    }
    auto const& routines = call.module.data().routines;
    if (isRangeRequest(*id)) {
        std::set<std::uint8_t> ids;
        for (auto const& [number, routine] : routines) {
            ids.insert(number);
        }
        return tellRange(call, ids);
    }
    auto const routine = routines.find(*id);
    if (routine == routines.end()) {
        return {};
    }
    if (call.onCan() && routine->second.refusal != 0) {
        return {routine->second.refusal, {}};
    }
    Bytes message = head(call, *id);
    if (!call.onCan()) {
        append(message, routine->second.data);
        message.resize(2 + routineData, 0);
    }
    return {0, {message}};
}

} // namespace obdsim
