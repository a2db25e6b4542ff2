#pragma once

#include "simulator/adapter/command.h"
#include "simulator/outputqueue.h"
#include "simulator/requestlog.h"

namespace obdsim {

/// Answers that stand ready before the adapter thinks of its own: a recorded
/// dialogue. Commands come in capitals and without blanks.
class IScript
{
public:
    virtual ~IScript() = default;

    /// The bytes that answer an AT command, without its echo; nothing to let the
    /// adapter answer. The effect on its settings takes place either way;
    /// `settings` are those before it.
    virtual std::optional<std::vector<TimedText>> toCommand(std::string const& command, Settings const& settings) = 0;

    /// The same for a request to the bus. `bus` may be told the protocol in use.
    virtual std::optional<std::vector<TimedText>> toRequest(std::string const& request, Settings const& settings,
                                                            BusLink& bus) = 0;
};

/// An emulated adapter of the ELM327 kind, byte for byte: echo, line ends, prompt,
/// AT commands, bus requests.
class Adapter : public IPeer
{
public:
    /// `vehicle` may be null: nothing is plugged in.
    Adapter(AdapterProfile profile, std::shared_ptr<Vehicle> vehicle, std::shared_ptr<IScript> script = nullptr);
    Adapter(Adapter const&) = delete;
    Adapter& operator=(Adapter const&) = delete;

    void receive(std::string_view bytes) override;
    std::optional<Time> nextOutput() const override;
    std::string advanceTo(Time time) override;
    Time now() const override;
    void connect() override;
    bool linkIsUp() const override;

    AdapterProfile const& profile() const;

    /// What was asked so far.
    RequestLog const& requests() const;

private:
    enum class State : int
    {
        Ready,
        Busy, ///< with the bus; a character interrupts
        Deaf, ///< until a banner or a notice is out
        Monitoring,
        Asleep,
        AwaitingRate ///< for the CR that confirms a new line rate
    };

    static constexpr std::size_t longestLine = 254;

    void receiveOne(char character);
    void settle();
    void stop();
    void execute(std::string const& line);
    void executeCommand(std::string const& command);
    void executeRequest(std::string const& request);
    CommandReply run(std::string const& command);
    bool playScript(std::optional<std::vector<TimedText>> const& texts);
    void answer(CommandReply const& reply);
    void answerReset(CommandReply const& reply);
    void answerBaudRate();
    void confirmRate();
    void answerChip(std::string const& command);
    void finish(Time delay);
    void say(Time delay, std::string const& text);
    void sayRaw(Time delay, std::string const& text);
    bool has(Quirk quirk) const;

    AdapterProfile m_profile;
    std::shared_ptr<IScript> m_script;
    Settings m_settings;
    BusLink m_bus;
    OutputQueue m_output;
    RequestLog m_requests;
    std::string m_line;
    std::string m_last;
    std::string m_heldBack; ///< end of a reply that waits for the next command
    Time m_now{};
    Time m_stateUntil{};
    State m_state = State::Ready;
    bool m_firstCommand = true;
    bool m_promptLost = false; ///< the reply under way ends without its prompt
};

} // namespace obdsim
