#pragma once

#include "simulator/fault.h"
#include "simulator/outputqueue.h"

#include <memory>
#include <random>

namespace obdsim {

/// A peer whose output goes wrong on the way. The same plan, seed and input give
/// the same faults.
class FaultyPeer : public IPeer
{
public:
    FaultyPeer(std::shared_ptr<IPeer> inner, FaultPlan plan);

    void receive(std::string_view bytes) override;
    std::optional<Time> nextOutput() const override;
    std::string advanceTo(Time time) override;
    Time now() const override;
    void connect() override;
    bool linkIsUp() const override;

    /// One more fault, whose place counts from here on.
    void add(Fault fault);

    /// All faults end; a broken link stays broken.
    void clear();

    /// The link breaks now, until the next connection.
    void breakLink();

private:
    void startCommand();
    bool ends(std::uint64_t command);
    void restart(std::string const& word);
    void pull(Time time);
    void pass(char byte, Time time);
    void addNoise(Time time);
    bool happens(Fault const& fault, std::uint64_t position);
    bool chance(double probability);
    void put(char byte, Time time);

    std::shared_ptr<IPeer> m_inner;
    FaultPlan m_plan;
    OutputQueue m_output;
    std::mt19937 m_random;
    std::uint64_t m_byte = 0;    ///< bytes of output so far
    std::uint64_t m_command = 0; ///< commands received so far
    bool m_dropping = false;     ///< the rest of a reply, up to its prompt
    bool m_promptLost = false;   ///< the reply under way will lack its prompt
    bool m_silent = false;
    bool m_linkUp = true;
};

} // namespace obdsim
