#pragma once

#include <obd/iquery.h>

namespace obd {

// Has one control module find out which PIDs a freeze frame holds. For the worker's queue, so that the search does not
// hold up the application; the result stays with the module.
class FreezeFrameConfigurationQuery : public IQuery
{
public:
    FreezeFrameConfigurationQuery(unsigned int ecuId, unsigned char frame) : m_ecuId(ecuId), m_frame(frame) {}

    // UpdateFailed for a module that isn't there or did not answer.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    // None of its own: the module's requests bring theirs.
    unsigned int timeout() const override { return 0; }
    // Keeps nothing.
    void clear() override {}

private:
    unsigned int const m_ecuId;
    unsigned char const m_frame;
};

} // namespace obd
