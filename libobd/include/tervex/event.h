#pragma once

#include <tervex/observer.h>

namespace tervex {

/// One call that a Notifier makes on each of its observers.
template <typename T>
class AbstractEvent
{
public:
    virtual ~AbstractEvent() = default;

    /// Makes the call.
    virtual void operator()(Observer<T>* observer) const = 0;
};

/// Stands for an argument position that is not in use.
class DefaultArgument
{};

/// A member function of T with its arguments. Arguments of reference type are held as references: an event is built on
/// the stack, dispatched at once and never stored.
template <typename T, typename F, typename A1 = DefaultArgument, typename A2 = DefaultArgument,
          typename A3 = DefaultArgument, typename A4 = DefaultArgument, typename A5 = DefaultArgument>
class Event : public AbstractEvent<T>
{
public:
    /// What to call, with what.
    Event(F function, A1 a1, A2 a2, A3 a3, A4 a4, A5 a5)
        : m_function(function), m_a1(a1), m_a2(a2), m_a3(a3), m_a4(a4), m_a5(a5)
    {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(m_a1, m_a2, m_a3, m_a4, m_a5); }

private:
    F m_function;
    A1 m_a1;
    A2 m_a2;
    A3 m_a3;
    A4 m_a4;
    A5 m_a5;
};

/// The same with four arguments.
template <typename T, typename F, typename A1, typename A2, typename A3, typename A4>
class Event<T, F, A1, A2, A3, A4, DefaultArgument> : public AbstractEvent<T>
{
public:
    /// What to call, with what.
    Event(F function, A1 a1, A2 a2, A3 a3, A4 a4) : m_function(function), m_a1(a1), m_a2(a2), m_a3(a3), m_a4(a4) {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(m_a1, m_a2, m_a3, m_a4); }

private:
    F m_function;
    A1 m_a1;
    A2 m_a2;
    A3 m_a3;
    A4 m_a4;
};

/// The same with three arguments.
template <typename T, typename F, typename A1, typename A2, typename A3>
class Event<T, F, A1, A2, A3, DefaultArgument, DefaultArgument> : public AbstractEvent<T>
{
public:
    /// What to call, with what.
    Event(F function, A1 a1, A2 a2, A3 a3) : m_function(function), m_a1(a1), m_a2(a2), m_a3(a3) {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(m_a1, m_a2, m_a3); }

private:
    F m_function;
    A1 m_a1;
    A2 m_a2;
    A3 m_a3;
};

/// The same with two arguments.
template <typename T, typename F, typename A1, typename A2>
class Event<T, F, A1, A2, DefaultArgument, DefaultArgument, DefaultArgument> : public AbstractEvent<T>
{
public:
    /// What to call, with what.
    Event(F function, A1 a1, A2 a2) : m_function(function), m_a1(a1), m_a2(a2) {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(m_a1, m_a2); }

private:
    F m_function;
    A1 m_a1;
    A2 m_a2;
};

/// The same with one argument.
template <typename T, typename F, typename A1>
class Event<T, F, A1, DefaultArgument, DefaultArgument, DefaultArgument, DefaultArgument> : public AbstractEvent<T>
{
public:
    /// What to call, with what.
    Event(F function, A1 a1) : m_function(function), m_a1(a1) {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(m_a1); }

private:
    F m_function;
    A1 m_a1;
};

/// The same without arguments.
template <typename T, typename F>
class Event<T, F, DefaultArgument, DefaultArgument, DefaultArgument, DefaultArgument, DefaultArgument>
    : public AbstractEvent<T>
{
public:
    /// What to call.
    explicit Event(F function) : m_function(function) {}

    /// Makes the call.
    void operator()(Observer<T>* observer) const override { (observer->*m_function)(); }

private:
    F m_function;
};

} // namespace tervex
