#include "libvelmora/doctor/commandmatrix.h"

namespace velmora {

// By the AT command tables of the data sheets from v1.0 to v2.3: the version that brought a command in, a harmless form
// of it (a read, or the setting that the adapter has anyway), and whether STN chips know it. Reads stand first.
std::vector<CommandRow> const& commandRows()
{
    static std::vector<CommandRow> const rows{
        {"1.0", "AT@1", false, true},   {"2.0", "ATAMC", false, false}, {"1.0", "ATBD", false, true},
        {"1.0", "ATCS", false, true},   {"1.0", "ATDP", false, true},   {"1.0", "ATDPN", false, true},
        {"1.0", "ATI", false, true},    {"2.2", "ATIA", false, false},  {"1.4", "ATIGN", false, true},
        {"1.3", "ATKW", false, true},   {"1.1", "ATPPS", false, true},  {"1.4", "ATRD", false, true},
        {"1.0", "ATRV", false, true},   {"1.0", "ATAL", true, true},    {"1.2", "ATAR", true, true},
        {"1.2", "ATAT0", true, true},   {"1.2", "ATAT2", true, true},   {"1.2", "ATAT1", true, true},
        {"1.2", "ATBRT0F", true, true}, {"2.3", "ATC1", true, false},   {"1.0", "ATCAF1", true, true},
        {"1.4", "ATCEA", true, true},   {"1.0", "ATCFC1", true, true},  {"1.0", "ATCP18", true, true},
        {"1.4b", "ATCRA", true, true},  {"1.4b", "ATCSM1", true, true}, {"2.1", "ATCTM1", true, false},
        {"1.3", "ATD0", true, true},    {"1.0", "ATE0", true, true},    {"1.1", "ATFCSM0", true, true},
        {"1.3a", "ATFE", true, true},   {"2.2", "ATFT", true, false},   {"1.0", "ATH1", true, true},
        {"1.0", "ATIB10", true, true},  {"1.2", "ATIFRH", true, true},  {"1.2", "ATIFR1", true, true},
        {"1.2", "ATIIA33", true, true}, {"1.3", "ATJE", true, true},    {"1.4b", "ATJHF1", true, true},
        {"1.4b", "ATJTM1", true, true}, {"1.2", "ATKW1", true, true},   {"1.0", "ATL0", true, true},
        {"1.0", "ATM0", true, true},    {"1.0", "ATNL", true, true},    {"1.0", "ATR1", true, true},
        {"1.3", "ATS0", true, true},    {"1.4", "ATSS", true, true},    {"1.0", "ATST32", true, true},
        {"1.4", "ATTAF1", true, true},  {"1.3", "ATV0", true, true},
    };
    return rows;
}

} // namespace velmora
