#pragma once

#include "simulator/adapter/adapter.h"
#include "simulator/dialogue.h"

#include <map>

namespace obdsim {

/// Serves a recorded dialogue: the replies to a command in their order, the last
/// one again and again.
///
/// The echo is the host's choice, so it is taken off the recorded replies and left
/// to the adapter; raw recordings keep it when the adapter does not echo. A reply
/// without its prompt gets it, except in raw recordings. A reply that is given
/// again comes without its SEARCHING... notice, as the bus has been found by then.
///
/// Where headers were switched on late, a host that has them on gets only what was
/// recorded with them.
class ReplayScript : public IScript
{
public:
    explicit ReplayScript(const Dialogue& dialogue);

    std::optional<std::vector<TimedText>> toCommand(const std::string& command, const Settings& settings) override;
    std::optional<std::vector<TimedText>> toRequest(const std::string& request, const Settings& settings,
                                                    BusLink& bus) override;

    /// The recorded name of the adapter, such as "ELM327 v2.3"; empty if the
    /// dialogue has none.
    std::string banner() const;

private:
    struct Row
    {
        std::string key;
        const Exchange* exchange;
        bool headersOn;
        bool beforeBus; ///< recorded before the first answer of a car
    };

    std::optional<std::vector<TimedText>> serve(const std::string& key, const Settings& settings);
    bool fits(const Row& row, const std::string& key, const Settings& settings) const;
    std::vector<TimedText> texts(const Row& row, const Settings& settings) const;
    void addRows();
    void findProtocol();

    Dialogue m_dialogue;
    std::vector<Row> m_rows;
    std::map<std::pair<std::string, bool>, std::size_t> m_served;
    int m_protocol = 0;
    bool m_busServed = false;
};

} // namespace obdsim
