#include "tools/catalogue/table.h"

#include "tools/catalogue/makers.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace catalogue {

namespace {

class TableBuilder
{
public:
    explicit TableBuilder(Source& source) : m_source(source), m_table(source.rows) {}

    std::vector<Row> build()
    {
        for (Twin const& twin : m_source.twins) {
            copyTwin(twin);
        }
        auto const key = [](Row const& row) { return std::tie(row.maker, row.code); };
        std::stable_sort(m_table.begin(), m_table.end(),
                         [key](Row const& left, Row const& right) { return key(left) < key(right); });
        checkRepeats();
        if (m_table.empty()) {
            m_source.problems.emplace_back("the sources hold no row");
        }
        return std::move(m_table);
    }

private:
    void copyTwin(Twin const& twin);
    void checkExceptions(Twin const& twin);
    void checkRepeats();
    bool isTwin(std::size_t maker) const;
    void report(Place const& place, std::string const& message);

    Source& m_source;
    std::vector<Row> m_table;
};

void TableBuilder::copyTwin(Twin const& twin)
{
    std::string const name(makerName(twin.original));
    if (isTwin(twin.original)) {
        report(twin.place, "'" + name + "' is itself the same as another maker: name that one");
        return;
    }
    checkExceptions(twin);
    bool any = false;
    for (Row const& row : m_source.rows) {
        if (row.maker != twin.original) {
            continue;
        }
        any = true;
        if (std::find(twin.exceptions.begin(), twin.exceptions.end(), row.code) == twin.exceptions.end()) {
            m_table.push_back(row);
            m_table.back().maker = twin.maker;
        }
    }
    if (!any) {
        report(twin.place, "there are no rows of '" + name + "' to take over");
    }
}

void TableBuilder::checkExceptions(Twin const& twin)
{
    for (std::string const& code : twin.exceptions) {
        auto const matches = [&](Row const& row) { return row.maker == twin.original && row.code == code; };
        if (std::none_of(m_source.rows.begin(), m_source.rows.end(), matches)) {
            report(twin.place, "'" + std::string(makerName(twin.original)) + "' has no code " + code + " to leave out");
        }
    }
}

// A second row of one maker and code is nearly always a slip, so it has to be asked for.
void TableBuilder::checkRepeats()
{
    Row const* previous = nullptr;
    for (Row const& row : m_table) {
        bool const again = previous != nullptr && previous->maker == row.maker && previous->code == row.code;
        if (again && !row.repeat) {
            report(row.place, row.code + " of '" + std::string(makerName(row.maker)) + "' stands already at " +
                                  toString(previous->place) + "; write 'repeat' before it if both are wanted");
        }
        if (!again && row.repeat) {
            report(row.place, row.code + " is marked as a repeat, but no row of that code stands before it");
        }
        previous = &row;
    }
}

bool TableBuilder::isTwin(std::size_t maker) const
{
    return std::any_of(m_source.twins.begin(), m_source.twins.end(),
                       [maker](Twin const& twin) { return twin.maker == maker; });
}

void TableBuilder::report(Place const& place, std::string const& message)
{
    m_source.problems.push_back(toString(place) + ": " + message);
}

} // namespace

std::vector<Row> buildTable(Source& source)
{
    return TableBuilder(source).build();
}

} // namespace catalogue
