#include "libvelmora/read/codereader.h"
#include "libvelmora/read/servicereplies.h"
#include "libvelmora/read/topicanswer.h"
#include "tests/support/fakeproxy.h"

#include <gtest/gtest.h>

namespace {

using velmora::ServiceReplies;
using velmora::toAnswer;
using Kind = velmora::ServiceReply::Kind;

TEST(ServiceReplies, TellsWhatEachModuleSaid)
{
    ServiceReplies const replies(0x04, {{0x7E8, {0x44}},
                                        {0x7E9, {0x7F, 0x04, 0x22}},
                                        {0x7EA, {0x7F, 0x10, 0x12}},
                                        {0x7EB, {}},
                                        {0x7EC, {0x7F, 0x04, 0x31}},
                                        {0x7ED, {0x7F, 0x04}}});
    EXPECT_EQ(replies.of(0x7E8).kind, Kind::Positive);
    EXPECT_EQ(replies.of(0x7E9).kind, Kind::Refused);
    EXPECT_EQ(replies.of(0x7E9).reason, "conditions not correct (22)");
    EXPECT_EQ(replies.of(0x7EA).kind, Kind::Unreadable);
    EXPECT_EQ(replies.of(0x7EB).kind, Kind::Silent);
    EXPECT_EQ(replies.of(0x7EC).reason, "response code 31");
    EXPECT_EQ(replies.of(0x7ED).kind, Kind::Unreadable);
    EXPECT_EQ(replies.of(0x7E0).kind, Kind::Silent);
    EXPECT_EQ(replies.answering().size(), 6U);
}

TEST(ServiceReplies, OfALostReplyAreNoSilence)
{
    support::FakeProxy proxy;
    auto const kind = [&proxy] { return ServiceReplies(proxy, 0x04, 100).of(0x7E8).kind; };
    EXPECT_EQ(kind(), Kind::Silent);
    proxy.note("04", obd::AdapterNote::ReplyLost);
    EXPECT_EQ(kind(), Kind::Unreadable);
    proxy.fail("04", obd::IDevice::Status::Unparsed);
    EXPECT_EQ(kind(), Kind::Unreadable);
    proxy.answer("04", "44");
    EXPECT_EQ(kind(), Kind::Positive);
}

TEST(TopicAnswers, KeepSilenceRefusalAndUnreadableApart)
{
    using obd::OutcomeKind;
    using velmora::TopicAnswer;
    EXPECT_EQ(toAnswer({OutcomeKind::Answered}), TopicAnswer::Read);
    EXPECT_EQ(toAnswer({OutcomeKind::NothingStored}), TopicAnswer::Read);
    EXPECT_EQ(toAnswer({OutcomeKind::ModuleSilent}), TopicAnswer::Silent);
    EXPECT_EQ(toAnswer({OutcomeKind::Refused, 0x22}), TopicAnswer::Refused);
    EXPECT_EQ(toAnswer({OutcomeKind::Unreadable}), TopicAnswer::Unreadable);
    EXPECT_EQ(toAnswer({OutcomeKind::NotConnected}), TopicAnswer::Silent);
    EXPECT_EQ(toAnswer({OutcomeKind::NotOffered, 0x11}), TopicAnswer::NotOffered);
    EXPECT_EQ(velmora::refusalText(0x22), "conditions not correct (22)");
    EXPECT_EQ(velmora::refusalText(0xA5), "response code A5");
    EXPECT_EQ(velmora::refusalText(0), "");
}

TEST(CodeLists, AreEmptyOnlyIfTheModuleSaysSo)
{
    using obd::OutcomeKind;
    using Answer = velmora::CodeList::Answer;
    using Codes = obd::Outcome<std::vector<std::shared_ptr<obd::DtcDataModel>>>;
    auto const answer = [](obd::Verdict const& verdict) {
        return toCodeList(velmora::CodeKind::Confirmed, Codes(verdict)).answer;
    };
    EXPECT_EQ(answer({OutcomeKind::NothingStored}), Answer::Read);
    EXPECT_EQ(answer({OutcomeKind::ModuleSilent}), Answer::Silent);
    EXPECT_EQ(answer({OutcomeKind::Unreadable}), Answer::Unreadable);
    EXPECT_EQ(answer({OutcomeKind::Refused, 0x22}), Answer::Refused);
    auto const model = std::make_shared<obd::DtcDataModel>("P0133", "Slow", "Powertrain", "Generic");
    velmora::CodeList const list = toCodeList(velmora::CodeKind::Confirmed, Codes({OutcomeKind::Answered}, {model}));
    ASSERT_EQ(list.codes.size(), 1U);
    EXPECT_EQ(list.codes[0].code, "P0133");
    velmora::CodeList const lacking = toCodeList(velmora::CodeKind::Permanent, Codes({OutcomeKind::NotOffered, 0x11}));
    EXPECT_EQ(lacking.answer, Answer::Refused);
    EXPECT_EQ(lacking.reason, "service not supported (11)");
    EXPECT_FALSE(lacking.offered);
}

} // namespace
