#include "libvelmora/read/groupedpids.h"
#include "tests/support/fakeproxy.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using support::FakeProxy;
using testing::IsEmpty;
using velmora::GroupedPids;
using Bytes = std::vector<unsigned char>;
using Status = obd::IDevice::Status;

struct GroupedRig
{
    std::shared_ptr<FakeProxy> proxy = std::make_shared<FakeProxy>();
    GroupedPids pids{proxy, 0x7E8};

    std::string read(unsigned char pid)
    {
        obd::ResponseMap responses;
        pids.execute({0x01, pid}, responses, 1000);
        std::string text;
        for (unsigned char const byte : responses[0x7E8]) {
            text += fmtByte(byte);
        }
        return text;
    }
    static std::string fmtByte(unsigned char byte)
    {
        constexpr char digits[] = "0123456789ABCDEF";
        return {digits[byte >> 4U], digits[byte & 0x0FU]};
    }
    void fetch(Bytes const& list) { pids.fetch(list); }
};

TEST(GroupedPids, SixComeWithOneRequestAndAreAnsweredOneByOne)
{
    GroupedRig rig;
    rig.proxy->answer("01 05 0C 0D 0F 11 04",
                      {{0x7E8, "41 05 40 0C 1A F8 0D 20 0F 30 11 50 04 60"}, {0x7E9, "41 05 99"}});
    rig.proxy->answer("01 42 21", "41 21 00 01 42 36 D5"); // in an order of its own
    rig.fetch({0x05, 0x0C, 0x0D, 0x0F, 0x11, 0x04, 0x42, 0x21});
    EXPECT_EQ(rig.read(0x0C), "410C1AF8");
    EXPECT_EQ(rig.read(0x05), "410540") << "not the other module's";
    EXPECT_EQ(rig.read(0x42), "414236D5");
    EXPECT_EQ(rig.proxy->count(), 2);
    rig.proxy->answer("01 46", "41 46 33");
    EXPECT_EQ(rig.read(0x46), "414633") << "what was not fetched is asked for";
    rig.fetch({});
    EXPECT_EQ(rig.read(0x0C), "") << "fetched anew it is not what it was";
}

TEST(GroupedPids, WhatDoesNotDivideExactlyIsDroppedAndNothingIsGroupedAgain)
{
    for (char const* reply : {"41 05 40 0C 1A", "41 05 40 05 41", "41 05 40 0D 20", "41 05 40", "7F 01 12"}) {
        GroupedRig rig;
        rig.proxy->answer("01 05 0C", reply);
        rig.proxy->answer("01 05", "41 05 40");
        rig.proxy->answer("01 0C", "41 0C 1A F8");
        rig.fetch({0x05, 0x0C});
        EXPECT_EQ(rig.read(0x05), "410540") << reply;
        EXPECT_EQ(rig.read(0x0C), "410C1AF8") << reply;
        rig.proxy->forgetRequests();
        rig.fetch({0x05, 0x0C});
        EXPECT_THAT(rig.proxy->requests(), IsEmpty()) << reply;
    }
}

TEST(GroupedPids, LeaveOutWhatHasNoKnownLengthAndEndWhereNobodyAnswers)
{
    GroupedRig rig;
    rig.proxy->answer("01 05 0C", "41 05 40 0C 1A F8");
    rig.fetch({0x05, 0xC2, 0x0C, 0xC2});
    EXPECT_EQ(rig.read(0x05), "410540");
    EXPECT_EQ(rig.proxy->count(), 1);
    obd::ResponseMap responses;
    EXPECT_EQ(rig.pids.execute({0x02, 0x05}, responses, 1000), Status::NoResponse) << "of a freeze frame";
    EXPECT_EQ(rig.pids.execute({0x01, 0x05, 0x0C, 0x0D}, responses, 1000), Status::NoResponse);
    EXPECT_EQ(rig.proxy->count(), 3) << "neither is what was fetched";
    obd::AdapterNote note = obd::AdapterNote::ReplyLost;
    EXPECT_EQ(rig.pids.executeNoted({0x01, 0x05}, responses, 1000, note), Status::Ok);
    EXPECT_EQ(note, obd::AdapterNote::None);
    GroupedRig silent;
    silent.fetch({0x05, 0x0C});
    silent.fetch({0x05, 0x0C});
    EXPECT_EQ(silent.proxy->count(), 1) << "who does not answer two at once is not asked so again";
}

TEST(GroupedPids, AreForCanAndForMoreThanOne)
{
    GroupedRig alone;
    alone.fetch({0x05});
    EXPECT_THAT(alone.proxy->requests(), IsEmpty());
    GroupedRig kLine;
    kLine.proxy->setProtocol(obd::ObdProtocolIso14230);
    kLine.fetch({0x05, 0x0C});
    EXPECT_THAT(kLine.proxy->requests(), IsEmpty());
}

} // namespace
