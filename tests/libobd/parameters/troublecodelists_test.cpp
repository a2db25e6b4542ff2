#include "libobd/parameters/dtcparameter.h"
#include "tests/libobd/parameters/diagnosticsrig.h"

#include <gtest/gtest.h>

namespace {

// Of the three lists only one takes a reply.
template <typename Codes>
void expectService(unsigned char service)
{
    EXPECT_EQ(diagnosticsrig::requestOf(Codes()), std::vector<unsigned char>{service});
    EXPECT_EQ(Codes().timeout(), 1500U);
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8U);
    for (unsigned char const first : diagnosticsrig::Bytes{0x43, 0x47, 0x4A}) {
        bool const ours = first == service + 0x40;
        EXPECT_EQ(Codes().setResponseData(ecu, {first, 0x01, 0x04, 0x20}), ours) << static_cast<int>(first);
    }
}

TEST(TroubleCodeLists, ConfirmedCodesAreThoseOfService03)
{
    expectService<obd::ConfirmedTroubleCodes>(0x03);
}

TEST(TroubleCodeLists, PendingCodesAreThoseOfService07)
{
    expectService<obd::PendingTroubleCodes>(0x07);
}

TEST(TroubleCodeLists, PermanentCodesAreThoseOfService0A)
{
    expectService<obd::PermanentTroubleCodes>(0x0A);
}

TEST(TroubleCodeLists, AModuleMayAnswerTo03AndRefuse0A)
{
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8U);
    obd::ConfirmedTroubleCodes confirmed;
    obd::PermanentTroubleCodes permanent;
    EXPECT_TRUE(diagnosticsrig::offer(confirmed, ecu, "43 01 04 20"));
    EXPECT_FALSE(diagnosticsrig::offer(permanent, ecu, "7F 0A 11"));
    EXPECT_EQ(permanent.nack(), 0x11);
    EXPECT_EQ(confirmed.getTroubleCodes(*ecu).size(), 1U);
    EXPECT_TRUE(permanent.getTroubleCodes(*ecu).empty());
}

} // namespace
