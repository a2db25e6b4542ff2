#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"

#include <velmora/catalogue.h>
#include <velmora/error.h>
#include <velmora/print.h>

#include <fmt/format.h>

#include <memory>

namespace velmora::cli {

namespace {

struct DtcOptions
{
    std::vector<std::string> codes;
    std::vector<std::string> words;
    std::string maker;
    bool dump = false;
};

ExitCode explainAll(DtcOptions const& options, std::string const& maker, bool json)
{
    std::vector<TroubleCode> found;
    std::vector<std::string> wrong;
    for (std::string const& text : options.codes) {
        try {
            found.push_back(explain(text, maker));
        } catch (Error const&) {
            wrong.push_back("\"" + text + "\"");
        }
    }
    if (json) {
        fmt::print("{}", toJson(found));
    } else {
        for (TroubleCode const& code : found) {
            printText(toText(code));
        }
    }
    if (!wrong.empty()) {
        flushOutput();
        throw Error(ErrorKind::WrongUse,
                    fmt::format("{} {}", fmt::join(wrong, ", "),
                                wrong.size() == 1 ? "is no trouble code" : "are no trouble codes"),
                    {"a trouble code is P, B, C or U, a digit from 0 to 3 and three hexadecimal digits: P0420"});
    }
    return ExitCode::Done;
}

void printJson(std::vector<CatalogueRow> const& rows)
{
    Json list = Json::array();
    for (CatalogueRow const& row : rows) {
        list.push_back({{"maker", row.maker}, {"code", row.code}, {"text", row.text}});
    }
    fmt::print("{}", printed(list));
}

ExitCode listRows(DtcOptions const& options, std::string const& maker, bool json)
{
    std::vector<CatalogueRow> const rows = findRows(options.words, maker);
    if (json) {
        printJson(rows);
    } else if (options.dump) {
        for (CatalogueRow const& row : rows) {
            fmt::print("{}\t{}\t{}\n", row.maker, row.code, row.text);
        }
    } else {
        for (CatalogueRow const& row : rows) {
            printText(toText(TroubleCode{row.code, row.system, {{row.maker, row.text}}, {}}));
        }
    }
    if (rows.empty()) {
        throw Error(ErrorKind::Failed, "The catalogue has no such row",
                    {"search for fewer words, or the beginnings of words; leave out --make for all makers"});
    }
    return ExitCode::Done;
}

ExitCode explainCodes(DtcOptions const& options, GlobalOptions const& global)
{
    bool const listing = options.dump || !options.words.empty();
    if (listing && !options.codes.empty()) {
        throw Error(ErrorKind::WrongUse, "Codes go neither with --dump nor with --search",
                    {"velmora dtc P0420 explains a code; velmora dtc --search catalyst finds codes"});
    }
    if (!listing && options.codes.empty() && options.maker.empty()) {
        throw Error(ErrorKind::WrongUse, "No code is named",
                    {"velmora dtc P0420 explains a code; velmora dtc --search catalyst finds codes"});
    }
    std::string const maker = options.maker.empty() ? std::string() : findMaker(options.maker);
    CatalogueUse const catalogue(global.logFile);
    return options.codes.empty() ? listRows(options, maker, global.json) : explainAll(options, maker, global.json);
}

} // namespace

void addDtcCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<DtcOptions>();
    CLI::App* const command =
        commandLine.addCommand("dtc", "Explain trouble codes; no vehicle needed",
                               [options](GlobalOptions const& global) { return explainCodes(*options, global); });
    command->add_option("CODE", options->codes, "Trouble codes, such as P0420 (exit code 2 if one is none)");
    command->add_option("--search", options->words, "Find rows by the beginnings of words, in any order")
        ->type_name("WORDS");
    command->add_option("--make", options->maker, "Only what this maker means, such as Ford")->type_name("MAKER");
    command->add_flag("--dump", options->dump, "Print maker, code and text of all rows, with tabs between");
}

} // namespace velmora::cli
