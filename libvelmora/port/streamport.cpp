#include "libvelmora/port/streamport.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <utility>

namespace velmora {

namespace {

// More than any reply; what floods is handed on in pieces of that size.
constexpr std::size_t mostAtOnce = 1U << 20U;
constexpr short linkGone = POLLRDHUP | POLLHUP | POLLERR | POLLNVAL;

// For poll, which takes a negative time for no end.
int millisUntil(IPulledPort::Moment until)
{
    using std::chrono::milliseconds;
    if (until == IPulledPort::Moment::max()) {
        return -1;
    }
    auto const left = std::chrono::ceil<milliseconds>(until - std::chrono::steady_clock::now());
    return static_cast<int>(std::clamp<milliseconds::rep>(left.count(), 0, INT_MAX));
}

bool wouldWait()
{
    return errno == EAGAIN || errno == EINTR; // EWOULDBLOCK is the same as the first
}

} // namespace

StreamPort::StreamPort(int descriptor, Kind kind) : m_descriptor(descriptor), m_kind(kind)
{
    ::fcntl(descriptor, F_SETFL, ::fcntl(descriptor, F_GETFL) | O_NONBLOCK);
}

void StreamPort::start(Receiver onBytes, LossHandler onLost)
{
    m_thread = std::thread([this, onBytes = std::move(onBytes), onLost = std::move(onLost)] { run(onBytes, onLost); });
}

void StreamPort::run(Receiver const& onBytes, LossHandler const& onLost)
{
    std::string bytes;
    while (!m_ends) {
        bytes.clear();
        bool const up = pull(bytes, Moment::max());
        if (!bytes.empty()) {
            onBytes(bytes);
        }
        if (!up) {
            if (!m_ends) {
                onLost();
            }
            return;
        }
    }
}

void StreamPort::write(std::string_view bytes)
{
    std::lock_guard const lock(m_mutex);
    if (m_closed || m_broken) {
        return;
    }
    bytes.remove_prefix(m_outgoing.empty() ? put(bytes) : 0);
    if (!bytes.empty()) {
        m_outgoing += bytes;
        m_bell.ring();
    }
}

void StreamPort::close()
{
    m_ends = true;
    m_bell.ring();
    if (m_thread.joinable()) {
        m_thread.join();
    }
    shut();
}

bool StreamPort::pull(std::string& bytes, Moment until)
{
    bool const looks = until <= std::chrono::steady_clock::now(); // nothing to wait for, so no wait is begun
    while (!isOver()) {
        if (!looks && !waitFor(until)) {
            return true;
        }
        Came const came = take(bytes);
        if (came == Came::End) {
            break;
        }
        if (came == Came::Bytes || looks) {
            return true;
        }
    }
    shut();
    return false;
}

void StreamPort::interrupt()
{
    m_interrupted = true;
    m_bell.ring();
}

bool StreamPort::isUp()
{
    std::lock_guard const lock(m_mutex);
    if (m_closed || m_broken) {
        return false;
    }
    pollfd link{m_descriptor, POLLRDHUP, 0};
    ::poll(&link, 1, 0);
    return (link.revents & linkGone) == 0;
}

// Sends what waits meanwhile. False when there is nothing to read: the time is over, or somebody has interrupted.
bool StreamPort::waitFor(Moment until)
{
    while (true) {
        if (m_interrupted.exchange(false) || m_ends) {
            return false;
        }
        short wanted = POLLIN;
        {
            std::lock_guard const lock(m_mutex);
            if (m_broken) {
                return true; // who reads finds out
            }
            wanted = m_outgoing.empty() ? POLLIN : POLLIN | POLLOUT;
        }
        std::array<pollfd, 2> ends{{{m_descriptor, wanted, 0}, {m_bell.descriptor(), POLLIN, 0}}};
        int const ready = ::poll(ends.data(), ends.size(), millisUntil(until));
        if (ready == 0) {
            return false;
        }
        if (ends[1].revents != 0) {
            m_bell.hush();
        }
        if ((ends[0].revents & POLLOUT) != 0) {
            putRest();
        }
        if ((ends[0].revents & ~POLLOUT) != 0) {
            return true;
        }
    }
}

StreamPort::Came StreamPort::take(std::string& bytes)
{
    Came came = Came::Nothing;
    while (bytes.size() < mostAtOnce) {
        ssize_t const count = ::read(m_descriptor, m_piece.data(), m_piece.size());
        if (count <= 0) {
            return count == 0 || !wouldWait() ? Came::End : came;
        }
        bytes.append(m_piece.data(), static_cast<std::size_t>(count));
        came = Came::Bytes;
        if (static_cast<std::size_t>(count) < m_piece.size()) {
            break; // there was no more
        }
    }
    return came;
}

bool StreamPort::isOver()
{
    std::lock_guard const lock(m_mutex);
    return m_closed || m_broken;
}

// What the system takes at once of these bytes. Under the mutex.
std::size_t StreamPort::put(std::string_view bytes)
{
    ssize_t const taken = m_kind == Kind::Line
                              ? ::write(m_descriptor, bytes.data(), bytes.size())
                              : ::send(m_descriptor, bytes.data(), bytes.size(), MSG_NOSIGNAL); // no SIGPIPE
    m_broken = taken < 0 && !wouldWait();
    return taken > 0 ? static_cast<std::size_t>(taken) : 0;
}

void StreamPort::putRest()
{
    std::lock_guard const lock(m_mutex);
    if (!m_closed && !m_outgoing.empty()) {
        m_outgoing.erase(0, put(m_outgoing));
    }
}

void StreamPort::shut()
{
    std::lock_guard const lock(m_mutex);
    if (!std::exchange(m_closed, true)) {
        closeStream();
    }
}

} // namespace velmora
