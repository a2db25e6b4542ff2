#pragma once

#include "libvelmora/port/doorbell.h"
#include "libvelmora/port/ipulledport.h"

#include <array>
#include <atomic>
#include <mutex>
#include <string>
#include <thread>

namespace velmora {

// A port over an open descriptor: a socket or a serial line. A request is written by who sends it, as far as the system
// takes it at once; the rest and all that follows go out with the reading.
class StreamPort : public IPulledPort
{
public:
    StreamPort(StreamPort const&) = delete;
    StreamPort& operator=(StreamPort const&) = delete;

    void start(Receiver onBytes, LossHandler onLost) override;
    void write(std::string_view bytes) override;
    void close() override;
    bool pull(std::string& bytes, Moment until) override;
    void interrupt() override;
    bool isUp() override;

protected:
    enum class Kind
    {
        Socket,
        Line,
    };

    // Who derives from it keeps the descriptor open until closeStream, and calls close in its destructor.
    StreamPort(int descriptor, Kind kind);
    ~StreamPort() override = default;

    // Once, with nobody at the descriptor any more.
    virtual void closeStream() = 0;

private:
    enum class Came
    {
        Bytes,
        Nothing,
        End,
    };

    void run(Receiver const& onBytes, LossHandler const& onLost);
    bool waitFor(Moment until);
    Came take(std::string& bytes);
    std::size_t put(std::string_view bytes);
    void putRest();
    bool isOver();
    void shut();

    int const m_descriptor;
    Kind const m_kind;
    Doorbell m_bell;
    std::array<char, 4096> m_piece{}; // of who reads
    std::atomic<bool> m_interrupted{false};
    std::atomic<bool> m_ends{false};

    std::mutex m_mutex;
    std::string m_outgoing; // protected by m_mutex, as what follows and the closing of the stream
    bool m_broken = false;  // a write has failed
    bool m_closed = false;

    std::thread m_thread;
};

} // namespace velmora
