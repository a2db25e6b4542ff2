#include "libvelmora/signal/importing/signalimport.h"

#include "libvelmora/signal/importing/jsonsource.h"
#include "libvelmora/signal/signalfile.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

bool isObject(std::string_view text)
{
    std::size_t const first = text.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    return first != std::string_view::npos && text[first] == '{';
}

bool hasEquations(nlohmann::json const& document)
{
    return std::any_of(document.begin(), document.end(),
                       [](nlohmann::json const& entry) { return !memberOf(entry, "equation").is_null(); });
}

} // namespace

SignalImport importSignals(std::string_view text, std::string const& path)
{
    if (!isObject(text)) {
        return importSignalCsv(text, path);
    }
    nlohmann::json const document = parseJson(text, path);
    if (document.contains("commands")) {
        return importObdb(text, path);
    }
    if (document.contains("pids")) {
        return importWican(text, path);
    }
    if (hasEquations(document)) {
        return importAbrp(text, path);
    }
    throw Error(ErrorKind::WrongUse, path + " is JSON of a form that is not known",
                {"known are OBDb signal sets, WiCAN vehicle profiles and ABRP requests"});
}

SignalImport importSignalFile(std::string const& path)
{
    return importSignals(readSignalText(path), path);
}

} // namespace velmora
