#include "libvelmora/port/portaddress.h"

#include "common/text/text.h"

#include <velmora/error.h>

#include <charconv>
#include <optional>
#include <string_view>

namespace velmora {

namespace {

[[noreturn]] void reject(std::string const& text, std::string const& why)
{
    throw Error(ErrorKind::WrongUse, "\"" + text + "\" is no port: " + why,
                {"a serial port: /dev/ttyUSB0 or serial:///dev/ttyUSB0?baud=38400",
                 "a network adapter: 192.168.0.10:35000 or tcp://192.168.0.10:35000",
                 "a Bluetooth adapter: bt://MAC or ble://MAC, as `velmora ports` lists them",
                 "a simulated car: sim:petrol-can11", "a recorded car: replay:FILE"});
}

template <typename Number>
std::optional<Number> readNumber(std::string_view text)
{
    Number value{};
    char const* const last = text.data() + text.size();
    auto const [end, error] = std::from_chars(text.data(), last, value);
    return error == std::errc() && end == last && value != 0 ? std::optional(value) : std::nullopt;
}

bool takePrefix(std::string_view& text, std::string_view prefix)
{
    if (!text.starts_with(prefix)) {
        return false;
    }
    text.remove_prefix(prefix.size());
    return true;
}

SerialAddress parseSerial(std::string const& whole, std::string_view rest, unsigned int baud)
{
    std::size_t const query = rest.find('?');
    SerialAddress address{std::string(rest.substr(0, query)), baud};
    if (address.device.empty()) {
        reject(whole, "the device is missing");
    }
    if (query != std::string_view::npos) {
        std::string_view option = rest.substr(query + 1);
        std::optional<unsigned int> const rate =
            takePrefix(option, "baud=") ? readNumber<unsigned int>(option) : std::nullopt;
        if (!rate) {
            reject(whole, "after ? only baud=NUMBER is understood");
        }
        address.baud = *rate;
    }
    return address;
}

// Where an option of a simulated car is kept; null for a word that is none.
std::string* optionOf(SimulatorAddress& address, std::string_view name)
{
    if (name == "fault") {
        return &address.faults.emplace_back();
    }
    return name == "adapter"    ? &address.adapter
           : name == "drive"    ? &address.drive
           : name == "scenario" ? &address.scenario
                                : nullptr;
}

void takeSimulatorOption(std::string const& whole, SimulatorAddress& address, std::string_view option)
{
    if (option == "instant") {
        address.instant = true;
        return;
    }
    std::size_t const equals = option.find('=');
    std::string* const place = optionOf(address, option.substr(0, equals));
    if (place == nullptr || equals == std::string_view::npos || equals + 1 == option.size()) {
        reject(whole, "after ? only instant, adapter=NAME, drive=NAME, scenario=FILE and fault=FAULT are understood, "
                      "with & between");
    }
    *place = option.substr(equals + 1);
}

SimulatorAddress parseSimulator(std::string const& whole, std::string_view rest)
{
    std::size_t query = rest.find('?');
    SimulatorAddress address{std::string(rest.substr(0, query))};
    while (query != std::string_view::npos) {
        rest.remove_prefix(query + 1);
        query = rest.find('&');
        takeSimulatorOption(whole, address, rest.substr(0, query));
    }
    return address;
}

constexpr unsigned int lastChannel = 30; // of RFCOMM

BluetoothAddress parseBluetooth(std::string const& whole, std::string_view rest)
{
    std::size_t const query = rest.find('?');
    BluetoothAddress address{parseBluetoothMac(std::string(rest.substr(0, query))), {}};
    if (query != std::string_view::npos) {
        std::string_view option = rest.substr(query + 1);
        address.channel = takePrefix(option, "channel=") ? readNumber<unsigned int>(option) : std::nullopt;
        if (!address.channel || *address.channel > lastChannel) {
            reject(whole, "after ? only channel=N is understood, from 1 to 30");
        }
    }
    return address;
}

// A host in square brackets holds colons of its own (IPv6).
TcpAddress parseTcp(std::string const& whole, std::string_view rest)
{
    std::string_view host = rest;
    std::string_view port;
    if (rest.starts_with('[')) {
        std::size_t const end = rest.find(']');
        if (end == std::string_view::npos) {
            reject(whole, "the closing ] is missing");
        }
        host = rest.substr(1, end - 1);
        port = rest.substr(end + 1);
        if (!port.empty() && !takePrefix(port, ":")) {
            reject(whole, "after ] only :PORT is understood");
        }
    } else if (std::size_t const colon = rest.rfind(':'); colon != std::string_view::npos) {
        host = rest.substr(0, colon);
        port = rest.substr(colon + 1);
        if (port.empty()) {
            reject(whole, "the port number behind the colon is missing");
        }
        if (host.find(':') != std::string_view::npos) {
            reject(whole, "only in brackets may a host hold colons, such as [fe80::1]:35000");
        }
    }
    if (host.empty() || host.find_first_of("/ \t") != std::string_view::npos) {
        reject(whole, "the host is missing or holds what no host name holds");
    }
    TcpAddress address{std::string(host), defaultTcpPort};
    if (!port.empty()) {
        std::optional<unsigned short> const number = readNumber<unsigned short>(port);
        if (!number) {
            reject(whole, "the port number must be from 1 to 65535");
        }
        address.port = *number;
    }
    return address;
}

// The name of a serial device without its path, which no host has.
bool namesSerialDevice(std::string_view text)
{
    for (std::string_view const start : {"tty", "rfcomm", "cu."}) {
        if (text.starts_with(start) && text.find(':') == std::string_view::npos) {
            return true;
        }
    }
    return false;
}

} // namespace

std::string parseBluetoothMac(std::string const& text)
{
    constexpr std::size_t digits = 17;
    std::string const mac = toUpper(text);
    bool good = mac.size() == digits;
    for (std::size_t i = 0; good && i < digits; ++i) {
        bool const isDigit = std::string_view("0123456789ABCDEF").find(mac[i]) != std::string_view::npos;
        good = i % 3 == 2 ? mac[i] == ':' : isDigit;
    }
    if (!good) {
        reject(text, "a Bluetooth address is six pairs of digits, such as 00:1D:A5:68:98:8B");
    }
    return mac;
}

PortAddress parsePortAddress(std::string const& text, unsigned int baud)
{
    std::string_view rest = text;
    if (takePrefix(rest, "sim:")) {
        return parseSimulator(text, rest);
    }
    if (takePrefix(rest, "replay:")) {
        if (rest.empty()) {
            reject(text, "the file is missing");
        }
        return ReplayAddress{std::string(rest)};
    }
    if (takePrefix(rest, "bt://")) {
        return parseBluetooth(text, rest);
    }
    if (takePrefix(rest, "ble://")) {
        return BleAddress{parseBluetoothMac(std::string(rest))};
    }
    if (takePrefix(rest, "serial://") || takePrefix(rest, "serial:") || rest.starts_with('/')) {
        return parseSerial(text, rest, baud);
    }
    if (!takePrefix(rest, "tcp://") && !takePrefix(rest, "tcp:") && !takePrefix(rest, "socket://") &&
        rest.find("://") != std::string_view::npos) {
        reject(text, "the kind before :// is unknown");
    }
    if (namesSerialDevice(text)) {
        reject(text, "a serial device is named with its path, /dev/" + text);
    }
    return parseTcp(text, rest);
}

} // namespace velmora
