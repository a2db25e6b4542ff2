#include "simulator/car/monitornames.h"
#include "simulator/control/control.h"
#include "simulator/control/controlerror.h"
#include "simulator/textnumber.h"

#include <algorithm>

namespace obdsim {

namespace {

std::string idText(Module const& module)
{
    std::uint32_t const id = module.data().id;
    return hexNumber(id, id > 0xFFF ? 8 : id > 0xFF ? 3 : 2);
}

std::string listOf(std::vector<std::string> const& words)
{
    std::string text;
    for (auto const& word : words) {
        text += (text.empty() ? "" : ", ") + word;
    }
    return text;
}

double numberAt(std::vector<std::string> const& words, std::size_t index, std::string const& expected)
{
    auto const number = parseDecimal(words[index]);
    if (!number) {
        failAtWord(words, index, expected);
    }
    return *number;
}

} // namespace

std::string Control::ignition(Words const& words, Time now)
{
    bool const on = words[1] == "on";
    if (!on) {
        m_vehicle.drive().stopEngine(now);
    }
    m_vehicle.setIgnition(on);
    return "";
}

std::string Control::engine(Words const& words, Time now)
{
    if (words[1] == "stop") {
        m_vehicle.drive().stopEngine(now);
    } else if (!m_vehicle.ignition()) {
        throw ControlError("word 2 is \"start\"; the ignition is off, say \"ignition on\" first");
    } else {
        m_vehicle.drive().startEngine(now);
    }
    return "";
}

std::string Control::set(Words const& words, Time /*now*/)
{
    auto const code = parseCode(words[1]);
    if (!code) {
        failAtWord(words, 1, "a trouble code such as P0420");
    }
    std::string const kind = words.size() > 2 ? words[2] : "stored";
    Module& target = moduleAt(words, 3);
    target.addCode(kind == "stored"    ? CodeKind::Stored
                   : kind == "pending" ? CodeKind::Pending
                                       : CodeKind::Permanent,
                   *code);
    return "";
}

std::string Control::clear(Words const& /*words*/, Time now)
{
    for (auto& each : m_vehicle.modules()) {
        each.clear(now);
    }
    return "";
}

std::string Control::value(Words const& words, Time /*now*/)
{
    Module& target = moduleAt(words, 1);
    auto const pid = parseHex(words[2]);
    if (!pid || pid->size() != 1) {
        failAtWord(words, 2, "a PID of two hexadecimal digits");
    }
    if (words[3] == "drive") {
        target.setValue((*pid)[0], std::nullopt);
        return "";
    }
    auto const data = parseHex(joinFrom(words, 3));
    constexpr std::size_t longest = 250;
    if (!data || data->size() > longest) {
        failAtWord(words, 3, "data bytes in hexadecimal digits, or drive");
    }
    target.setValue((*pid)[0], data);
    return "";
}

std::string Control::hold(Words const& words, Time /*now*/)
{
    std::optional<double> number;
    if (words[2] != "free") {
        number = numberAt(words, 2, "a number, or free");
    }
    if (!m_vehicle.drive().hold(words[1], number)) {
        failAtWord(words, 1, "one of " + listOf(Drive::names()));
    }
    return "";
}

std::string Control::voltage(Words const& words, Time /*now*/)
{
    std::optional<double> volts;
    if (words[1] != "drive") {
        volts = numberAt(words, 1, "a number of volts, or drive");
    }
    constexpr double most = 99;
    if (volts && (*volts < 0 || *volts > most)) {
        failAtWord(words, 1, "a number of volts from 0 to 99");
    }
    m_vehicle.setVolts(volts);
    return "";
}

std::string Control::fault(Words const& words, Time /*now*/)
{
    std::string text = joinFrom(words, 1);
    if (text == "none") {
        m_wire.clear();
        return "";
    }
    std::string const next = "@next";
    if (auto const at = text.rfind(next); at != std::string::npos) {
        text.replace(at, next.size(), "@1");
    }
    try {
        m_wire.add(parseFault(text));
    } catch (FaultError const& error) {
        throw ControlError(std::string("word 2: ") + error.what());
    }
    return "";
}

std::string Control::loss(Words const& /*words*/, Time /*now*/)
{
    m_wire.breakLink();
    return "";
}

std::string Control::module(Words const& words, Time /*now*/)
{
    moduleAt(words, 1).setSilent(words[2] == "silent");
    return "";
}

std::string Control::requests(Words const& /*words*/, Time /*now*/)
{
    std::string text = std::to_string(m_requests.total()) + " in all\n";
    for (auto const& [request, count] : m_requests.counts()) {
        text += std::to_string(count) + " " + request + "\n";
    }
    return text;
}

std::string Control::help(Words const& /*words*/, Time /*now*/)
{
    constexpr std::size_t column = 46;
    std::string text;
    for (auto const& each : forms()) {
        std::string form = each.form;
        form.resize(std::max(column, form.size() + 1), ' ');
        text += form + each.help + "\n";
    }
    return text;
}

/// The module of word `index`, or the first one if there is no such word.
Module& Control::moduleAt(Words const& words, std::size_t index)
{
    Module* found = nullptr;
    if (index >= words.size()) {
        found = m_vehicle.modules().empty() ? nullptr : &m_vehicle.modules().front();
    } else if (auto const id = parseHexNumber(words[index])) {
        found = m_vehicle.findModule(*id);
    }
    if (found == nullptr) {
        std::vector<std::string> ids;
        for (auto const& each : m_vehicle.modules()) {
            ids.push_back(idText(each));
        }
        failAtWord(words, index, ids.empty() ? "a module, but this vehicle has none" : "a module: " + listOf(ids));
    }
    return *found;
}

} // namespace obdsim
