// Reports as a history or an import holds them. What was accepted must survive being written and read again, and be
// shown and compared.

#include "libvelmora/history/scanjson.h"
#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/document/vehiclereportjson.h"

#include <velmora/error.h>
#include <velmora/history.h>

#include <cstdlib>
#include <string>

namespace {

using namespace velmora;

void report(std::string const& text)
{
    Json const document = Json::parse(text, nullptr, false);
    if (document.is_discarded()) {
        return;
    }
    VehicleReport const read = parseReport(document);
    std::string const written = read.toJson();
    VehicleReport const again = parseReport(Json::parse(written));
    if (again.toJson() != written) {
        std::abort();
    }
    toJson(changesBetween(read, again));
    toHtml(makeDocument(read, {"date", "port", "1", false, 2026, {InspectionRule::UsEpa, 2005}, {}}));
    toMarkdown(makeDocument(read, {"date", "port", "1", true, 2026, {}, {}}));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    std::string const text(reinterpret_cast<char const*>(data), size);
    try {
        report(text);
    } catch (Error const&) {
        // Refusing is right.
    }
    try {
        parseLine(text);
    } catch (Error const&) {
    }
    return 0;
}
