#include "simulator/car/services.h"

namespace obdsim {

namespace {

constexpr std::size_t routineData = 5;

Bytes head(const ServiceCall& call, std::uint8_t id)
{
    return {call.positiveService(), id};
}

void append(Bytes& message, const Bytes& data)
{
    message.insert(message.end(), data.begin(), data.end());
}

std::set<std::uint8_t> testIds(const std::vector<MonitorTest>& tests)
{
    std::set<std::uint8_t> ids;
    for (const auto& test : tests) {
        ids.insert(test.id);
    }
    return ids;
}

/// CAN: one message with a record of nine bytes for each test of the monitor.
Answer tellMonitor(const ServiceCall& call, std::uint8_t id)
{
    Bytes message = {call.positiveService()};
    for (const auto& test : call.module.data().monitorTests) {
        if (test.id == id) {
            append(message, Bytes{id, test.test, test.scaling});
            for (const auto word : test.words) {
                appendWord(message, word);
            }
        }
    }
    return message.size() > 1 ? Answer{0, {message}} : Answer{};
}

/// The other buses: one message for each component of the test.
Answer tellComponents(const ServiceCall& call, std::uint8_t id)
{
    Answer answer;
    for (const auto& test : call.module.data().monitorTests) {
        if (test.id == id) {
            Bytes message = head(call, id);
            message.push_back(test.test);
            for (const auto word : test.words) {
                appendWord(message, word);
            }
            answer.messages.push_back(message);
        }
    }
    return answer;
}

Answer tellSensorRange(const ServiceCall& call, std::uint8_t base, std::uint8_t sensor)
{
    std::set<std::uint8_t> ids;
    for (const auto& test : call.module.data().sensorTests) {
        if (test.sensor == sensor) {
            ids.insert(test.test);
        }
    }
    const auto mask = supportedMask(ids, base);
    if (!mask || ids.empty()) {
        return {};
    }
    Bytes message = head(call, base);
    message.push_back(sensor);
    append(message, *mask);
    return {0, {message}};
}

} // namespace

Answer sensorTests(const ServiceCall& call)
{
    const auto id = call.at(1);
    const auto sensor = call.at(2);
    if (call.onCan() || !id || !sensor) {
        return {};
    }
    if (isRangeRequest(*id)) {
        return tellSensorRange(call, *id, *sensor);
    }
    for (const auto& test : call.module.data().sensorTests) {
        if (test.test == *id && test.sensor == *sensor) {
            Bytes message = head(call, *id);
            message.push_back(*sensor);
            append(message, test.value);
            return {0, {message}};
        }
    }
    return {};
}

Answer monitorTests(const ServiceCall& call)
{
    const auto id = call.at(1);
    if (!id) {
        return {};
    }
    if (isRangeRequest(*id)) {
        return tellRange(call, testIds(call.module.data().monitorTests));
    }
    return call.onCan() ? tellMonitor(call, *id) : tellComponents(call, *id);
}

Answer runRoutine(const ServiceCall& call)
{
    const auto id = call.at(1);
    if (!id) {
        return {};
    }
    const auto& routines = call.module.data().routines;
    if (isRangeRequest(*id)) {
        std::set<std::uint8_t> ids;
        for (const auto& [number, routine] : routines) {
            ids.insert(number);
        }
        return tellRange(call, ids);
    }
    const auto routine = routines.find(*id);
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
