#include "libobd/catalogue/dtcreader.h"

#include <obd/library.h>

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

using obd::DtcReader;
using obd::DtcRow;

// A table of the catalogue's full size: 18201 rows, 8176 of them generic, 9706 codes, texts of 44 characters on average
// and 140 at most, in the order of the makers.
class FullTable
{
public:
    FullTable()
    {
        for (std::size_t i = 0; i < rowCount; ++i) {
            bool const generic = i < genericCount;
            std::size_t const number = generic ? i : genericCount + (i - genericCount) % (codeCount - genericCount);
            char code[6];
            std::snprintf(code, sizeof code, "P%04zX", number);
            m_codes.emplace_back(code);
            m_texts.push_back(std::string(textLength(i), static_cast<char>('a' + i % 26)));
        }
    }

    std::size_t size() const { return rowCount; }
    DtcRow row(std::size_t index) const
    {
        std::size_t const makerRows = (rowCount - genericCount) / makerCount + 1;
        auto const maker = index < genericCount ? 0 : 1 + static_cast<int>((index - genericCount) / makerRows);
        return {maker, m_codes[index].c_str(), m_texts[index].c_str()};
    }

    void load() const
    {
        DtcReader::load(size(), [this](std::size_t index) { return row(index); });
    }

private:
    static constexpr std::size_t rowCount = 18201;
    static constexpr std::size_t genericCount = 8176;
    static constexpr std::size_t codeCount = 9706;
    static constexpr std::size_t makerCount = 44;

    // Short texts are the rule, one in a hundred is very long: 43.9 on average.
    static std::size_t textLength(std::size_t i) { return i % 100 == 0 ? 140 : 18 + i * 7 % 50; }

    std::vector<std::string> m_codes;
    std::vector<std::string> m_texts;
};

FullTable const& fullTable()
{
    static FullTable const table;
    return table;
}

// Bytes of this process that stand in memory (Linux).
double residentBytes()
{
    std::ifstream statm("/proc/self/statm");
    long total = 0;
    long resident = 0;
    statm >> total >> resident;
    return static_cast<double>(resident) * static_cast<double>(::sysconf(_SC_PAGESIZE));
}

// First of all, so that no freed memory is at hand: what loading once adds to the process.
void memoryOfFullTable(benchmark::State& state)
{
    fullTable();
    double const before = residentBytes();
    for (auto _ : state) {
        fullTable().load();
    }
    state.counters["MB"] = (residentBytes() - before) / 1e6;
    DtcReader::clean();
}
BENCHMARK(memoryOfFullTable)->Iterations(1)->Unit(benchmark::kMillisecond);

void loadFullTable(benchmark::State& state)
{
    for (auto _ : state) {
        fullTable().load();
        state.PauseTiming();
        DtcReader::clean();
        state.ResumeTiming();
    }
}
BENCHMARK(loadFullTable)->Unit(benchmark::kMillisecond);

void cleanFullTable(benchmark::State& state)
{
    for (auto _ : state) {
        state.PauseTiming();
        fullTable().load();
        state.ResumeTiming();
        DtcReader::clean();
    }
}
BENCHMARK(cleanFullTable)->Unit(benchmark::kMillisecond);

// The whole opening, with the rows that the library is built with.
void openLibrary(benchmark::State& state)
{
    for (auto _ : state) {
        obd::LIBOBDOpen("");
        state.PauseTiming();
        obd::LIBOBDClose();
        state.ResumeTiming();
    }
    state.counters["rows"] = static_cast<double>(obd::DtcTable::size());
}
BENCHMARK(openLibrary)->Unit(benchmark::kMillisecond);

void lookUp(benchmark::State& state, char const* code)
{
    fullTable().load();
    for (auto _ : state) {
        benchmark::DoNotOptimize(DtcReader().getTroubleCodes(code));
    }
    DtcReader::clean();
}
BENCHMARK_CAPTURE(lookUp, known, "P0420")->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(lookUp, unknown, "P0FFF")->Unit(benchmark::kMicrosecond);

void listAllCodes(benchmark::State& state)
{
    fullTable().load();
    for (auto _ : state) {
        benchmark::DoNotOptimize(DtcReader().getTroubleCodes());
    }
    DtcReader::clean();
}
BENCHMARK(listAllCodes)->Unit(benchmark::kMillisecond);

} // namespace
