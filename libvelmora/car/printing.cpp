#include <velmora/car.h>
#include <velmora/error.h>
#include <velmora/reading.h>

#include <fmt/format.h>

#include <ostream>

namespace velmora {

std::ostream& operator<<(std::ostream& out, ErrorKind kind)
{
    switch (kind) {
    case ErrorKind::Failed:
        return out << "failed";
    case ErrorKind::WrongUse:
        return out << "wrong use";
    case ErrorKind::PortFailed:
        return out << "port not opened";
    case ErrorKind::AdapterSilent:
        return out << "adapter silent";
    case ErrorKind::VehicleSilent:
        return out << "vehicle silent";
    case ErrorKind::NotSupported:
        return out << "not supported";
    case ErrorKind::Refused:
        return out << "refused";
    case ErrorKind::LinkLost:
        return out << "link lost";
    case ErrorKind::Interrupted:
        return out << "interrupted";
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, Error const& error)
{
    out << error.what();
    for (std::string const& hint : error.hints()) {
        out << "\n  - " << hint;
    }
    return out;
}

std::optional<double> number(Reading const& reading)
{
    double const* const value = std::get_if<double>(&reading.value);
    return value != nullptr ? std::optional(*value) : std::nullopt;
}

std::string valueText(Reading const& reading)
{
    if (auto const value = number(reading)) {
        return fmt::format("{:.{}f}", *value, reading.precision);
    }
    std::string const* const text = std::get_if<std::string>(&reading.value);
    return text != nullptr ? *text : "-";
}

std::ostream& operator<<(std::ostream& out, Reading const& reading)
{
    out << reading.name << ": " << valueText(reading);
    bool const told = !std::holds_alternative<std::monostate>(reading.value);
    return told && !reading.unit.empty() ? out << ' ' << reading.unit : out;
}

std::ostream& operator<<(std::ostream& out, Module const& module)
{
    return out << fmt::format("{:X} {}", module.id, module.name);
}

std::ostream& operator<<(std::ostream& out, Sensor const& sensor)
{
    return out << fmt::format("{:X} {}: {}", sensor.module, sensor.key, sensor.title);
}

std::ostream& operator<<(std::ostream& out, LinkState state)
{
    return out << (state == LinkState::Lost ? "lost" : "returned");
}

} // namespace velmora
