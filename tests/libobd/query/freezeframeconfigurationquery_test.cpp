#include "libobd/query/freezeframeconfigurationquery.h"
#include "tests/support/fakeproxy.h"

#include <gtest/gtest.h>

namespace {

using Status = obd::IQuery::UpdateStatus;

class FreezeFrameConfigurationQuery : public testing::Test
{
protected:
    Status update(unsigned int ecuId, unsigned char frame)
    {
        obd::FreezeFrameConfigurationQuery query(ecuId, frame);
        Status const status = query.update(m_proxy);
        query.clear();
        return status;
    }

    std::shared_ptr<support::FakeProxy> m_proxy = std::make_shared<support::FakeProxy>();
    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>(0x7E9U);
};

TEST_F(FreezeFrameConfigurationQuery, DetectsItsFrameOnItsModule)
{
    m_ecu->setFrame(3, {0x00, 0x02, 0x0C});
    m_proxy->addEcu(m_ecu);
    EXPECT_EQ(update(0x7E9, 3), Status::UpdateOk);
    EXPECT_TRUE(m_ecu->isSupported(obd::ObdMode::FreezeFrame, 0x0C, 3)) << "clear leaves the module's knowledge";
    EXPECT_EQ(m_ecu->frameDetections(), 1);
}

TEST_F(FreezeFrameConfigurationQuery, FailsWhereTheModuleDoesNotAnswer)
{
    m_proxy->addEcu(m_ecu);
    EXPECT_EQ(update(0x7E9, 0), Status::UpdateFailed);
    EXPECT_EQ(m_ecu->frameDetections(), 1);
}

TEST_F(FreezeFrameConfigurationQuery, FailsForAModuleThatIsNotThere)
{
    EXPECT_EQ(update(0x123, 0), Status::UpdateFailed);
}

TEST_F(FreezeFrameConfigurationQuery, HasNoTimeoutOfItsOwn)
{
    EXPECT_EQ(obd::FreezeFrameConfigurationQuery(0x7E8, 0).timeout(), 0U);
}

} // namespace
