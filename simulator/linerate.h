#pragma once

#include "simulator/outputqueue.h"

#include <memory>

namespace obdsim {

/// A serial line between a host and a peer: each character, ten bits of it, takes its time in both directions. What
/// belongs together arrives together, when its last character is through.
class LineRate : public IPeer
{
public:
    LineRate(std::shared_ptr<IPeer> inner, int baud);

    void receive(std::string_view bytes) override;
    std::optional<Time> nextOutput() const override;
    std::string advanceTo(Time time) override;
    Time now() const override;
    void connect() override;
    bool linkIsUp() const override;

private:
    Time duration(std::size_t characters) const;

    std::shared_ptr<IPeer> m_inner;
    int m_baud;
    OutputQueue m_toPeer;
    OutputQueue m_toHost;
};

} // namespace obdsim
