#include "simulator/car/monitornames.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

enum class Engine : int
{
    Any,
    Spark,
    Compression
};

struct MonitorName
{
    char const* name;
    Engine engine;
    bool continuous; ///< byte B; else bytes C and D
    std::uint8_t bit;
};

// SAE J1979, PID 01: the meaning of bytes C and D depends on the ignition.
constexpr MonitorName monitorNames[] = {
    {"misfire", Engine::Any, true, 0x01},
    {"fuel-system", Engine::Any, true, 0x02},
    {"components", Engine::Any, true, 0x04},
    {"catalyst", Engine::Spark, false, 0x01},
    {"heated-catalyst", Engine::Spark, false, 0x02},
    {"evaporative-system", Engine::Spark, false, 0x04},
    {"secondary-air", Engine::Spark, false, 0x08},
    {"particulate-filter", Engine::Spark, false, 0x10},
    {"oxygen-sensor", Engine::Spark, false, 0x20},
    {"oxygen-sensor-heater", Engine::Spark, false, 0x40},
    {"egr-vvt", Engine::Spark, false, 0x80},
    {"nmhc-catalyst", Engine::Compression, false, 0x01},
    {"nox-aftertreatment", Engine::Compression, false, 0x02},
    {"boost-pressure", Engine::Compression, false, 0x08},
    {"exhaust-gas-sensor", Engine::Compression, false, 0x20},
    {"pm-filter", Engine::Compression, false, 0x40},
    {"egr-vvt", Engine::Compression, false, 0x80},
};

} // namespace

bool markMonitor(std::string const& name, bool compression, bool incomplete, MonitorBits& bits)
{
    Engine const engine = compression ? Engine::Compression : Engine::Spark;
    auto const row = std::find_if(std::begin(monitorNames), std::end(monitorNames), [&](MonitorName const& m) {
        return m.name == name && (m.engine == Engine::Any || m.engine == engine);
    });
    if (row == std::end(monitorNames)) {
        return false;
    }
    std::uint8_t& present = row->continuous ? bits.continuous : bits.once;
    std::uint8_t& open = row->continuous ? bits.continuousIncomplete : bits.onceIncomplete;
    (incomplete ? open : present) |= row->bit;
    return true;
}

std::optional<std::uint16_t> parseCode(std::string const& text)
{
    constexpr std::size_t codeSize = 5;
    std::string const systems = "PCBU";
    auto const system = text.size() == codeSize ? systems.find(text[0]) : std::string::npos;
    auto const number = parseHexNumber(std::string_view(text).substr(std::min<std::size_t>(1, text.size())));
    if (system == std::string::npos || !number || *number > 0x3FFF) {
        return std::nullopt;
    }
    return static_cast<std::uint16_t>(system << 14 | *number);
}

} // namespace obdsim
