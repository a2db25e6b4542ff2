#include "libobd/dispatch/callback.h"
#include "libobd/dispatch/fetcher.h"
#include "libobd/dispatch/query.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/fakequery.h"
#include "tests/support/fakework.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <pthread.h>
#include <thread>

// What several threads do to the Dispatcher at the same time; under ThreadSanitizer the silence is the result.

namespace {

using support::FakeQuery;
using support::FakeWork;
using Status = obd::IQuery::UpdateStatus;

class DispatcherThreads : public testing::Test
{
protected:
    support::LogCapture log;
    support::DispatcherRig rig;
};

TEST_F(DispatcherThreads, FetchesQueriesCallbacksAndCancelsAtOnce)
{
    std::atomic<int> inside{0};
    std::atomic<int> overlaps{0};
    auto const body = [&] {
        overlaps += inside++ != 0 ? 1 : 0;
        std::this_thread::yield();
        --inside;
        return Status::UpdateFailed;
    };
    std::atomic<int> running{0};
    std::vector<std::thread> threads;
    auto const spawn = [&](auto function) {
        ++running;
        threads.emplace_back([&running, function] {
            function();
            --running;
        });
    };
    for (int i = 0; i < 8; ++i) {
        spawn([&body] {
            for (int k = 0; k < 25; ++k) {
                auto const own = std::make_shared<FakeQuery>();
                own->limit = 0;
                own->onUpdate = body;
                EXPECT_FALSE(obd::fetch(own));
            }
        });
    }
    std::atomic<int> called{0};
    spawn([&called] {
        auto const callback = std::make_shared<obd::Callback>();
        for (int k = 0; k < 100; ++k) {
            callback->post([&called] { ++called; });
            std::this_thread::yield();
        }
    });
    spawn([this] {
        for (int k = 0; k < 25; ++k) {
            rig.dispatcher.cancel();
            rig.dispatcher.setProxy(rig.proxy);
            std::this_thread::yield();
        }
    });
    auto const parameter = std::make_shared<FakeQuery>();
    parameter->onUpdate = body;
    obd::Query<FakeQuery> query(parameter);
    auto const ended = [&] {
        query.start([](bool, std::shared_ptr<FakeQuery> const&) {});
        return running == 0;
    };
    EXPECT_TRUE(rig.loop.runUntil(ended));
    for (std::thread& thread : threads) {
        thread.join();
    }
    query.cancel();
    rig.dispatcher.cancel(); // the worker may still be inside the body, which lives on this stack
    EXPECT_EQ(overlaps, 0) << "never two workers at once";
    EXPECT_LE(called, 100);
}

TEST_F(DispatcherThreads, UpdatesRacingForTheFirstStartWithoutAConnectionLeaveNoWorkBehind)
{
    rig.proxy->setConnected(false);
    auto const work = std::make_shared<FakeWork>();
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&] {
            for (int k = 0; k < 50; ++k) {
                EXPECT_FALSE(rig.dispatcher.update(work));
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    rig.proxy->setConnected(true);
    auto const later = std::make_shared<FakeWork>();
    ASSERT_TRUE(rig.dispatcher.update(later));
    ASSERT_TRUE(rig.loop.runUntil([&later] { return later->finished == 1; }));
    EXPECT_EQ(work->executed, 0);
}

TEST_F(DispatcherThreads, UpdatesRacingForTheFirstStartShareOneWorker)
{
    std::vector<std::thread::id> workers;
    auto const work = std::make_shared<FakeWork>();
    work->onExecute = [&workers] { workers.push_back(std::this_thread::get_id()); };
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&] { EXPECT_TRUE(rig.dispatcher.update(work)); });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    ASSERT_TRUE(rig.loop.awaitRequested(8));
    EXPECT_EQ(workers, std::vector<std::thread::id>(8, workers.front()));
}

TEST_F(DispatcherThreads, CancelsFromSeveralThreadsEndEachWorkerOnce)
{
    for (int round = 0; round < 20; ++round) {
        auto const work = std::make_shared<FakeWork>();
        ASSERT_TRUE(rig.dispatcher.update(work));
        std::vector<std::thread> threads;
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([this] { rig.dispatcher.cancel(); });
        }
        for (std::thread& thread : threads) {
            thread.join();
        }
    }
    auto const work = std::make_shared<FakeWork>();
    ASSERT_TRUE(rig.dispatcher.update(work));
    EXPECT_TRUE(rig.loop.runUntil([&work] { return work->finished == 1; }));
}

TEST_F(DispatcherThreads, ProxyThatHoldsItsAnswerHoldsTheCancelUpUntilThen)
{
    rig.proxy->fail("01 00", support::FakeProxy::Status::NoResponse);
    rig.proxy->hold();
    auto const work = std::make_shared<FakeWork>();
    work->onExecute = [this] {
        obd::ResponseMap replies;
        rig.proxy->execute({0x01, 0x00}, replies, 100);
    };
    ASSERT_TRUE(rig.dispatcher.update(work));
    ASSERT_TRUE(rig.proxy->awaitHeld());
    std::thread canceller([&] {
        rig.dispatcher.cancel();
        EXPECT_EQ(work->executed, 1);
    });
    rig.proxy->release();
    canceller.join();
    EXPECT_EQ(work->executed, 1);
}

// Makes the system unable to give a thread: none has room for a stack of that size.
class NoNewThreads
{
public:
    NoNewThreads()
    {
        pthread_getattr_default_np(&m_before);
        pthread_attr_t huge;
        pthread_attr_init(&huge);
        pthread_attr_setstacksize(&huge, std::size_t{1} << 60);
        pthread_setattr_default_np(&huge);
        pthread_attr_destroy(&huge);
    }
    ~NoNewThreads()
    {
        pthread_setattr_default_np(&m_before);
        pthread_attr_destroy(&m_before);
    }
    NoNewThreads(NoNewThreads const&) = delete;
    NoNewThreads& operator=(NoNewThreads const&) = delete;

private:
    pthread_attr_t m_before{};
};

TEST_F(DispatcherThreads, ThreadThatCannotStartRefusesTheWorkAndIsTriedAgain)
{
    auto const work = std::make_shared<FakeWork>();
    {
        NoNewThreads const none;
        EXPECT_FALSE(rig.dispatcher.update(work));
    }
    std::vector<std::string> const lines = log.lines();
    ASSERT_EQ(lines.size(), 2U);
    EXPECT_TRUE(lines[0].starts_with("FATAL Thread create failed: ")) << lines[0];
    EXPECT_EQ(lines[1], "FATAL DispatcherTask failed to start");
    EXPECT_TRUE(rig.dispatcher.update(work));
    EXPECT_TRUE(rig.loop.runUntil([&work] { return work->finished == 1; }));
    EXPECT_EQ(work->executed, 1) << "the refused work was not kept";
}

} // namespace
