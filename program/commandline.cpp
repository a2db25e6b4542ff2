#include "program/commandline.h"

#include "program/helpformatter.h"
#include "program/licencetext.h"
#include "program/selfdescription.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "velmora/version.h"

#include <obd/version.h>
#include <velmora/error.h>
#include <velmora/longwatch.h>
#include <velmora/velmora.h>

#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>
#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <exception>
#include <map>
#include <sstream>
#include <system_error>
#include <utility>

namespace velmora::cli {

namespace {

constexpr char const* exitCodes =
    R"(Exit codes: 0 done; 1 failed otherwise; 2 wrong use; 3 port not opened; 4 adapter silent;
5 vehicle silent; 6 not supported by the vehicle; 7 refused by the vehicle; 8 link lost;
10 findings, with --check; 130 interrupted.)";

void report(Error const& failure)
{
    std::string text = fmt::format("velmora: {}\n", failure.what());
    for (std::string const& hint : failure.hints()) {
        text += fmt::format("  - {}\n", hint);
    }
    tellText(text);
}

// A reader of standard output that has gone, such as head, has read enough and needs no message.
ExitCode judge(std::system_error const& error)
{
    if (std::ferror(stdout) == 0) {
        tell(fmt::format("velmora: {}\n", error.what()));
    } else if (error.code().value() == EPIPE) {
        return ExitCode::Done;
    } else {
        report(outputFailure(error.code().value()));
    }
    return ExitCode::Failed;
}

template <typename Value, typename Parse>
CLI::Option* addParsed(CLI::App& app, std::string const& names, std::optional<Value>& target, Parse parse,
                       std::string const& expected, std::string const& help)
{
    return app.add_option_function<std::string>(
        names,
        [&target, parse, expected](std::string const& text) {
            target = parse(text);
            if (!target) {
                throw CLI::ValidationError("\"" + text + "\" is not understood; expected " + expected);
            }
        },
        help);
}

template <typename Value>
std::optional<Value> parseWord(std::map<std::string, Value> const& words, std::string const& text)
{
    auto const found = words.find(text);
    return found != words.end() ? std::optional(found->second) : std::nullopt;
}

std::optional<Units> parseUnits(std::string const& text)
{
    return parseWord<Units>(
        {{"metric", Units::Metric}, {"imperial", Units::Imperial}, {"imperial-uk", Units::ImperialUk}}, text);
}

std::optional<ColorMode> parseColor(std::string const& text)
{
    return parseWord<ColorMode>({{"auto", ColorMode::Auto}, {"always", ColorMode::Always}, {"never", ColorMode::Never}},
                                text);
}

// The version, and what was not left out of this build.
std::string versionLines()
{
    return fmt::format("velmora {}\nlibobd {}, C ABI {}\noutputs: {}\nparts: {}", versionText, OBD_VERSION,
                       velmora_abi_version(), fmt::join(builtInOutputs(), ", "), VELMORA_PARTS);
}

} // namespace

CommandLine::CommandLine() : m_app("Reads live data, trouble codes and vehicle data from a car.", "velmora")
{
    m_app.formatter(std::make_shared<HelpFormatter>()); // the commands take it over
    m_app.require_subcommand(1);
    m_app.set_version_flag("-V,--version", versionLines());
    m_app
        .add_flag_callback(
            "--licenses", [] { throw CLI::CallForVersion(licenceText, 0); },
            "Print the licence, and those of what is built in")
        ->configurable(false);
    m_app.set_help_flag("-h,--help", "Print this help");
    m_app.set_help_all_flag("--help-all", "Print the help of all commands");
    m_app.footer(exitCodes);
    addGlobalOptions();
}

