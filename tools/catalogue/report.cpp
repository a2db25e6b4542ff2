#include "tools/catalogue/report.h"

#include "tools/catalogue/makers.h"

#include <cstddef>
#include <map>
#include <set>
#include <string>
#include <string_view>

namespace catalogue {

void writeDump(std::ostream& output, std::vector<Row> const& table)
{
    for (Row const& row : table) {
        output << makerName(row.maker) << '\t' << row.code << '\t' << row.text << '\n';
    }
}

void writeCounts(std::ostream& output, std::vector<Row> const& table)
{
    std::vector<std::size_t> makers(makerCount());
    std::map<std::string, std::size_t> genericPrefixes;
    std::map<std::string, std::size_t> makerPrefixes;
    std::set<std::string_view> codes;
    std::set<std::string_view> texts;
    for (Row const& row : table) {
        ++makers[row.maker];
        ++(row.maker == 0 ? genericPrefixes : makerPrefixes)[row.code.substr(0, 2)];
        codes.insert(row.code);
        texts.insert(row.text);
    }
    for (std::size_t maker = 0; maker < makers.size(); ++maker) {
        output << "maker\t" << makerName(maker) << '\t' << makers[maker] << '\n';
    }
    for (auto const& [prefix, count] : genericPrefixes) {
        output << "generic\t" << prefix << '\t' << count << '\n';
    }
    for (auto const& [prefix, count] : makerPrefixes) {
        output << "makers\t" << prefix << '\t' << count << '\n';
    }
    output << "all\trows\t" << table.size() << "\nall\tcodes\t" << codes.size() << "\nall\ttexts\t" << texts.size()
           << '\n';
}

} // namespace catalogue
