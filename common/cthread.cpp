#include <common/cthread.h>
#include <common/logrecord.h>
#include <common/tracestream.h>

#include <system_error>
#include <utility>

namespace tervex {

CThread::CThread(char const* name) : m_name(name) {}

CThread::~CThread()
{
    TraceStream << m_name;
    if (joinable()) {
        TERVEX_LOG(Error) << m_name << " still joinable";
        join();
    }
}

bool CThread::startThread(std::function<void()> body)
{
    if (joinable()) {
        return false;
    }
    try {
        m_thread = std::make_unique<std::thread>(std::move(body));
        return true;
    } catch (std::system_error const& error) {
        TERVEX_LOG(Fatal) << "Thread create failed: " << error.what();
        return false;
    }
}

void CThread::join()
{
    if (!joinable()) {
        return;
    }
    try {
        m_thread->join();
    } catch (std::system_error const& error) {
        TERVEX_LOG(Fatal) << "Thread join failed: " << error.what();
    }
}

} // namespace tervex
