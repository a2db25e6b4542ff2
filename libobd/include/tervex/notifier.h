#pragma once

#include <tervex/event.h>
#include <tervex/inotifier.h>

#include <cstddef>
#include <memory>
#include <utility>
#include <vector>

namespace tervex {

/// The observer list behind an INotifier, a base class only. No lock at all: its owner decides which thread touches it.
template <typename T>
class Notifier : public virtual INotifier<T>
{
public:
    Notifier(Notifier const&) = delete;
    Notifier& operator=(Notifier const&) = delete;

    void attach(Observer<T>* observer) override { m_observers->push_back(observer); }   ///< not owned
    void detach(Observer<T>* observer) override { std::erase(*m_observers, observer); } ///< all its entries

protected:
    Notifier() = default;
    ~Notifier() override { m_observers->clear(); }

    /// Calls a member function of T on every observer: notify(&T::onSomething, arguments...). Arguments are passed on
    /// as the function declares them, references as references.
    template <typename... Declared, typename... Given>
    void notify(void (T::*function)(Declared...), Given&&... arguments)
    {
        dispatch(Event<T, void (T::*)(Declared...), Declared...>(function, std::forward<Given>(arguments)...));
    }

private:
    /// The list may change during the walk, so its size is read afresh at each step. It may even be emptied by the end
    /// of the notifier, of which nothing else is touched. An observer's exception passes to the caller.
    void dispatch(AbstractEvent<T> const& event)
    {
        std::shared_ptr<std::vector<Observer<T>*>> const observers = m_observers;
        for (std::size_t i = 0; i < observers->size(); ++i) {
            event((*observers)[i]);
        }
    }

    /// Not owned. The list outlives its notifier for as long as a walk is under way.
    std::shared_ptr<std::vector<Observer<T>*>> m_observers = std::make_shared<std::vector<Observer<T>*>>();
};

} // namespace tervex
