#include "libobd/dispatch/callback.h"
#include "tests/support/dispatcherrig.h"

#include <gtest/gtest.h>

namespace {

class Callback : public testing::Test
{
protected:
    support::DispatcherRig rig;
    std::shared_ptr<obd::Callback> callback = std::make_shared<obd::Callback>();
};

TEST_F(Callback, PostedTwiceBeforeADispatchRunsTwiceWithTheSecondValueBothTimes)
{
    std::vector<int> values;
    callback->post([&values] { values.push_back(1); });
    callback->post([&values] { values.push_back(2); });
    EXPECT_EQ(rig.loop.requested(), 2);
    EXPECT_TRUE(values.empty()) << "nothing runs before the dispatch";
    rig.dispatcher.dispatch();
    EXPECT_EQ(values, (std::vector<int>{2, 2}));
}

TEST_F(Callback, RunsWithoutAConnection)
{
    rig.proxy->setConnected(false);
    int calls = 0;
    callback->post([&calls] { ++calls; });
    rig.dispatcher.dispatch();
    EXPECT_EQ(calls, 1);
}

TEST_F(Callback, KeepsItsFunctionAfterTheCall)
{
    int calls = 0;
    callback->post([&calls] { ++calls; });
    rig.dispatcher.dispatch();
    callback->finish();
    EXPECT_EQ(calls, 2);
}

TEST_F(Callback, WithoutAFunctionDoesNothing)
{
    EXPECT_NO_THROW(callback->finish());
    EXPECT_NO_THROW(callback->execute(nullptr));
    callback->post(nullptr);
    EXPECT_NO_THROW(rig.dispatcher.dispatch());
}

TEST_F(Callback, GoneBeforeTheDispatchIsNotRun)
{
    int calls = 0;
    callback->post([&calls] { ++calls; });
    callback.reset();
    rig.dispatcher.dispatch();
    EXPECT_EQ(calls, 0);
}

TEST_F(Callback, MayPostItselfAnewFromInside)
{
    std::vector<int> values;
    callback->post([&] {
        values.push_back(1);
        callback->post([&values] { values.push_back(2); });
    });
    rig.dispatcher.dispatch();
    EXPECT_EQ(values, (std::vector<int>{1, 2}));
}

} // namespace
