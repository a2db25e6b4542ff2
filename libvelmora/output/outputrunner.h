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
#include <thread>
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

struct OutputCounts
{
    std::uint64_t accepted = 0;
    std::uint64_t written = 0;
    std::uint64_t dropped = 0;
    std::uint64_t failures = 0;
    std::size_t queued = 0; // those of a write under way too
    bool failing = false;   // the last attempt failed
    std::string lastError;
};

// An output with its own queue and thread, so that a slow or failing one stops neither the car nor the others.
class OutputRunner
{
public:
    // What a person should hear of: that the output began to fail, works again, or has dropped records. Called from
    // the output's thread.
    using Tell = std::function<void(std::string const& text)>;

    OutputRunner(std::string name, std::unique_ptr<IOutput> output, Tell tell, OutputLimits const& limits = {});
    ~OutputRunner() { stop(); }
    OutputRunner(OutputRunner const&) = delete;
    OutputRunner& operator=(OutputRunner const&) = delete;

    // Opens the output and starts its thread. Throws Error of kind WrongUse; another failure is tried again later.
    void start();
    // Never waits. Any thread.
    void push(SharedRecord record);
    // Makes the thread write what is queued without waiting for the end of its interval. Any thread.
    void flush();
    // Makes the thread write what is queued, once and without trying again, and close. Doesn't wait for that.
    void beginStop();
    // The same, and waits.
    void stop();

    std::string const& name() const { return m_name; }
    OutputCounts counts() const;

private:
    using Batch = std::vector<SharedRecord>;

    void run();
    bool openAgain();
    void takeBatch();
    bool writeBatch();
    void waitForWork();
    void pause();
    void onFailure(std::string const& what);
    void onSuccess();
    void tellDropped();
    void finish();

    std::string const m_name;
    std::unique_ptr<IOutput> const m_output;
    Tell const m_tell;
    OutputLimits const m_limits;
    mutable std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<SharedRecord> m_queue; // protected by m_mutex, as are the next three
    OutputCounts m_counts;
    bool m_stopped = false;
    bool m_flush = false;
    bool m_open = false; // the output's thread alone, from start on
    Batch m_batch;       // the output's thread alone, as are the others
    std::chrono::milliseconds m_pause{0};
    std::uint64_t m_droppedTold = 0;
    std::thread m_thread;
};

} // namespace velmora
