#include "tests/support/logcapture.h"

#include <common/eventproducer.h>

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

namespace {

class Producer : public tervex::EventProducer<int>
{
public:
    using tervex::EventProducer<int>::fire;
};

// Two interfaces reach the producer's operations through one virtual base, as the library's event carriers do.
class ICarrier : public virtual tervex::IEventProducer<int>
{
public:
    virtual int value() const = 0;
};

class Carrier : public ICarrier, public tervex::EventProducer<int>
{
public:
    int value() const override { return 7; }
    void change() { fire(value()); }
};

struct Listener : tervex::IEventListener<int>
{
    std::vector<int> heard;
    std::function<void()> inside = [] {};

    void onEvent(int const& event) override
    {
        heard.push_back(event);
        inside();
    }
};

TEST(EventProducer, ListenerAttachedTwiceIsCalledTwiceAndOneDetachRemovesBoth)
{
    Producer producer;
    Listener listener;
    producer.attach(&listener);
    producer.attach(&listener);
    producer.fire(3);
    EXPECT_EQ(listener.heard, (std::vector<int>{3, 3}));
    producer.detach(&listener);
    producer.fire(4);
    EXPECT_EQ(listener.heard, (std::vector<int>{3, 3}));
}

TEST(EventProducer, DetachOfAnUnlistedPointerDoesNothing)
{
    Producer producer;
    Listener listed;
    Listener other;
    producer.attach(&listed);
    producer.detach(&other);
    producer.fire(1);
    EXPECT_EQ(listed.heard.size(), 1U);
}

TEST(EventProducer, EmptyListFiresWithoutEffectUnderContention)
{
    support::LogCapture log;
    Producer producer;
    std::thread other([&] {
        for (int i = 0; i < 1000; ++i) {
            producer.fire(i);
        }
    });
    for (int i = 0; i < 1000; ++i) {
        producer.fire(i);
    }
    other.join();
    EXPECT_TRUE(log.lines().empty());
}

TEST(EventProducer, ThrowingListenerEndsTheWalkWithOneFatalLine)
{
    support::LogCapture log;
    Producer producer;
    Listener first;
    Listener second;
    Listener third;
    second.inside = [] { throw std::runtime_error("no"); };
    producer.attach(&first);
    producer.attach(&second);
    producer.attach(&third);
    EXPECT_NO_THROW(producer.fire(1));
    EXPECT_EQ(first.heard.size(), 1U);
    EXPECT_EQ(second.heard.size(), 1U);
    EXPECT_TRUE(third.heard.empty());
    EXPECT_EQ(log.lines(), std::vector<std::string>{"FATAL Listener threw an exception"});
    producer.detach(&second); // the list's lock was released
    producer.fire(2);
    EXPECT_EQ(third.heard, std::vector<int>{2});
}

TEST(EventProducer, ListenersHearInTheOrderOfAttachment)
{
    Producer producer;
    std::vector<char> order;
    Listener a;
    Listener b;
    Listener c;
    a.inside = [&] { order.push_back('a'); };
    b.inside = [&] { order.push_back('b'); };
    c.inside = [&] { order.push_back('c'); };
    for (Listener* listener : {&c, &a, &b}) {
        producer.attach(listener);
    }
    producer.detach(&a);
    producer.attach(&a);
    producer.fire(0);
    EXPECT_EQ(order, (std::vector<char>{'c', 'b', 'a'}));
}

TEST(EventProducer, ImplementsACarriersInterfaceByDominance)
{
    Carrier carrier;
    ICarrier& face = carrier;
    Listener listener;
    face.attach(&listener);
    carrier.change();
    EXPECT_EQ(listener.heard, std::vector<int>{7});
}

TEST(EventProducer, AListenerThatAttachesAnotherInsideAnEventDoesNotHearItThere)
{
    Producer producer;
    Listener first;
    Listener late;
    first.inside = [&] {
        producer.attach(&late);
        first.inside = [] {};
    };
    producer.attach(&first);
    producer.fire(1);
    EXPECT_TRUE(late.heard.empty());
    producer.fire(2);
    EXPECT_EQ(late.heard, std::vector<int>{2});
}

TEST(EventProducer, AListenerMayDetachItselfAndOthersInsideAnEvent)
{
    Producer producer;
    auto first = std::make_unique<Listener>();
    Listener second;
    Listener third;
    first->inside = [&] {
        producer.detach(&second);
        producer.detach(first.get());
        std::unique_ptr<Listener> const gone = std::move(first); // even its own end
    };
    producer.attach(first.get());
    producer.attach(&second);
    producer.attach(&third);
    producer.fire(1);
    producer.fire(2);
    EXPECT_TRUE(second.heard.empty());
    EXPECT_EQ(third.heard, (std::vector<int>{1, 2}));
}

TEST(EventProducer, AListenerMayFireAgainInsideAnEvent)
{
    Producer producer;
    Listener listener;
    listener.inside = [&] {
        if (listener.heard.size() < 3) {
            producer.fire(static_cast<int>(listener.heard.size()));
        }
    };
    producer.attach(&listener);
    producer.fire(0);
    EXPECT_EQ(listener.heard, (std::vector<int>{0, 1, 2}));
}

TEST(EventProducer, NobodyIsInsideAListenerThatWasDetached)
{
    Producer producer;
    std::atomic<bool> done{false};
    std::thread firing([&] {
        while (!done) {
            producer.fire(1);
        }
    });
    for (int i = 0; i < 500; ++i) {
        auto listener = std::make_unique<Listener>(); // whose end a sanitizer sees
        producer.attach(listener.get());
        std::this_thread::yield();
        producer.detach(listener.get());
    }
    done = true;
    firing.join();
}

TEST(EventProducer, FiresFromSeveralThreadsWhileOthersAttachAndDetach)
{
    Producer producer;
    std::vector<std::thread> threads;
    for (int t = 0; t < 2; ++t) {
        threads.emplace_back([&] {
            for (int i = 0; i < 500; ++i) {
                producer.fire(i);
            }
        });
        threads.emplace_back([&] {
            struct Silent : tervex::IEventListener<int>
            {
                std::atomic<int> count{0};
                void onEvent(int const& /*event*/) override { ++count; }
            } silent;
            for (int i = 0; i < 200; ++i) {
                producer.attach(&silent);
                producer.detach(&silent);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    Listener last;
    producer.attach(&last);
    producer.fire(9);
    EXPECT_EQ(last.heard, std::vector<int>{9});
}

} // namespace
