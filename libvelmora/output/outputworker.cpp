#include "libvelmora/output/outputworker.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora {

std::chrono::milliseconds nextPause(std::chrono::milliseconds before, OutputLimits const& limits)
{
    return std::clamp(before * 2, limits.firstPause, limits.longestPause);
}

OutputWorker::OutputWorker(std::string name, std::unique_ptr<IOutput> output, Tell tell, OutputLimits const& limits)
    : m_name(std::move(name)), m_output(std::move(output)), m_tell(std::move(tell)), m_limits(limits)
{}

void OutputWorker::open()
{
    try {
        m_output->open();
        m_open = true;
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::WrongUse) {
            throw;
        }
        onFailure(error.what());
    }
}

bool OutputWorker::waitForEnd(std::chrono::milliseconds limit)
{
    std::unique_lock lock(m_mutex);
    return m_wake.wait_for(lock, limit, [this] { return m_ended; });
}

void OutputWorker::push(SharedRecord record)
{
    std::lock_guard const lock(m_mutex);
    m_queue.push_back(std::move(record));
    ++m_counts.accepted;
    if (m_queue.size() > m_limits.queue) {
        m_queue.pop_front();
        ++m_counts.dropped;
    }
    if (m_queue.size() == m_limits.batch || m_limits.interval.count() == 0) {
        m_wake.notify_all();
    }
}

void OutputWorker::flush()
{
    std::lock_guard const lock(m_mutex);
    m_flush = true;
    m_wake.notify_all();
}

void OutputWorker::beginStop()
{
    std::lock_guard const lock(m_mutex);
    m_stopped = true;
    m_wake.notify_all();
}

OutputCounts OutputWorker::counts() const
{
    std::lock_guard const lock(m_mutex);
    return m_counts;
}

void OutputWorker::run()
{
    while (true) {
        waitForWork();
        {
            std::lock_guard const lock(m_mutex);
            if (m_stopped) {
                break;
            }
        }
        takeBatch();
        if (!openAgain() || !writeBatch()) {
            pause();
        }
        tellDropped();
    }
    finish();
    std::lock_guard const lock(m_mutex);
    m_ended = true;
    m_wake.notify_all();
}

void OutputWorker::waitForWork()
{
    std::unique_lock lock(m_mutex);
    auto const due = [this] { return m_stopped || m_flush || m_queue.size() >= m_limits.batch; };
    if (m_limits.interval.count() == 0) {
        m_wake.wait(lock, [&] { return due() || !m_queue.empty() || !m_batch.empty(); });
    } else {
        m_wake.wait_for(lock, m_limits.interval, due);
    }
    m_flush = false;
}

bool OutputWorker::openAgain()
{
    if (m_open) {
        return true;
    }
    try {
        m_output->open();
        m_open = true;
    } catch (std::exception const& error) {
        onFailure(error.what());
    }
    return m_open;
}

// A batch that failed is tried again as it was.
void OutputWorker::takeBatch()
{
    std::lock_guard const lock(m_mutex);
    if (!m_batch.empty()) {
        return;
    }
    auto const end = m_queue.begin() + static_cast<std::ptrdiff_t>(std::min(m_limits.batch, m_queue.size()));
    m_batch.assign(std::make_move_iterator(m_queue.begin()), std::make_move_iterator(end));
    m_queue.erase(m_queue.begin(), end);
    m_counts.queued = m_queue.size() + m_batch.size();
}

bool OutputWorker::writeBatch()
{
    try {
        m_output->write(m_batch);
    } catch (std::exception const& error) {
        onFailure(error.what());
        return false;
    }
    onSuccess();
    return true;
}

void OutputWorker::onFailure(std::string const& what)
{
    bool first = false;
    {
        std::lock_guard const lock(m_mutex);
        first = !m_counts.failing;
        m_counts.failing = true;
        ++m_counts.failures;
        m_counts.lastError = what;
        m_counts.queued = m_queue.size() + m_batch.size();
    }
    m_pause = nextPause(m_pause, m_limits);
    if (first) {
        m_tell(m_name + ": " + what);
    }
}

// It tells more than it must: that is no reason to fail.
OutputState OutputWorker::outputState()
{
    try {
        return m_output->state();
    } catch (std::exception const&) {
        return {};
    }
}

void OutputWorker::onSuccess()
{
    bool recovered = false;
    OutputState const state = outputState();
    {
        std::lock_guard const lock(m_mutex);
        m_counts.state = state;
        recovered = m_counts.failing;
        m_counts.failing = false;
        m_counts.written += m_batch.size();
        m_batch.clear();
        m_counts.queued = m_queue.size();
    }
    m_pause = std::chrono::milliseconds(0);
    if (recovered) {
        m_tell(m_name + ": works again");
    }
}

void OutputWorker::pause()
{
    std::unique_lock lock(m_mutex);
    m_wake.wait_for(lock, m_pause, [this] { return m_stopped; });
}

// Told when it begins, and then at each tenfold, so that a day without a broker is a handful of lines.
void OutputWorker::tellDropped()
{
    std::uint64_t const dropped = counts().dropped;
    if (dropped > 0 && dropped >= m_droppedTold * 10) {
        m_droppedTold = dropped;
        m_tell(m_name + ": too slow, " + std::to_string(dropped) + " records dropped so far");
    }
}

void OutputWorker::finish()
{
    do {
        takeBatch();
        if (!openAgain() || !writeBatch()) {
            break;
        }
    } while (counts().queued > 0);
    std::size_t const left = counts().queued;
    if (left > 0) {
        m_tell(m_name + ": " + std::to_string(left) + " records could not be written before the end");
    }
    try {
        if (m_open) {
            m_output->close();
        }
    } catch (std::exception const& error) {
        m_tell(m_name + ": " + error.what());
    }
}

} // namespace velmora
