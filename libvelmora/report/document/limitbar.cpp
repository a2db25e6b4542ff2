#include "libvelmora/report/document/limitbar.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

// The part of the bar, 0 to 1, at which a number stands: the limits are at a fifth and four fifths, so that what lies
// outside is seen outside. With one limit the bar begins or ends at 0.
struct BarScale
{
    double low;
    double high;

    explicit BarScale(LimitBar const& bar)
    {
        double const min = bar.min.value_or(std::min(0.0, bar.max.value_or(0.0)));
        double const max = bar.max.value_or(std::max(0.0, bar.min.value_or(0.0)));
        double const span = max > min ? max - min : 1.0;
        low = min - (bar.min ? span / 3.0 : 0.0);
        high = max + (bar.max ? span / 3.0 : span);
    }

    double place(double number) const { return std::clamp((number - low) / (high - low), 0.0, 1.0) * 100.0; }
};

} // namespace

std::string drawnBar(LimitBar const& bar)
{
    if (!bar.min && !bar.max) {
        return {};
    }
    BarScale const scale(bar);
    double const from = bar.min ? scale.place(*bar.min) : 0.0;
    double const to = bar.max ? scale.place(*bar.max) : 100.0;
    bool const inside = (!bar.min || bar.value >= *bar.min) && (!bar.max || bar.value <= *bar.max);
    return fmt::format("<svg class=\"bar\" viewBox=\"0 0 100 12\" width=\"100\" height=\"12\" aria-hidden=\"true\" "
                       "focusable=\"false\">"
                       "<rect x=\"0.5\" y=\"4\" width=\"99\" height=\"4\" rx=\"2\" class=\"track\"/>"
                       "<rect x=\"{:.1f}\" y=\"4\" width=\"{:.1f}\" height=\"4\" class=\"range\"/>"
                       "<rect x=\"{:.1f}\" y=\"0\" width=\"3\" height=\"12\" rx=\"1\" class=\"{}\"/></svg>",
                       from, std::max(to - from, 0.5), std::clamp(scale.place(bar.value) - 1.5, 0.0, 97.0),
                       inside ? "needle" : "needle out");
}

} // namespace velmora
