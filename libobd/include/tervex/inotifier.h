#pragma once

#include <tervex/observer.h>

namespace tervex {

/// Calls the observers of an interface T, towards the application. Not thread safe: attach and detach on the thread
/// that dispatches. Observers are not owned.
template <typename T>
class INotifier
{
public:
    virtual ~INotifier() = default;

    /// No check for duplicates: an observer that is attached twice is called twice.
    virtual void attach(Observer<T>* observer) = 0;

    /// Removes every entry of the observer. One that detaches itself inside a call makes this walk skip its successor.
    /// An observer that ends the notifier itself inside a call is the last to be called.
    virtual void detach(Observer<T>* observer) = 0;
};

} // namespace tervex
