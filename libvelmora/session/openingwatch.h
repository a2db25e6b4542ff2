#pragma once

#include <obd/idataconnection.h>

#include <mutex>
#include <string>

namespace velmora {

// Watches the traffic while a connection opens: tells how far it has come, and afterwards why it came no further.
class OpeningWatch : public obd::IConnectionLogger
{
public:
    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

    // What goes on, such as "Searching for the bus"; empty before anything does. Any thread, as all that follows.
    std::string phase() const;
    // What the adapter answered to ATI; empty if it did not.
    std::string identification() const;
    // The last command while it has no answer; else empty.
    std::string unanswered() const;
    // Whether replies to 0100 came without the headers that ATH1 asks for.
    bool headersMissing() const;

private:
    mutable std::mutex m_mutex;
    std::string m_phase; // protected by m_mutex, as what follows
    std::string m_identification;
    std::string m_command;
    bool m_answered = true;
    bool m_headersMissing = false;
};

} // namespace velmora
