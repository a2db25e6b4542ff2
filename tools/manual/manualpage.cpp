#include "tools/manual/manualpage.h"

#include <cctype>
#include <chrono>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <stdexcept>

namespace velmora::manual {

namespace {

// A leading dot or quote would be a request, a backslash an escape, a plain hyphen a typographic one.
std::string roff(std::string const& text)
{
    std::string out;
    bool start = true;
    for (char const letter : text) {
        if (start && (letter == '.' || letter == '\'')) {
            out += "\\&";
        }
        if (letter == '\\') {
            out += "\\e";
        } else if (letter == '-') {
            out += "\\-";
        } else {
            out += letter;
        }
        start = letter == '\n';
    }
    return out;
}

std::string bold(std::string const& text)
{
    return "\\fB" + roff(text) + "\\fR";
}

std::string italic(std::string const& text)
{
    return "\\fI" + roff(text) + "\\fR";
}

std::string capitals(std::string text)
{
    for (char& letter : text) {
        letter = static_cast<char>(std::toupper(static_cast<unsigned char>(letter)));
    }
    return text;
}

void writeOption(std::ostream& out, OptionRow const& option)
{
    out << ".TP\n";
    char const* comma = "";
    for (std::string const& name : option.names) {
        out << comma << (option.argument ? italic(name) : bold(name));
        comma = ", ";
    }
    if (!option.argument && !option.value.empty()) {
        out << ' ' << italic(option.value);
    }
    out << (option.many ? " ...\n" : "\n") << (option.help.empty() ? "\\&" : roff(option.help)) << '\n';
    if (!option.variable.empty()) {
        out << ".br\nEnvironment: " << bold(option.variable) << '\n';
    }
}

void writeOptions(std::ostream& out, CommandRow const& command, bool arguments)
{
    bool first = true;
    for (OptionRow const& option : command.options) {
        if (option.argument == arguments) {
            out << (first ? arguments ? ".SH ARGUMENTS\n" : ".SH OPTIONS\n" : "");
            writeOption(out, option);
            first = false;
        }
    }
}

// The commands below a command have no page of their own: their options stand here.
void writeCommands(std::ostream& out, CommandRow const& command, bool withOptions)
{
    if (!command.commands.empty()) {
        out << ".SH COMMANDS\n";
    }
    for (CommandRow const& each : command.commands) {
        out << ".TP\n" << bold(each.name) << '\n' << roff(each.help) << '\n';
        for (OptionRow const& option : each.options) {
            if (withOptions) {
                out << ".RS\n";
                writeOption(out, option);
                out << ".RE\n";
            }
        }
    }
}

void writeSynopsis(std::ostream& out, CommandRow const& command, std::string const& called)
{
    out << ".SH SYNOPSIS\n" << bold(called) << " [" << italic("options") << "]";
    if (!command.commands.empty()) {
        out << ' ' << italic("command") << " ...";
    }
    for (OptionRow const& option : command.options) {
        if (option.argument) {
            out << " [" << italic(option.names.front()) << (option.many ? " ..." : "") << "]";
        }
    }
    out << '\n';
}

void writePage(std::filesystem::path const& folder, CommandRow const& command, CommandRow const* program,
               ManualFacts const& facts)
{
    std::string const title = program != nullptr ? program->name + "-" + command.name : command.name;
    std::string const called = program != nullptr ? program->name + " " + command.name : command.name;
    std::ofstream out(folder / (title + ".1"));
    out << ".TH \"" << roff(capitals(title)) << "\" 1 \"" << facts.date << "\" \"velmora " << facts.version
        << "\" \"User Commands\"\n.SH NAME\n"
        << roff(title) << " \\- " << roff(command.help) << '\n';
    writeSynopsis(out, command, called);
    writeOptions(out, command, true);
    writeOptions(out, command, false);
    if (program != nullptr) {
        out << ".PP\nThe options of\n.BR " << program->name << " (1)\nare understood too.\n";
    }
    writeCommands(out, command, program != nullptr);
    if (!command.footer.empty()) {
        out << ".SH NOTES\n" << roff(command.footer) << '\n';
    }
    if (!facts.seeAlso.empty() || program != nullptr) {
        out << ".SH SEE ALSO\n"
            << (program != nullptr ? ".BR " + program->name + " (1)" + (facts.seeAlso.empty() ? "" : ",") + "\n" : "")
            << facts.seeAlso << (facts.seeAlso.empty() ? "" : "\n");
    }
    if (!out.flush()) {
        throw std::runtime_error("can't write " + (folder / (title + ".1")).string());
    }
}

} // namespace

std::string manualDate()
{
    char const* const told = std::getenv("SOURCE_DATE_EPOCH");
    std::time_t const when =
        told != nullptr ? static_cast<std::time_t>(std::strtoll(told, nullptr, 10)) : std::time(nullptr);
    std::tm parts{};
    gmtime_r(&when, &parts);
    char text[16] = {};
    std::strftime(text, sizeof(text), "%Y-%m-%d", &parts);
    return text;
}

void writeManual(std::filesystem::path const& folder, CommandRow const& program, ManualFacts const& facts)
{
    std::filesystem::create_directories(folder);
    writePage(folder, program, nullptr, facts);
    for (CommandRow const& command : program.commands) {
        writePage(folder, command, &program, facts);
    }
}

} // namespace velmora::manual
