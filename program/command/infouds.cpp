#include "program/command/infouds.h"

#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/moduletopic.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleidentity.h"
#include "program/command/commandsession.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/print.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

using Identifiers = std::map<unsigned int, std::string>;

// None of a module that can't be asked alone.
Identifiers readIdentifiers(CommandSession& session, unsigned int module)
{
    std::optional<std::string> const request = standardRequest(module, session.proxy()->protocol());
    if (!request) {
        return {};
    }
    ModuleAsker asker(*session.proxy(), session.channel());
    FoundModule found{*request, swappedReply(*request).value_or(std::string()), {}, {}, {}, {}};
    ModuleIdentity(asker, [&session] { session.check(); }).readIdentifiers(found);
    return found.identifiers;
}

std::string identifiersText(Identifiers const& identifiers)
{
    std::string text;
    for (auto const& [did, told] : identifiers) {
        text += fmt::format("  {:04X}  {:<58}  {}\n", did, identifierName(did), told);
    }
    return text;
}

Json identifiersJson(Identifiers const& identifiers)
{
    Json json = Json::object();
    for (auto const& [did, told] : identifiers) {
        json[fmt::format("{:04X}", did)] = told;
    }
    return json;
}

} // namespace

ExitCode udsInfo(GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    auto const modules = readModules(session, readInfo);
    Json document = Json::parse(toJson(modules));
    std::string text;
    for (std::size_t i = 0; i < modules.size(); ++i) {
        Identifiers const identifiers = readIdentifiers(session, modules[i].id);
        document[i]["identifiers"] = identifiersJson(identifiers);
        text +=
            (i == 0 ? "" : "\n") + toText(std::vector{modules[i]}, textStyle(options)) + identifiersText(identifiers);
    }
    session.checkAdapter();
    if (options.json) {
        fmt::print("{}", printed(document));
    } else {
        printText(text);
    }
    flushOutput();
    return ExitCode::Done;
}

} // namespace velmora::cli
