#include <tervex/notifier.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

class IListenerFace
{
public:
    virtual ~IListenerFace() = default;
    virtual void none() = 0;
    virtual void one(int a) = 0;
    virtual void two(int a, std::string const& b) = 0;
    virtual void three(bool flag, std::shared_ptr<int> const& pointer, std::vector<int> const& list) = 0;
    virtual void four(int a, int b, int c, int d) = 0;
    virtual void five(int a, int b, int c, int d, int& e) = 0;
};

class Source : public tervex::Notifier<IListenerFace>
{
public:
    using tervex::Notifier<IListenerFace>::notify;
};

struct Face : tervex::Observer<IListenerFace>
{
    std::vector<std::string> calls;
    std::function<void()> inside = [] {};
    void const* lastList = nullptr;
    std::shared_ptr<int> lastPointer;
    bool lastFlag = false;

    void none() override
    {
        calls.emplace_back("none");
        inside();
    }
    void one(int a) override { calls.push_back("one " + std::to_string(a)); }
    void two(int a, std::string const& b) override { calls.push_back("two " + std::to_string(a) + b); }
    void three(bool flag, std::shared_ptr<int> const& pointer, std::vector<int> const& list) override
    {
        lastFlag = flag;
        lastPointer = pointer;
        lastList = &list;
        calls.push_back("three " + std::to_string(list.size()));
    }
    void four(int a, int b, int c, int d) override { calls.push_back("four " + std::to_string(a + b + c + d)); }
    void five(int a, int b, int c, int d, int& e) override { e += a + b + c + d; }
};

TEST(Notifier, DeliversEveryArity)
{
    Source source;
    Face face;
    source.attach(&face);
    int sum = 100;
    source.notify(&IListenerFace::none);
    source.notify(&IListenerFace::one, 1);
    source.notify(&IListenerFace::two, 2, "x");
    source.notify(&IListenerFace::four, 1, 2, 3, 4);
    source.notify(&IListenerFace::five, 1, 2, 3, 4, sum);
    EXPECT_EQ(face.calls, (std::vector<std::string>{"none", "one 1", "two 2x", "four 10"}));
    EXPECT_EQ(sum, 110);
}

TEST(Notifier, DeliversTheSameArgumentsToEachObserver)
{
    Source source;
    Face a;
    Face b;
    source.attach(&a);
    source.attach(&b);
    auto const pointer = std::make_shared<int>(5);
    std::vector<int> const list{1, 2, 3};
    source.notify(&IListenerFace::three, true, pointer, list);
    for (Face const* face : {&a, &b}) {
        EXPECT_TRUE(face->lastFlag);
        EXPECT_EQ(face->lastPointer, pointer);
        EXPECT_EQ(face->lastList, &list) << "references are passed on, not copied";
    }
}

TEST(Notifier, EventIsBuiltFromAnExplicitFunctionAndItsArguments)
{
    Face face;
    tervex::Event<IListenerFace, void (IListenerFace::*)()> const call(&IListenerFace::none);
    call(&face);
    EXPECT_EQ(face.calls, std::vector<std::string>{"none"});
}

TEST(Notifier, AttachedTwiceIsCalledTwiceAndOneDetachRemovesBoth)
{
    Source source;
    Face face;
    Face other;
    source.attach(&face);
    source.attach(&other);
    source.attach(&face);
    source.notify(&IListenerFace::none);
    EXPECT_EQ(face.calls.size(), 2U);
    source.detach(&face);
    source.notify(&IListenerFace::none);
    EXPECT_EQ(face.calls.size(), 2U);
    EXPECT_EQ(other.calls.size(), 2U);
}

TEST(Notifier, ObserverThatDetachesItselfHidesTheNextOneThisOnce)
{
    Source source;
    Face first;
    Face second;
    Face third;
    first.inside = [&] { source.detach(&first); };
    for (Face* face : {&first, &second, &third}) {
        source.attach(face);
    }
    source.notify(&IListenerFace::none);
    EXPECT_TRUE(second.calls.empty());
    EXPECT_EQ(third.calls.size(), 1U);
    source.notify(&IListenerFace::none);
    EXPECT_EQ(first.calls.size(), 1U);
    EXPECT_EQ(second.calls.size(), 1U);
}

TEST(Notifier, ObserverThatAttachesDuringTheWalkIsCalledInIt)
{
    Source source;
    Face first;
    Face late;
    first.inside = [&] { source.attach(&late); };
    source.attach(&first);
    source.notify(&IListenerFace::none);
    EXPECT_EQ(late.calls.size(), 1U);
}

TEST(Notifier, AnObserverThatEndsTheNotifierIsTheLastToBeCalled)
{
    auto source = std::make_unique<Source>();
    Face first;
    Face second;
    first.inside = [&] { source.reset(); };
    source->attach(&first);
    source->attach(&second);
    source->notify(&IListenerFace::none);
    EXPECT_EQ(first.calls.size(), 1U);
    EXPECT_TRUE(second.calls.empty());
}

TEST(Notifier, ExceptionOfAnObserverReachesTheDispatchingCode)
{
    Source source;
    Face bad;
    Face behind;
    bad.inside = [] { throw std::runtime_error("no"); };
    source.attach(&bad);
    source.attach(&behind);
    EXPECT_THROW(source.notify(&IListenerFace::none), std::runtime_error);
    EXPECT_TRUE(behind.calls.empty());
}

} // namespace
