#pragma once

#include "libobd/catalogue/dtctable.h"

#include <obd/dtcdatamodel.h>
#include <obd/manufacturer.h>

#include <cstddef>
#include <functional>
#include <map>
#include <memory>
#include <shared_mutex>
#include <string>
#include <vector>

namespace obd {

// The trouble code catalogue: what a code means, for every maker that the table knows. All instances are handles on one
// process-wide table, safe from any thread; while that is empty, lookups give the defaults. Codes compare exactly, case
// included.
class DtcReader
{
public:
    // Gives the row of an index.
    using RowSource = std::function<DtcRow(std::size_t)>;

    // Loads the built-in table, behind what is loaded already. False if it has no rows.
    static bool init();
    // The same for any table of `count` rows.
    static bool load(std::size_t count, RowSource const& row);
    // Empties the catalogue. Models that were handed out live on.
    static void clean();

    // The generic meaning, "ISO/SAE Reserved" if there is none. Never null.
    std::shared_ptr<DtcDataModel> getGenericCode(std::string const& code) const;

    // All meanings, the generic one first, then the makers' in the order of their numbers; a code that stands twice
    // under one maker comes twice. An unknown code gives one model that says so. Throws std::out_of_range for an
    // unknown code of less than two characters.
    std::vector<std::shared_ptr<DtcDataModel>> getTroubleCodes(std::string const& code) const;

    // Every code once, sorted as text, with its first meaning.
    std::vector<std::shared_ptr<DtcDataModel>> getTroubleCodes() const;

    // Every row in the order of the table, which has the makers in the order of their numbers.
    std::vector<std::shared_ptr<DtcDataModel>> getRows() const;

    // By the first letter: "Powertrain", "Body", "Chassis", "Network", else "Undefined".
    std::string getSystem(std::string const& code) const;

private:
    struct comparer
    {
        bool operator()(Manufacturer::AutoManufacturer left, Manufacturer::AutoManufacturer right) const
        {
            return static_cast<int>(left) < static_cast<int>(right);
        }
    };

    static std::string system(std::string const& code);
    static std::shared_ptr<DtcDataModel> defaultModel(std::string const& code);
    static std::string getDefaultManufacturer(std::string const& code);

    static std::shared_mutex m_mutex;
    // Protected by m_mutex. Rows of one maker stay in the order of the table.
    static std::multimap<Manufacturer::AutoManufacturer, std::shared_ptr<DtcDataModel>, comparer> m_data;
};

} // namespace obd
