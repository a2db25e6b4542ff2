#include "libobd/powertrain/parametertables.h"

#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/multisensorparameters.h"
#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensors.h"
#include "libobd/powertrain/oxygensensorspresent.h"

#include <algorithm>
#include <array>
#include <type_traits>
#include <utility>

namespace obd {
namespace {

template <typename Parameter>
std::shared_ptr<PowertrainParameter> makeOfTable(ParameterRow const& /*row*/, ObdMode mode, unsigned char frame)
{
    return std::make_shared<Parameter>(mode, frame);
}

std::shared_ptr<PowertrainParameter> makeOfRow(ParameterRow const& row, ObdMode mode, unsigned char frame)
{
    return std::make_shared<TableParameter>(row, mode, frame);
}

template <auto const& rows, std::size_t index>
constexpr ParameterEntry entry()
{
    using Parameter = typename ParameterClass<rows, rows[index].pid>::Type;
    return {rows[index].pid, makeOfTable<Parameter>, &rows[index], std::is_base_of_v<FuelTrim, Parameter>};
}

template <auto const& rows>
constexpr auto entries()
{
    return []<std::size_t... index>(std::index_sequence<index...> /*all*/)
    {
        return std::array{entry<rows, index>()...};
    }
    (std::make_index_sequence<std::size(rows)>());
}

template <std::size_t... counts>
constexpr auto joined(std::array<ParameterEntry, counts> const&... tables)
{
    std::array<ParameterEntry, (counts + ...)> all{};
    auto end = all.begin();
    ((end = std::copy(tables.begin(), tables.end(), end)), ...);
    std::sort(all.begin(), all.end(), [](ParameterEntry const& a, ParameterEntry const& b) { return a.pid < b.pid; });
    return all;
}

// Not among them, on purpose: the support masks (0x00, 0x20, ...), the readiness (0x01, 0x41), the trouble code of the
// freeze frame (0x02) and the test equipment configurations (0x4F, 0x50), which have their own ways.
constexpr auto tables =
    joined(entries<numericRows>(), entries<codedRows>(), entries<multiSensorRows>(), entries<fuelTrimRows>(),
           entries<oxygenSensorRows>(), entries<oxygenSensorsPresentRows>());
static_assert(pidsRise(tables), "no PID may stand in two tables");

// From 0xF0 on the library has identifiers of its own, and bytes are all that a request has room for.
constexpr int lastRowPid = 0xEF;
static_assert(tables.front().pid > 0x02 && tables.back().pid <= lastRowPid);

std::vector<ParameterEntry>& allEntries()
{
    static auto* const all = new std::vector<ParameterEntry>(tables.begin(), tables.end());
    return *all;
}

std::vector<ParameterEntry>::iterator place(int pid)
{
    return std::lower_bound(allEntries().begin(), allEntries().end(), pid,
                            [](ParameterEntry const& entry, int wanted) { return entry.pid < wanted; });
}

} // namespace

std::size_t ParameterEntry::dataLength() const
{
    return row->bytes + (growsByOne && FuelTrim::byteBInUse() ? 1U : 0U);
}

ParameterEntry const* findParameter(int pid)
{
    auto const found = place(pid);
    return found != allEntries().end() && found->pid == pid ? &*found : nullptr;
}

std::vector<int> parameterPids()
{
    std::vector<int> pids;
    for (ParameterEntry const& entry : allEntries()) {
        pids.push_back(entry.pid);
    }
    return pids;
}

AddedParameter::AddedParameter(ParameterRow const& row) : m_pid(row.pid)
{
    allEntries().insert(place(row.pid), {row.pid, makeOfRow, &row, false});
}

AddedParameter::~AddedParameter()
{
    allEntries().erase(place(m_pid));
}

} // namespace obd
