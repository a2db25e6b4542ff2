#include "simulator/control/control.h"

#include "simulator/control/controlerror.h"

namespace obdsim {

Control::Control(Vehicle& vehicle, FaultyPeer& wire, RequestLog const& requests)
    : m_vehicle(vehicle), m_wire(wire), m_requests(requests)
{}

std::vector<Control::Command> const& Control::commands()
{
    static std::vector<Command> const all = {
        {{"ignition on|off", "off: no module answers, a CAN bus gives CAN ERROR"}, true, &Control::ignition},
        {{"engine start|stop", "stopped: nothing turns, the battery is alone; started: the drive begins anew"},
         true,
         &Control::engine},
        {{"set CODE [stored|pending|permanent] [MODULE]", "a trouble code more; of the first module, if none is named"},
         true,
         &Control::set},
        {{"clear", "all modules forget their codes, as by service 04"}, true, &Control::clear},
        {{"value MODULE PID BYTES...", "a PID of service 01 keeps these bytes; \"drive\" gives it back"},
         true,
         &Control::value},
        {{"hold NAME NUMBER", "a value of the drive stays; \"free\" lets it go"}, true, &Control::hold},
        {{"voltage NUMBER", "the volts at the socket; \"drive\" gives them back"}, true, &Control::voltage},
        {{"fault FAULT...", "a fault as of --fault, its place counted from here; @next is @1; \"none\" ends all"},
         true,
         &Control::fault},
        {{"loss", "the link to the host breaks"}, true, &Control::loss},
        {{"module MODULE silent|speaks", "a module answers nothing, or again"}, true, &Control::module},
        {{"requests", "what was asked, counted"}, false, &Control::requests},
        {{"help", "these forms"}, false, &Control::help},
    };
    return all;
}

std::vector<ControlForm> Control::forms()
{
    std::vector<ControlForm> all;
    for (auto const& command : commands()) {
        all.push_back(command.form);
    }
    return all;
}

Control::Command const& Control::find(Words const& words)
{
    for (auto const& command : commands()) {
        if (controlWords(command.form.form)[0] == words[0]) {
            checkForm(command.form, words);
            return command;
        }
    }
    failAtWord(words, 0, "a command; help lists them");
}

void Control::check(std::string const& line)
{
    find(controlWords(line));
}

bool Control::changesSomething(std::string const& line)
{
    return !isEmptyControlLine(line) && find(controlWords(line)).changes;
}

std::string Control::follow(std::string const& line, Time now)
{
    if (isEmptyControlLine(line)) {
        return "";
    }
    Words const words = controlWords(line);
    return (this->*find(words).follow)(words, now);
}

} // namespace obdsim
