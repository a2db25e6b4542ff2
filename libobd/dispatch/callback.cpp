#include "libobd/dispatch/callback.h"

#include <obd/dispatcher.h>

#include <utility>

namespace obd {

void Callback::post(std::function<void()> function)
{
    {
        std::lock_guard const lock(m_mutex);
        m_function.swap(function);
    }
    Dispatcher::getInstance().scheduleUiTask(weak_from_this());
}

void Callback::finish()
{
    std::function<void()> function;
    {
        std::lock_guard const lock(m_mutex);
        function = m_function;
    }
    if (function) {
        function();
    }
}

} // namespace obd
