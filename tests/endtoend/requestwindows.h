#pragma once

#include "tests/support/wire/peerconnection.h"

#include <obd/dispatcher.h>
#include <obd/idataconnection.h>
#include <tervex/observer.h>

#include <deque>
#include <memory>
#include <mutex>
#include <string>

// When the requests of one update were on the bus.
struct RequestWindow
{
    std::string command; // the first one
    obdsim::Ms sent{};
    obdsim::Ms received{};
};

// Notes the windows of the updates in the order in which they reach the application. An update is what the worker says
// and hears before it asks for a dispatch. Must be attached to the Dispatcher before whoever dispatches.
class RequestWindows : public obd::IConnectionLogger, public tervex::Observer<obd::IDispatchRunner>
{
public:
    explicit RequestWindows(std::shared_ptr<PeerConnection> car) : m_car(std::move(car))
    {
        m_car->addLogger(this);
        obd::Dispatcher::getInstance().attach(this);
    }
    ~RequestWindows() override
    {
        obd::Dispatcher::getInstance().detach(this);
        m_car->removeLogger(this);
    }
    RequestWindows(RequestWindows const&) = delete;
    RequestWindows& operator=(RequestWindows const&) = delete;

    void onDataSent(std::vector<unsigned char> const& data) override
    {
        std::lock_guard const lock(m_mutex);
        if (m_current.command.empty()) {
            m_current.command.assign(data.begin(), data.end());
            m_current.sent = std::chrono::duration_cast<obdsim::Ms>(m_car->peer().now());
        }
    }
    void onDataReceived(std::vector<unsigned char> const& /*data*/) override
    {
        std::lock_guard const lock(m_mutex);
        m_current.received = std::chrono::duration_cast<obdsim::Ms>(m_car->peer().now());
    }
    void onDispatchRequested() override
    {
        std::lock_guard const lock(m_mutex);
        finishCurrent();
    }

    // Forgets what was said so far.
    void clear()
    {
        std::lock_guard const lock(m_mutex);
        m_current = {};
        m_done.clear();
    }
    // The oldest window; an empty one if there is none. A dispatch that is under way may publish an update before the
    // worker has come to ask for one: the window it takes then is the worker's last.
    RequestWindow take()
    {
        std::lock_guard const lock(m_mutex);
        if (m_done.empty()) {
            finishCurrent();
        }
        if (m_done.empty()) {
            return {};
        }
        RequestWindow const window = m_done.front();
        m_done.pop_front();
        return window;
    }

private:
    void finishCurrent() // under m_mutex
    {
        if (!m_current.command.empty()) {
            m_done.push_back(m_current);
            m_current = {};
        }
    }

    std::shared_ptr<PeerConnection> m_car;
    std::mutex m_mutex;
    RequestWindow m_current;
    std::deque<RequestWindow> m_done;
};
