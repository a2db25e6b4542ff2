// Reading signal files of 10,000 signals, as `velmora signals check` does, and evaluating one formula.

#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/signalfile.h"

#include <benchmark/benchmark.h>

#include <string>

namespace {

std::string signalText(int count)
{
    std::string text;
    for (int i = 0; i < count; ++i) {
        std::string const number = std::to_string(i);
        text += "[[signal]]\nid = \"CELL_" + number + "\"\nname = \"Voltage of cell " + number +
                "\"\nheader = \"7E4\"\nrequest = \"220101\"\nformula = \"int16(A, B) * 0.02 + signed8(C) / 4 - 1.5\"\n"
                "unit = \"V\"\nmin = 0\nmax = 5\nprecision = 2\n\n";
    }
    return text;
}

// Each reads the two before it.
std::string referringText(int count)
{
    std::string text = signalText(2);
    for (int i = 2; i < count; ++i) {
        std::string const number = std::to_string(i);
        text += "[[signal]]\nid = \"CELL_" + number + "\"\nname = \"Sum up to cell " + number +
                "\"\nformula = \"value(\\\"CELL_" + std::to_string(i - 1) + "\\\") + value(\\\"CELL_" +
                std::to_string(i - 2) + "\\\")\"\nunit = \"V\"\n\n";
    }
    return text;
}

void check(benchmark::State& state, std::string const& text)
{
    for (auto _ : state) {
        velmora::SignalFileReading const reading = velmora::readSignals(text, "cells.toml");
        if (reading.file.signals.size() != static_cast<std::size_t>(state.range(0))) {
            state.SkipWithError("signals were refused");
        }
    }
}
void checkFile(benchmark::State& state)
{
    check(state, signalText(static_cast<int>(state.range(0))));
}

void checkReferringFile(benchmark::State& state)
{
    check(state, referringText(static_cast<int>(state.range(0))));
}
BENCHMARK(checkReferringFile)->Arg(10000)->Unit(benchmark::kMillisecond);
BENCHMARK(checkFile)->Arg(10000)->Unit(benchmark::kMillisecond);

void evaluateFormula(benchmark::State& state)
{
    velmora::FormulaNode const formula = velmora::parseFormula("int16(A, B) * 0.02 + signed8(C) / 4 - 1.5");
    std::vector<unsigned char> const bytes{0x01, 0x02, 0xFF};
    for (auto _ : state) {
        benchmark::DoNotOptimize(velmora::evaluate(formula, {bytes, {}}));
    }
}
BENCHMARK(evaluateFormula);

} // namespace
