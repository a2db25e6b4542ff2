#include "program/live/liverecord.h"

#include "libvelmora/output/opening/outputfactory.h"

#include <utility>

namespace velmora::cli {

LiveRecord::LiveRecord(std::filesystem::path file, std::string vehicle)
    : m_file(std::move(file)), m_vehicle(std::move(vehicle))
{
    OutputAddress const address{"sqlite", m_file.string(), {}};
    auto const tell = [notice = m_notice](std::string const& text) {
        std::lock_guard const lock(notice->mutex);
        notice->text = text;
    };
    m_runner = std::make_unique<OutputRunner>(toString(address), makeOutput(address, {}), tell);
    m_runner->start();
}

void LiveRecord::take(PollResult const& result)
{
    for (Reading reading : result.readings) {
        reading.vehicle = m_vehicle;
        m_runner->push(std::make_shared<Record const>(std::move(reading)));
    }
}

std::string LiveRecord::trouble() const
{
    std::lock_guard const lock(m_notice->mutex);
    return m_runner->counts().failing ? m_notice->text : std::string();
}

} // namespace velmora::cli
