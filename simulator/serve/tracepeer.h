#pragma once

#include "simulator/peer.h"

#include <cstdio>
#include <memory>

namespace obdsim {

/// A text file of all that passes between hosts and peers.
class TraceFile
{
public:
    /// Throws SimulatorError if the file cannot be written.
    explicit TraceFile(std::string const& path);
    ~TraceFile();
    TraceFile(TraceFile const&) = delete;
    TraceFile& operator=(TraceFile const&) = delete;

    /// "12.345678 3 > 010C\r": seconds, number of the car, from or to the host, the bytes with escapes.
    /// Whether something of it could not be written.
    bool failed() const { return m_told; }

    void write(Time time, std::size_t car, char direction, std::string_view bytes);

private:
    std::string m_path;
    std::FILE* m_file;
    bool m_told = false; ///< that the disk is full
};

/// Writes down what passes a peer.
class TracePeer : public IPeer
{
public:
    TracePeer(std::shared_ptr<IPeer> inner, std::shared_ptr<TraceFile> file, std::size_t car);

    void receive(std::string_view bytes) override;
    std::optional<Time> nextOutput() const override;
    std::optional<Time> nextWake() const override;
    std::string advanceTo(Time time) override;
    Time now() const override;
    void connect() override;
    bool linkIsUp() const override;

private:
    std::shared_ptr<IPeer> m_inner;
    std::shared_ptr<TraceFile> m_file;
    std::size_t m_car;
};

} // namespace obdsim
