#include "libvelmora/output/opening/outputfactory.h"
#include "libvelmora/output/outputrunner.h"

#include <velmora/readingoutput.h>

#include <mutex>
#include <utility>

namespace velmora {

struct ReadingOutput::Parts
{
    struct Notice
    {
        std::mutex mutex;
        std::string text; // protected by mutex
    };

    std::string vehicle;
    std::shared_ptr<Notice> notice = std::make_shared<Notice>(); // the output's thread's, too
    std::unique_ptr<OutputRunner> runner;
};

ReadingOutput::ReadingOutput(std::string const& address, std::string vehicle) : m_parts(std::make_unique<Parts>())
{
    m_parts->vehicle = std::move(vehicle);
    OutputAddress const parsed = parseOutputAddress(address);
    auto const tell = [notice = m_parts->notice](std::string const& text) {
        std::lock_guard const lock(notice->mutex);
        notice->text = text;
    };
    m_parts->runner = std::make_unique<OutputRunner>(toString(parsed), makeOutput(parsed, {}), tell);
    m_parts->runner->start();
}

ReadingOutput::~ReadingOutput() = default;

void ReadingOutput::write(Reading reading)
{
    if (!m_parts->vehicle.empty()) {
        reading.vehicle = m_parts->vehicle;
    }
    m_parts->runner->push(std::make_shared<Record const>(std::move(reading)));
}

OutputCounts ReadingOutput::counts() const
{
    return m_parts->runner->counts();
}

std::string ReadingOutput::trouble() const
{
    std::lock_guard const lock(m_parts->notice->mutex);
    return m_parts->runner->counts().failing ? m_parts->notice->text : std::string();
}

} // namespace velmora