void CommandLine::addGlobalOptions()
{
    m_app.fallthrough();
    m_app
        .add_option("-p,--port", m_options.port,
                    "Where the adapter is: /dev/ttyUSB0, serial:///dev/ttyUSB0?baud=38400,\n"
                    "HOST:PORT, tcp://HOST:PORT, sim:VEHICLE, replay:FILE, auto (looks for one)")
        ->type_name("PORT")
        ->envname("VELMORA_PORT");
    m_app.add_option("-b,--baud", m_options.baud, "Line rate of a serial port (38400)")
        ->type_name("N")
        ->check(CLI::Range(300, 4000000));
    addParsed(m_app, "-P,--protocol", m_options.protocol, parseProtocol, "auto or a number from 1 to 9",
              "Bus protocol: auto or 1 to 9")
        ->type_name("N");
    addParsed(m_app, "-u,--units", m_options.units, parseUnits, "metric, imperial or imperial-uk",
              "Unit system for this run: metric, imperial (gallons of the US) or imperial-uk")
        ->type_name("SYSTEM");
    m_app
        .add_option_function<std::string>(
            "--ecu",
            [this](std::string const& text) {
                m_options.allEcus = text == "all";
                m_options.module = parseEcuId(text);
                if (!m_options.module && !m_options.allEcus) {
                    throw CLI::ValidationError(
                        "\"" + text +
                        "\" is not understood; expected a control module id in hexadecimal, such as 7E8, or all");
                }
            },
            "Control module, hexadecimal, or all (live: the first; else all)")
        ->type_name("ID");
    m_app.add_flag("--json", m_options.json, "One JSON document on standard output");
    m_app.add_option("--log", m_options.logFile, "Write the library's log there")->type_name("FILE");
    m_app.add_option("--trace", m_options.traceFile, "Write the adapter traffic there, with times")->type_name("FILE");
    m_app
        .add_option("--signals", m_options.signalFiles,
                    "Signals of your own (repeatable); those in the folder signals beside the settings\n"
                    "file are known without it")
        ->type_name("FILE")
        ->expected(1)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll);
    m_app
        .add_option("--settings", m_options.settingsFile,
                    "Settings file (velmora/settings.toml in the user's configuration folder)")
        ->type_name("FILE")
        ->envname("VELMORA_SETTINGS");
    m_app.add_flag("--reset", m_options.reset, "Restore and reset the adapter before use");
    m_app.add_flag("-y,--yes", m_options.yes, "Don't ask before clearing codes or running a routine");
    m_app.add_flag("--sleep", m_options.sleep, "Send the adapter to sleep at the end, which the next visit pays for");
    m_app.add_flag("--forget", m_options.forget, "Forget what earlier visits have learnt of adapters and vehicles");
    m_app.add_flag("-q,--quiet", m_options.quiet, "No progress on standard error");
    m_app.add_flag("-v,--verbose", m_options.verbose, "More progress on standard error");
    addParsed(m_app, "--color", m_options.color, parseColor, "auto, always or never",
              "Colours: auto, always or never (also NO_COLOR)")
        ->type_name("WHEN");
}

CLI::App* CommandLine::addCommand(std::string const& name, std::string const& help, Action action)
{
    CLI::App* command = m_app.add_subcommand(name, help);
    command->callback([this, chosen = std::move(action)] { m_action = chosen; });
    return command;
}

ExitCode CommandLine::run(int argc, char const* const* argv)
{
    try {
        if (auto const described = describeItself(m_app, argc, argv)) {
            return *described;
        }
        m_app.parse(argc, argv);
    } catch (CLI::Success const& wanted) {
        m_action = [&](GlobalOptions const& /*options*/) {
            std::ostringstream out;
            m_app.exit(wanted, out, out);
            writeOutput(out.str()); // longer than the stream's buffer, so that flushing would not see it fail
            return ExitCode::Done;
        };
        return runAction();
    } catch (CLI::ParseError const& error) {
        std::vector<std::string> const unknown = m_app.remaining();
        tellText(fmt::format("velmora: {}\n  - velmora --help lists the options and commands\n",
                             unknown.empty() ? error.what() : "\"" + unknown.front() + "\" is no command or option"));
        return ExitCode::WrongUse;
    } catch (Error const& wrong) {
        report(wrong);
        return exitCode(wrong);
    }
    return runAction();
}

ExitCode CommandLine::runAction()
{
    try {
        ExitCode const code = m_action(m_options);
        flushOutput();
        return code == ExitCode::Done && lateFailure() ? ExitCode::Failed : code;
    } catch (Error const& failure) {
        report(failure);
        return exitCode(failure);
    } catch (std::system_error const& error) {
        return judge(error);
    } catch (std::exception const& error) {
        tell(fmt::format("velmora: {}\n", error.what()));
        return ExitCode::Failed;
    }
}

} // namespace velmora::cli
