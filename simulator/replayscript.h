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
    explicit ReplayScript(Dialogue const& dialogue);

    std::optional<std::vector<TimedText>> toCommand(std::string const& command, Settings const& settings) override;
    std::optional<std::vector<TimedText>> toRequest(std::string const& request, Settings const& settings,
                                                    BusLink& bus) override;

    /// The recorded name of the adapter, such as "ELM327 v2.3"; empty if the
    /// dialogue has none.
    std::string banner() const;

private:
    struct Row
    {
        std::string key;
        Exchange const* exchange;
        bool headersOn;
        bool beforeBus; ///< recorded before the first answer of a car
    };

    std::optional<std::vector<TimedText>> serve(std::string const& key, Settings const& settings);
    bool fits(Row const& row, std::string const& key, Settings const& settings) const;
    std::vector<TimedText> texts(Row const& row, Settings const& settings) const;
    void addRows();
    void findProtocol();

    Dialogue m_dialogue;
    std::vector<Row> m_rows;
    std::map<std::pair<std::string, bool>, std::size_t> m_served;
    int m_protocol = 0;
    bool m_busServed = false;
};

} // namespace obdsim
