#include "simulator/car/vehiclefile.h"

#include "simulator/car/modulereader.h"

namespace obdsim {

namespace {

EngineData readEngine(TableReader& table)
{
    EngineData engine;
    std::string const fuel = table.text("fuel", "petrol");
    if (fuel != "petrol" && fuel != "diesel") {
        table.fail("fuel", "\"fuel\" must be \"petrol\" or \"diesel\"");
    }
    engine.compression = fuel == "diesel";
    engine.boosted = table.flag("boosted", engine.compression);
    engine.litres = table.number("litres", engine.litres);
    engine.idleRpm = table.number("idle_rpm", engine.idleRpm);
    engine.ambientCelsius = table.number("ambient", engine.ambientCelsius);
    engine.startCoolantCelsius = table.number("coolant_at_start", engine.startCoolantCelsius);
    engine.startOdometerKm = table.number("odometer", engine.startOdometerKm);
    engine.startFuelPercent = table.number("fuel_level", engine.startFuelPercent);
    engine.topSpeedKmh = table.number("top_speed", engine.topSpeedKmh);
    return engine;
}

/// ISO 15765-4 wants frames of eight bytes, so a car that sends shorter ones has to be asked for.
Padding readPadding(TableReader& table)
{
    if (table.text("padding", "00") == "none") {
        return std::nullopt;
    }
    return table.has("padding") ? table.byte("padding") : std::uint8_t{0};
}

VehicleData readVehicle(TableReader& table)
{
    VehicleData vehicle;
    vehicle.name = table.text("name");
    vehicle.protocol = table.integer("protocol", 1, 9);
    if (table.has("volts")) {
        vehicle.volts = table.number("volts", 0);
    }
    vehicle.padding = readPadding(table);
    if (table.has("w4")) {
        vehicle.addressPause = Ms(table.integer("w4", 25, 50));
    }
    table.table("engine", [&](TableReader& engine) { vehicle.engine = readEngine(engine); });
    table.tables("module", [&](TableReader& module) { vehicle.modules.push_back(readModule(module, vehicle)); });
    return vehicle;
}

} // namespace

VehicleData parseVehicle(std::string_view text, std::string const& origin)
{
    try {
        toml::table const table = toml::parse(text, std::string_view(origin));
        TableReader reader(table, origin, "the vehicle");
        VehicleData vehicle = readVehicle(reader);
        reader.finish();
        return vehicle;
    } catch (toml::parse_error const& error) {
        throw VehicleFileError(origin + ":" + std::to_string(error.source().begin.line) + ": " +
                               std::string(error.description()));
    }
}

} // namespace obdsim
