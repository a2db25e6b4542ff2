// Turns the text sources of the trouble code catalogue into one C++ source with a constant table, and tells what the
// sources hold. Exit status: 0 done, 1 a source was refused or a file could not be used, 2 wrong use.

#include "tools/catalogue/report.h"
#include "tools/catalogue/source.h"
#include "tools/catalogue/table.h"
#include "tools/catalogue/tablewriter.h"

#include <fstream>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

namespace {

constexpr std::string_view usage = "usage: catalogue_tool [--counts] [--dump] [--output FILE] SOURCE...\n"
                                   "\n"
                                   "Reads the sources in the order given, lists for all of them first.\n"
                                   "  --counts       print the number of rows by maker and by prefix\n"
                                   "  --dump         print maker, code and text of every row, with tabs between\n"
                                   "  --output FILE  write the table as a C++ source\n";

struct Options
{
    bool counts = false;
    bool dump = false;
    std::string output;
    std::vector<std::string> sources;
};

bool parseOptions(std::vector<std::string> const& arguments, Options& options)
{
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        std::string const& argument = arguments[i];
        if (argument == "--counts") {
            options.counts = true;
        } else if (argument == "--dump") {
            options.dump = true;
        } else if (argument == "--output" && i + 1 < arguments.size()) {
            options.output = arguments[++i];
        } else if (argument.starts_with("--")) {
            return false;
        } else {
            options.sources.push_back(argument);
        }
    }
    return !options.sources.empty();
}

catalogue::Source readSources(std::vector<std::string> const& files)
{
    catalogue::Source source;
    for (std::string const& file : files) {
        std::ifstream input(file, std::ios::binary);
        if (input) {
            catalogue::readSource(input, file, source);
        } else {
            source.problems.push_back(file + ":0: the file cannot be read");
        }
    }
    return source;
}

bool writeOutput(std::string const& file, std::vector<catalogue::Row> const& table)
{
    std::ofstream output(file, std::ios::binary);
    catalogue::writeTable(output, table);
    output.close();
    if (!output) {
        std::cerr << file << ":0: the file cannot be written\n";
        return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv)
{
    Options options;
    if (!parseOptions(std::vector<std::string>(argv + 1, argv + argc), options)) {
        std::cerr << usage;
        return 2;
    }
    catalogue::Source source = readSources(options.sources);
    std::vector<catalogue::Row> const table = catalogue::buildTable(source);
    for (std::string const& problem : source.problems) {
        std::cerr << problem << '\n';
    }
    if (!source.problems.empty()) {
        return 1;
    }
    if (options.counts) {
        catalogue::writeCounts(std::cout, table);
    }
    if (options.dump) {
        catalogue::writeDump(std::cout, table);
    }
    return options.output.empty() || writeOutput(options.output, table) ? 0 : 1;
}
