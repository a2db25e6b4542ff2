#pragma once

#include "tests/support/logcapture.h"
#include "tests/support/servicerig.h"

#include <gtest/gtest.h>

namespace support {

// For tests of a service: an engine's module, 0x7E8, on a rig without a connection.
class ServiceTest : public testing::Test
{
protected:
    ServiceTest() { m_rig.rig.proxy->setEcus({m_engine}); }

    // From here on there is a connection, and the log begins.
    void open()
    {
        m_rig.open();
        m_log.clear();
    }

    FakeProxy& proxy() { return *m_rig.rig.proxy; }

    std::shared_ptr<FakeEcu> m_engine = std::make_shared<FakeEcu>(0x7E8U);
    LogCapture m_log;
    ServiceRig m_rig;
};

} // namespace support
