#include "libvelmora/output/metricspage.h"

#include "libvelmora/output/metricfamily.h"
#include "libvelmora/output/valuetext.h"

#include <velmora/version.h>

#include <fmt/format.h>

namespace velmora {

namespace {

constexpr std::chrono::seconds staleAfter{60};

std::string familyHead(std::string const& name, std::string const& type, std::string const& help)
{
    return fmt::format("# HELP {0} {2}\n# TYPE {0} {1}\n", name, type, help);
}

std::string single(std::string const& name, std::string const& type, std::string const& help, std::uint64_t value)
{
    return familyHead(name, type, help) + fmt::format("{} {}\n", name, value);
}

// One family over all outputs that have a number for it.
template <typename Number>
std::string overOutputs(Health const& health, std::string const& name, std::string const& type, std::string const& help,
                        Number number)
{
    std::string lines;
    for (auto const& [output, counts] : health.outputs) {
        if (std::optional<std::uint64_t> const value = number(counts)) {
            lines += fmt::format("{}{{output=\"{}\"}} {}\n", name, escapedLabel(output), *value);
        }
    }
    return lines.empty() ? "" : familyHead(name, type, help) + lines;
}

template <typename Member>
std::string overOutputs(Health const& health, std::string const& name, std::string const& type, std::string const& help,
                        Member OutputCounts::*member)
{
    return overOutputs(health, name, type, help, [member](OutputCounts const& counts) {
        return std::optional(static_cast<std::uint64_t>(counts.*member));
    });
}

std::string healthText(Health const& health)
{
    std::string text = familyHead("velmora_build_info", "gauge", "The version of the program.") +
                       fmt::format("velmora_build_info{{version=\"{}\"}} 1\n", versionText);
    text += familyHead("velmora_state_info", "gauge", "What the watch does now.") +
            fmt::format("velmora_state_info{{state=\"{}\"}} 1\n", escapedLabel(health.state));
    text += single("velmora_link_up", "gauge", "Whether adapter and vehicle answer.", health.linkUp ? 1 : 0);
    text += single("velmora_requests_total", "counter", "Requests to control modules.", health.requests);
    text += single("velmora_errors_total", "counter", "Requests without an answer.", health.errors);
    text += single("velmora_link_losses_total", "counter", "How often the link broke.", health.linkLosses);
    text += single("velmora_wake_requests_total", "counter", "Requests to a parked car.", health.wakeRequests);
    text += overOutputs(health, "velmora_output_queue_records", "gauge", "Records that wait.", &OutputCounts::queued);
    text += overOutputs(health, "velmora_output_written_total", "counter", "Records written.", &OutputCounts::written);
    text += overOutputs(health, "velmora_output_dropped_total", "counter",
                        "Records dropped because the output was slow.", &OutputCounts::dropped);
    text += overOutputs(health, "velmora_output_failures_total", "counter", "Failed attempts to write.",
                        &OutputCounts::failures);
    text += overOutputs(health, "velmora_output_failing", "gauge", "Whether the last attempt failed.",
                        &OutputCounts::failing);
    text += overOutputs(health, "velmora_output_up", "gauge", "Whether the output's connection stands.",
                        [](OutputCounts const& counts) { return counts.state.up; });
    text += overOutputs(health, "velmora_output_spool_records", "gauge",
                        "Records that the output holds back itself, on the disk or until the clock is right.",
                        [](OutputCounts const& counts) { return counts.state.waiting; });
    return text;
}

} // namespace

void MetricsPage::take(Reading const& reading, SteadyTime now)
{
    MetricFamily const family = metricFamily(reading.unit);
    Series const series(reading.vehicle, reading.module, reading.sensor);
    std::optional<double> const number = numberOf(reading);
    if (!number) {
        auto const found = m_families.find(family.name);
        if (found != m_families.end()) {
            found->second.samples.erase(series); // an old number would be a wrong one
        }
        return;
    }
    Family& place = m_families[family.name];
    place.help = family.help;
    place.samples[series] = {*number * family.factor + family.offset, now};
}

std::string MetricsPage::render(SteadyTime now, Health const& health) const
{
    std::string text = healthText(health);
    std::string ages;
    for (auto const& [name, family] : m_families) {
        std::string lines;
        for (auto const& [series, sample] : family.samples) {
            auto const& [vehicle, module, sensor] = series;
            auto const age = std::chrono::duration<double>(now - sample.time).count();
            if (now - sample.time > staleAfter) {
                continue;
            }
            std::string const labels = fmt::format("{{vehicle=\"{}\",module=\"{}\",sensor=\"{}\"}}",
                                                   escapedLabel(vehicle), moduleText(module), escapedLabel(sensor));
            lines += name + labels + " " + numberText(sample.value) + "\n";
            ages += "velmora_reading_age_seconds" + labels + " " + numberText(std::max(age, 0.0)) + "\n";
        }
        text += lines.empty() ? "" : familyHead(name, "gauge", family.help) + lines;
    }
    return ages.empty() ? text : text + familyHead("velmora_reading_age_seconds", "gauge", "Age of a reading.") + ages;
}

} // namespace velmora
