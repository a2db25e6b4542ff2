#include "libvelmora/output/holdingoutput.h"

#include "libvelmora/output/recordtime.h"

#include <utility>

namespace velmora {

HoldingOutput::HoldingOutput(std::unique_ptr<IOutput> output, OutputAddress const& address,
                             OutputContext const& context)
    : m_output(std::move(output)), m_name(toString(address)), m_tell(context.tell), m_keeper(context.clocks)
{}

void HoldingOutput::open()
{
    m_output->open();
    m_keeper.resume(*this);
}

void HoldingOutput::write(Records records)
{
    m_keeper.begin(*this);
    std::vector<SharedRecord> batch = m_held;
    for (SharedRecord const& each : records) {
        batch.push_back(m_keeper.dated(each));
    }
    bool const waits = m_keeper.trust() == ClockJudge::Trust::Wait;
    if (waits && batch.size() <= most) {
        m_output->write({});
        m_held = std::move(batch);
    } else {
        m_output->write(batch);
        m_held.clear();
        if (m_keeper.trust() != ClockJudge::Trust::Sure) {
            tellUnsure();
        }
    }
    m_keeper.done();
}

void HoldingOutput::shiftHeld(std::int64_t millis, ClockStamp const& stamp)
{
    for (SharedRecord& each : m_held) {
        each = std::make_shared<Record const>(shifted(*each, std::chrono::milliseconds(millis)));
    }
    m_stamp = stamp;
}

void HoldingOutput::tellUnsure()
{
    if (!std::exchange(m_told, true)) {
        m_tell(m_name + ": the clock was not set since the machine's start; times are written as it tells them");
    }
}

void HoldingOutput::close()
{
    if (!m_held.empty()) {
        m_output->write(m_held);
        m_held.clear();
        tellUnsure();
    }
    m_output->close();
}

OutputState HoldingOutput::state()
{
    OutputState state = m_output->state();
    if (!m_held.empty()) {
        state.waiting = m_held.size();
    }
    return state;
}

} // namespace velmora
