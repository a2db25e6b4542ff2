#include "common/text/text.h"
#include "libvelmora/read/catalogueselection.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/session/libraryuse.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/reporttext.h"

#include <obd/troublecodecatalogue.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
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

// A generic meaning holds for every maker's vehicles.
void keepMaker(std::vector<TroubleCode::Meaning>& meanings, std::string const& maker)
{
    std::erase_if(meanings, [&maker](TroubleCode::Meaning const& meaning) {
        return meaning.maker != maker && meaning.maker != "Generic";
    });
    if (meanings.empty()) {
        meanings.push_back({maker, "Unknown Trouble Code"});
    }
}

ExitCode explain(DtcOptions const& options, std::string const& maker, bool json)
{
    std::vector<TroubleCode> found;
    std::vector<std::string> wrong;
    for (std::string const& text : options.codes) {
        auto const models = obd::TroubleCodeCatalogue::getTroubleCodes(toUpper(text));
        if (models.empty()) {
            wrong.push_back("\"" + text + "\"");
            continue;
        }
        for (TroubleCode& code : groupByCode(models)) {
            if (!maker.empty()) {
                keepMaker(code.meanings, maker);
                code.maker = maker;
            }
            found.push_back(std::move(code));
        }
    }
    if (json) {
        fmt::print("{}", printed(toJsonValue(found)));
    } else {
        for (TroubleCode const& code : found) {
            printText(toText(code, {}, true));
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

void printJson(CatalogueRows const& rows)
{
    Json list = Json::array();
    for (auto const& row : rows) {
        list.push_back({{"maker", row->manufacturer}, {"code", row->code}, {"text", row->description}});
    }
    fmt::print("{}", printed(list));
}

ExitCode listRows(DtcOptions const& options, std::string const& maker, bool json)
{
    CatalogueRows rows = selectWords(obd::TroubleCodeCatalogue::getRows(), options.words);
    if (!maker.empty()) {
        rows = selectMaker(rows, maker);
    }
    if (json) {
        printJson(rows);
    } else if (options.dump) {
        for (auto const& row : rows) {
            fmt::print("{}\t{}\t{}\n", row->manufacturer, row->code, row->description);
        }
    } else {
        for (auto const& row : rows) {
            printText(toText({row->code, row->system, {{row->manufacturer, row->description}}, {}}, {}, true));
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
    LibraryUse const catalogue(global.logFile);
    return options.codes.empty() ? listRows(options, maker, global.json) : explain(options, maker, global.json);
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
