#include "libobd/module/obdproxy.h"
#include "libobd/parameters/supportedoids.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/fakedevice.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using support::Bytes;

class Ranges : public testing::Test
{
protected:
    // A module on the bus family, known to the proxy.
    std::shared_ptr<IEcu> module(ObdProtocol family)
    {
        m_device->busFamily = family;
        m_device->answer({0x01, 0x00}, 0x10, {0x41, 0x00, 0x00, 0x00, 0x00, 0x00});
        m_proxy->setDevice(m_device);
        EXPECT_TRUE(m_proxy->initialize());
        m_log.clear();
        return m_proxy->firstEcu();
    }
    ~Ranges() override { m_proxy->releaseEcus(); }

    static Bytes request(SupportedOids const& query)
    {
        Bytes bytes;
        query.requestData(bytes);
        return bytes;
    }

    std::shared_ptr<support::FakeDevice> m_device = std::make_shared<support::FakeDevice>();
    std::shared_ptr<ObdProxy> m_proxy = std::make_shared<ObdProxy>();
    support::LogCapture m_log;
};

TEST_F(Ranges, MaskBitsCountFromTheMostSignificant)
{
    auto const ecu = module(ObdProtocolCan11);
    Service01Oids query(0);
    ASSERT_TRUE(query.setResponseData(ecu, {0x41, 0x00, 0xBE, 0x3F, 0xA8, 0x13}));
    EXPECT_EQ(query.oids(*ecu), (Bytes{1, 3, 4, 5, 6, 7, 11, 12, 13, 14, 15, 16, 17, 19, 21, 28, 31, 32}));
    EXPECT_EQ(query.ecuIds(), std::vector<unsigned int>{0x10});
}

TEST_F(Ranges, ValuesAreCountedFromTheRangesFirst)
{
    auto const ecu = module(ObdProtocolCan11);
    Service01Oids query(0x20);
    ASSERT_TRUE(query.setResponseData(ecu, {0x41, 0x20, 0x00, 0x00, 0x00, 0x01}));
    EXPECT_EQ(query.oids(*ecu), Bytes{32});
}

TEST_F(Ranges, ZeroMaskIsAnEmptyList)
{
    auto const ecu = module(ObdProtocolCan11);
    Service01Oids query(0);
    EXPECT_TRUE(query.setResponseData(ecu, {0x41, 0x00, 0x00, 0x00, 0x00, 0x00}));
    EXPECT_TRUE(query.oids(*ecu).empty());
    EXPECT_EQ(query.ecuIds().size(), 1U);
}

