#pragma once

#include "libvelmora/output/clockkeeper.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/outputcontext.h"

#include <memory>
#include <vector>

namespace velmora {

// Stands before an output whose lines can't be changed once they are written: holds records back, in memory, while the
// clock may still be set, and repairs their times. Minutes after the machine's start at most, and so many records at
// most; then they go as they are, and that is told.
class HoldingOutput : public IOutput, private IHeldRows
{
public:
    static constexpr std::size_t most = 20000;

    HoldingOutput(std::unique_ptr<IOutput> output, OutputAddress const& address, OutputContext const& context);

    void open() override;
    void write(Records records) override;
    void close() override;
    OutputState state() override;

private:
    std::optional<ClockStamp> heldStamp() override { return m_stamp; }
    void keepStamp(ClockStamp const& stamp) override { m_stamp = stamp; }
    void shiftHeld(std::int64_t millis, ClockStamp const& stamp) override;
    void release(ClockJudge::Trust /*trust*/) override { m_stamp.reset(); }
    void tellUnsure();

    std::unique_ptr<IOutput> const m_output;
    std::string const m_name;
    OutputWorker::Tell const m_tell;
    ClockKeeper m_keeper;
    std::vector<SharedRecord> m_held;
    std::optional<ClockStamp> m_stamp;
    bool m_told = false;
};

} // namespace velmora
