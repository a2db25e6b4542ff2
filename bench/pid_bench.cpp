// What a reading of all parameters costs. One iteration handles each class of the factory once; "decode" takes a reply
// of the right beginning with 40 bytes of data into a parameter that has an older reading, "values" asks for all values
// in imperial units, "texts" writes them too, and "create" makes the parameters anew, as the services do for a fetch.
// The counters tell classes an iteration, and memory allocations a class.

#include "bench/allocationcount.h"
#include "tests/support/fakeecu.h"
#include "tests/support/payload/payload.h"

#include <obd/parameterfactory.h>

#include <benchmark/benchmark.h>

namespace {

using Parameters = std::vector<std::shared_ptr<obd::PowertrainParameter>>;

Parameters allParameters()
{
    obd::ParameterFactory factory;
    Parameters parameters;
    for (int pid = 0x03; pid < 0x80; ++pid) {
        if (auto parameter = factory.createParameter(obd::ParameterIdentifier::Id(pid))) {
            parameters.push_back(std::move(parameter));
        }
    }
    return parameters;
}

support::Bytes replyTo(obd::PowertrainParameter const& parameter)
{
    support::Bytes data;
    parameter.requestData(data);
    data[0] = static_cast<unsigned char>(data[0] + 0x40);
    data.resize(data.size() + 40, 0x01);
    return data;
}

class Catalogue
{
public:
    Catalogue()
    {
        for (auto const& parameter : parameters) {
            replies.push_back(replyTo(*parameter));
        }
        decodeAll();
    }

    void decodeAll()
    {
        for (std::size_t i = 0; i < parameters.size(); ++i) {
            benchmark::DoNotOptimize(parameters[i]->setResponseData(ecu, replies[i]));
        }
    }

    Parameters parameters = allParameters();
    std::vector<support::Bytes> replies;
    std::shared_ptr<obd::IEcu> ecu = std::make_shared<support::FakeEcu>();
};

template <typename Work>
void measure(benchmark::State& state, std::size_t classes, Work const& work)
{
    std::size_t const before = bench::allocationCount();
    for (auto _ : state) {
        work();
    }
    auto const handled = static_cast<double>(state.iterations()) * static_cast<double>(classes);
    state.counters["classes"] = static_cast<double>(classes);
    state.counters["allocations"] = static_cast<double>(bench::allocationCount() - before) / handled;
}

void decode(benchmark::State& state)
{
    Catalogue catalogue;
    measure(state, catalogue.parameters.size(), [&] { catalogue.decodeAll(); });
}

void values(benchmark::State& state)
{
    Catalogue const catalogue;
    measure(state, catalogue.parameters.size(), [&] {
        for (auto const& parameter : catalogue.parameters) {
            benchmark::DoNotOptimize(parameter->values(*catalogue.ecu, obd::UnitSystem::Imperial));
        }
    });
}

void texts(benchmark::State& state)
{
    Catalogue const catalogue;
    measure(state, catalogue.parameters.size(), [&] {
        for (auto const& parameter : catalogue.parameters) {
            for (auto const& value : parameter->values(*catalogue.ecu, obd::UnitSystem::Imperial)) {
                benchmark::DoNotOptimize(value->textualValue());
            }
        }
    });
}

void create(benchmark::State& state)
{
    measure(state, allParameters().size(), [] { benchmark::DoNotOptimize(allParameters()); });
}

BENCHMARK(decode)->Unit(benchmark::kMicrosecond);
BENCHMARK(values)->Unit(benchmark::kMicrosecond);
BENCHMARK(texts)->Unit(benchmark::kMicrosecond);
BENCHMARK(create)->Unit(benchmark::kMicrosecond);

} // namespace
