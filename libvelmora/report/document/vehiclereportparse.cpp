#include "libvelmora/report/document/topicparse.h"
#include "libvelmora/report/document/vehiclereportjson.h"

namespace velmora {

namespace {

constexpr std::uint32_t largestByte = 0xFF;

std::optional<InfoReport::Reading> readingAt(JsonPlace const& place)
{
    if (place.isNull()) {
        return std::nullopt;
    }
    return InfoReport::Reading{place.at("value").text(), place.at("unit").textOrEmpty()};
}

InfoReport::Travel travelAt(JsonPlace const& place)
{
    return {readingAt(place.at("distance")), readingAt(place.at("runTime"))};
}

InfoReport infoAt(JsonPlace const& place)
{
    InfoReport report;
    report.description = place.at("description").textOrEmpty();
    report.standard = place.at("standard").textOrEmpty();
    report.protocol = place.at("protocol").textOrEmpty();
    report.vin = place.at("vin").textOrEmpty();
    for (JsonPlace const& each : place.at("calibrations").elements()) {
        report.calibrations.push_back({each.at("id").textOrEmpty(), each.at("verification").textOrEmpty()});
    }
    report.engineSerialNumber = place.at("engineSerialNumber").textOrEmpty();
    report.erotan = place.at("erotan").textOrEmpty();
    report.withLamp = travelAt(place.at("withLamp"));
    report.sinceCleared = travelAt(place.at("sinceCleared"));
    return report;
}

std::vector<LiveValue> valuesAt(JsonPlace const& place)
{
    std::vector<LiveValue> values;
    for (JsonPlace const& each : place.elements()) {
        LiveValue value{each.at("pid").hex(),          static_cast<int>(each.at("part").whole(largestByte)),
                        each.at("name").text(),        each.at("value").textOrEmpty(),
                        each.at("unit").textOrEmpty(), {}};
        for (JsonPlace const& sample : each.at("samples").elements()) {
            value.samples.push_back(sample.number());
        }
        values.push_back(std::move(value));
    }
    return values;
}

ModuleReport moduleAt(JsonPlace const& place)
{
    ModuleReport module{place.at("id").hex(), place.at("name").textOrEmpty(), {}, {}, {}, {}, {}, {}, {}, {}};
    for (JsonPlace const& sensor : place.at("sensors").elements()) {
        module.supported.push_back(sensor.hex());
    }
    module.info = infoAt(place.at("info"));
    module.codes = codesAt(place.at("codes"));
    module.freeze = freezeAt(place.at("freeze"), module.codes.maker);
    module.readiness = readinessAt(place.at("readiness"));
    module.monitors = monitorsAt(place.at("monitors"));
    module.oxygen = oxygenAt(place.at("oxygen"));
    module.counters = countersAt(place.at("counters"));
    module.offers = answerAt(place.at("supported"));
    module.values = valuesAt(place.at("values"));
    return module;
}

} // namespace

VehicleReport parseReport(Json const& document)
{
    JsonPlace const root(document);
    VehicleReport report;
    JsonPlace const adapter = root.at("adapter");
    report.adapter = {adapter.at("device").textOrEmpty(), adapter.at("description").textOrEmpty(),
                      adapter.at("identification").textOrEmpty(), std::nullopt};
    if (auto const volts = adapter.find("volts")) {
        constexpr double mostVolts = 1000.0;
        if (!(volts->number() >= 0.0 && volts->number() <= mostVolts)) {
            volts->fail("voltage");
        }
        report.adapter.volts = static_cast<float>(volts->number());
    }
    JsonPlace const protocol = root.at("protocol");
    if (auto const number = protocol.find("number")) {
        report.protocol.number = static_cast<int>(number->whole(largestByte));
    }
    report.protocol.name = protocol.at("name").textOrEmpty();
    for (JsonPlace const& module : root.at("modules").elements()) {
        report.modules.push_back(moduleAt(module));
    }
    return report;
}

} // namespace velmora
