// What a probe found, as applications see it; see <velmora/probe.h>.

#include "common/text/layout.h"
#include "common/text/text.h"
#include "libvelmora/car/carprobe.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/refusalcode.h"

#include <fmt/format.h>

#include <utility>

namespace velmora {

namespace {

std::string shownData(ProbeState const& state, unsigned int id, std::vector<unsigned char> const& data)
{
    std::string const text = state.task.service == 0x22 ? identifierText(id, data) : hexText(data);
    return text == hexText(data) ? std::string() : text;
}

} // namespace

std::string probedModule(ProbeRequest const& request)
{
    return probeTask(request).header;
}

ProbeReport::ProbeReport(std::shared_ptr<ProbeState const> state) : m_state(std::move(state)) {}

std::size_t ProbeReport::told() const
{
    return m_state->told.size();
}

std::string ProbeReport::toText(TextStyle const& style) const
{
    std::vector<std::vector<Cell>> rows;
    for (auto const& [id, data] : m_state->told) {
        auto const second = m_state->second.find(id);
        bool const changes = second != m_state->second.end() && second->second != data;
        rows.push_back({{probeIdText(m_state->task, id)},
                        {hexText(data)},
                        {readable(shownData(*m_state, id, data))},
                        {changes ? "changes" : ""}});
    }
    std::string text = drawColumns(rows, "  ", styleOf(style));
    for (auto const& [codes, title] : {std::pair(&m_state->locked, "There, but locked"),
                                       {&m_state->later, "There, but not under these conditions"}}) {
        text += codes->empty() ? "" : fmt::format("{}:\n", title);
        for (auto const& [id, code] : *codes) {
            text += fmt::format("  {}  {}\n", probeIdText(m_state->task, id), refusalName(code));
        }
    }
    return text;
}

std::string ProbeReport::toJson() const
{
    return printed(toJsonValue(*m_state));
}

std::string ProbeReport::toSignals() const
{
    return toToml(toSignalFile(*m_state));
}

} // namespace velmora
