#include "libvelmora/output/outputrunner.h"

namespace velmora {

OutputRunner::OutputRunner(std::string name, std::unique_ptr<IOutput> output, Tell tell, OutputLimits const& limits)
    : m_worker(std::make_shared<OutputWorker>(std::move(name), std::move(output), std::move(tell), limits))
{}

void OutputRunner::start()
{
    m_worker->open();
    m_thread = std::thread([worker = m_worker] { worker->run(); });
}

void OutputRunner::stop()
{
    m_worker->beginStop();
    if (m_thread.joinable()) {
        m_thread.join();
    }
}

bool OutputRunner::stopWithin(std::chrono::milliseconds limit)
{
    m_worker->beginStop();
    if (m_thread.joinable() && !m_worker->waitForEnd(limit)) {
        m_thread.detach();
        return false;
    }
    stop();
    return true;
}

} // namespace velmora
