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

    Parts(OutputAddress const& address, std::string name) : vehicle(std::move(name))
    {
        auto const tell = [notice = notice](std::string const& text) {
            std::lock_guard const lock(notice->mutex);
            notice->text = text;
        };
        runner = std::make_unique<OutputRunner>(toString(address), makeOutput(address, {}), tell);
        runner->start();
    }

    std::string vehicle;
    std::shared_ptr<Notice> notice = std::make_shared<Notice>(); // the output's thread's, too
    std::unique_ptr<OutputRunner> runner;
};

ReadingOutput::ReadingOutput(std::string const& address, std::string vehicle)
    : m_parts(std::make_unique<Parts>(parseOutputAddress(address), std::move(vehicle)))
{}

ReadingOutput::ReadingOutput(std::string const& kind, std::filesystem::path const& file, std::string vehicle)
    : m_parts(std::make_unique<Parts>(fileOutput(kind, file), std::move(vehicle)))
{}

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
