#pragma once

#include "libvelmora/output/outputworker.h"

#include <memory>
#include <string>
#include <thread>

namespace velmora {

// An output with its own queue and thread, so that a slow or failing one stops neither the car nor the others.
class OutputRunner
{
public:
    // What a person should hear of: that the output began to fail, works again, or has dropped records. Called from
    // the output's thread, for as long as that lives.
    using Tell = OutputWorker::Tell;

    OutputRunner(std::string name, std::unique_ptr<IOutput> output, Tell tell, OutputLimits const& limits = {});
    ~OutputRunner() { stop(); }
    OutputRunner(OutputRunner const&) = delete;
    OutputRunner& operator=(OutputRunner const&) = delete;

    // Opens the output and starts its thread. Throws Error of kind WrongUse; another failure is tried again later.
    void start();
    // Never waits. Any thread.
    void push(SharedRecord record) { m_worker->push(std::move(record)); }
    // Makes the thread write what is queued without waiting for the end of its interval. Any thread.
    void flush() { m_worker->flush(); }
    // Makes the thread write what is queued, once and without trying again, and close. Doesn't wait for that.
    void beginStop() { m_worker->beginStop(); }
    // The same, and waits.
    void stop();
    // The same, but waits no longer than that. False if the output hangs: its thread is left to itself then, with all
    // that it needs.
    bool stopWithin(std::chrono::milliseconds limit);

    std::string const& name() const { return m_worker->name(); }
    OutputCounts counts() const { return m_worker->counts(); }

private:
    std::shared_ptr<OutputWorker> const m_worker; // the thread's, too
    std::thread m_thread;
};

} // namespace velmora