TEST_F(Ranges, TooShortAReplyIsRefusedAndKeepsTheEarlierList)
{
    auto const ecu = module(ObdProtocolCan11);
    Service01Oids query(0);
    ASSERT_TRUE(query.setResponseData(ecu, {0x41, 0x00, 0x80, 0x00, 0x00, 0x00}));
    EXPECT_FALSE(query.setResponseData(ecu, {0x41, 0x00, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(query.oids(*ecu), Bytes{1});
    query.clear();
    EXPECT_TRUE(query.oids(*ecu).empty());
}

TEST_F(Ranges, TrailingChecksumIsHarmless)
{
    auto const ecu = module(ObdProtocolJ1850);
    Service01Oids query(0);
    ASSERT_TRUE(query.setResponseData(ecu, {0x41, 0x00, 0x80, 0x00, 0x00, 0x00, 0xFA}));
    EXPECT_EQ(query.oids(*ecu), Bytes{1});
}

TEST_F(Ranges, ModuleThatDidNotAnswerHasAnEmptyList)
{
    EXPECT_TRUE(Service06Oids(0).oids(*module(ObdProtocolCan29)).empty());
}

struct RangeCase
{
    std::shared_ptr<SupportedOids> query;
    Bytes request;
    Bytes lead; // of the reply, up to the mask, on a legacy bus
    Bytes canLead;
    unsigned int timeout;
};

TEST_F(Ranges, EveryServiceHasItsRequestReplyAndTimeout)
{
    RangeCase const cases[] = {
        {std::make_shared<Service01Oids>(0x00), {0x01, 0x00}, {0x41, 0x00}, {0x41, 0x00}, 11000},
        {std::make_shared<Service01Oids>(0x20), {0x01, 0x20}, {0x41, 0x20}, {0x41, 0x20}, 3500},
        {std::make_shared<Service02Oids>(0x40, 3), {0x02, 0x40, 3}, {0x42, 0x40, 3}, {0x42, 0x40, 3}, 3500},
        {std::make_shared<Service05Oids>(0x00, 0x80), {0x05, 0x00, 0x80}, {0x45, 0x00, 0x80}, {0x45, 0x00, 0x80}, 3500},
        {std::make_shared<Service06Oids>(0x20), {0x06, 0x20}, {0x46, 0x20, 0xFF}, {0x46, 0x20}, 3500},
        {std::make_shared<Service08Oids>(0x00, ObdProtocolCan11), {0x08, 0x00}, {0x48, 0x00, 0x00}, {0x48, 0x00}, 3500},
        {std::make_shared<Service09Oids>(0x00), {0x09, 0x00}, {0x49, 0x00, 0x01}, {0x49, 0x00}, 3500},
    };
    for (ObdProtocol const family :
         {ObdProtocolIso9141, ObdProtocolIso14230, ObdProtocolJ1850, ObdProtocolCan11, ObdProtocolCan29}) {
        bool const can = family == ObdProtocolCan11 || family == ObdProtocolCan29;
        auto const ecu = module(family);
        for (RangeCase const& row : cases) {
            EXPECT_EQ(request(*row.query), row.request);
            EXPECT_EQ(row.query->timeout(), row.timeout);
            Bytes reply = can ? row.canLead : row.lead;
            EXPECT_EQ(row.query->payloadOffset(ecu, reply), reply.size());
            reply.insert(reply.end(), {0x80, 0x00, 0x00, 0x01});
            EXPECT_TRUE(row.query->setResponseData(ecu, reply));
            EXPECT_EQ(row.query->oids(*ecu), (Bytes{1, 32}));
        }
    }
    EXPECT_TRUE(m_log.lines().empty());
}

TEST_F(Ranges, Service08FillsItsRequestOnTheOlderBuses)
{
    EXPECT_EQ(request(Service08Oids(0, ObdProtocolCan11)), (Bytes{0x08, 0x00}));
    EXPECT_EQ(request(Service08Oids(0, ObdProtocolCan29)), (Bytes{0x08, 0x00}));
    for (ObdProtocol const family : {ObdProtocolIso9141, ObdProtocolIso14230, ObdProtocolJ1850}) {
        EXPECT_EQ(request(Service08Oids(0, family)), (Bytes{0x08, 0x00, 0, 0, 0, 0, 0}));
    }
}

TEST_F(Ranges, WrongFillerIsToldAndTheReplyUsed)
{
    auto const ecu = module(ObdProtocolJ1850);
    Service06Oids tests(0);
    EXPECT_TRUE(tests.setResponseData(ecu, {0x46, 0x00, 0x12, 0x00, 0x00, 0x00, 0x01}));
    EXPECT_EQ(tests.oids(*ecu), Bytes{32});
    Service08Oids routines(0, ObdProtocolJ1850);
    EXPECT_TRUE(routines.setResponseData(ecu, {0x48, 0x00, 0x07, 0x80, 0x00, 0x00, 0x00}));
    EXPECT_EQ(m_log.lines(),
              (std::vector<std::string>{"ERROR Invalid filler byte: 18", "ERROR Invalid filler byte: 7"}));
}

TEST_F(Ranges, OtherRangesReplyIsNoReply)
{
    auto const ecu = module(ObdProtocolCan11);
    Service02Oids query(0, 1);
    EXPECT_FALSE(query.setResponseData(ecu, {0x42, 0x00, 0x00, 0x80, 0x00, 0x00, 0x00}));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"ERROR Signature mismatch"});
}

} // namespace
