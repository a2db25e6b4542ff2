#include "libvelmora/output/opening/outputfactory.h"

#include "libvelmora/output/csvoutput.h"
#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/output/holdingoutput.h"
#include "libvelmora/output/influxoutput.h"
#include "libvelmora/output/mqtt/mqttoutput.h"
#include "libvelmora/output/ndjsonoutput.h"
#include "libvelmora/output/prometheusoutput.h"

#include <velmora/error.h>
#include <velmora/longwatch.h>

namespace velmora {

namespace {

struct Maker
{
    char const* kind;
    std::unique_ptr<IOutput> (*make)(OutputAddress const&, OutputContext const&);
};

// A line that was written keeps its time, so it waits until the clock is right.
[[maybe_unused]] std::unique_ptr<IOutput> held(std::unique_ptr<IOutput> output, OutputAddress const& address,
                                               OutputContext const& context)
{
    return std::make_unique<HoldingOutput>(std::move(output), address, context);
}

template <typename Output>
std::unique_ptr<IOutput> makeHeld(OutputAddress const& address, OutputContext const& context)
{
    return held(std::make_unique<Output>(address), address, context);
}

#ifdef VELMORA_OUTPUT_INFLUX
std::unique_ptr<IOutput> makeInflux(OutputAddress const& address, OutputContext const& context)
{
    return held(makeInfluxOutput(address), address, context);
}
#endif

#ifdef VELMORA_OUTPUT_MQTT
std::unique_ptr<IOutput> makeMqtt(OutputAddress const& address, OutputContext const& context)
{
    return std::make_unique<MqttOutput>(address, context);
}
#endif

std::vector<Maker> const& makers()
{
    static std::vector<Maker> const list = {
#ifdef VELMORA_OUTPUT_CSV
        {"csv", makeHeld<CsvOutput>},
        {"csv-long", makeHeld<CsvLongOutput>},
#endif
#ifdef VELMORA_OUTPUT_NDJSON
        {"ndjson", makeHeld<NdjsonOutput>},
#endif
#ifdef VELMORA_OUTPUT_INFLUX
        {"influx", makeInflux},
#endif
#ifdef VELMORA_OUTPUT_SQLITE
        {"sqlite",
         [](OutputAddress const& address, OutputContext const& context) -> std::unique_ptr<IOutput> {
             return std::make_unique<SqliteOutput>(address, context.clocks);
         }},
#endif
#ifdef VELMORA_OUTPUT_PROMETHEUS
        {"prometheus",
         [](OutputAddress const& address, OutputContext const& context) -> std::unique_ptr<IOutput> {
             return std::make_unique<PrometheusOutput>(address, context.health);
         }},
#endif
#ifdef VELMORA_OUTPUT_MQTT
        {"mqtt", makeMqtt},
        {"mqtts", makeMqtt},
#endif
    };
    return list;
}

} // namespace

std::vector<std::string> builtInOutputs()
{
    std::vector<std::string> kinds;
    for (Maker const& each : makers()) {
        kinds.emplace_back(each.kind);
    }
    return kinds;
}

std::unique_ptr<IOutput> makeOutput(OutputAddress const& address, OutputContext const& context)
{
    requirePlainTarget(address);
    for (Maker const& each : makers()) {
        if (address.kind == each.kind) {
            return each.make(address, context);
        }
    }
    throw Error(ErrorKind::WrongUse, "This build has no output of kind " + address.kind,
                {"velmora --version lists its outputs"});
}

} // namespace velmora
