#pragma once

#include "libvelmora/output/ioutput.h"

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace velmora {

struct OutputLimits
{
    std::size_t queue = 10000; // records that wait; beyond it the oldest are dropped
    std::size_t batch = 1000;  // records at once
    std::chrono::milliseconds interval{1000};
    std::chrono::milliseconds firstPause{1000}; // after a failure, doubling
    std::chrono::milliseconds longestPause{60000};
};

// The pause after a failure, by the one after the failure before; 0 for the first.
std::chrono::milliseconds nextPause(std::chrono::milliseconds before, OutputLimits const& limits);

// An output's queue, and what its thread does. Shared by that thread and the runner, which it may outlive.
class OutputWorker
{
public:
    using Tell = std::function<void(std::string const& text)>;

    OutputWorker(std::string name, std::unique_ptr<IOutput> output, Tell tell, OutputLimits const& limits);
    OutputWorker(OutputWorker const&) = delete;
    OutputWorker& operator=(OutputWorker const&) = delete;

    // Before run. Throws Error of kind WrongUse; another failure is tried again by run.
    void open();
    // Writes what is pushed until beginStop.
    void run();
    void push(SharedRecord record);
    void flush();
    void beginStop();
    // Waits for the end of run. False if it did not come within that time.
    bool waitForEnd(std::chrono::milliseconds limit);

    std::string const& name() const { return m_name; }
    OutputCounts counts() const;

private:
    using Batch = std::vector<SharedRecord>;

    bool openAgain();
    void takeBatch();
    bool writeBatch();
    void waitForWork();
    void pause();
    void onFailure(std::string const& what);
    void onSuccess();
    OutputState outputState();
    void tellDropped();
    void finish();

    std::string const m_name;
    std::unique_ptr<IOutput> const m_output;
    Tell const m_tell;
    OutputLimits const m_limits;
    mutable std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<SharedRecord> m_queue; // protected by m_mutex, as are the next four
    OutputCounts m_counts;
    bool m_stopped = false;
    bool m_flush = false;
    bool m_ended = false;
    bool m_open = false; // the thread of run alone, once open has returned
    Batch m_batch;       // the thread of run alone, as are the others
    std::chrono::milliseconds m_pause{0};
    std::uint64_t m_droppedTold = 0;
};

} // namespace velmora
