// The page turns units by a table of its own; it is held against what the library makes of its parameters.

#include "libvelmora/live/livesensors.h"
#include "tests/support/fakeecu.h"

#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>

#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <regex>

namespace {

using Labels = std::map<std::string, std::string>;

// The labels of a table of the script, by what its rows are for.
Labels tableOf(std::string const& script, std::string const& name)
{
    std::size_t const begin = script.find("const " + name + " = {");
    std::string const table = script.substr(begin, script.find("};", begin) - begin);
    Labels labels;
    static std::regex const row(R"(\n  '?([^':]+)'?: \['([^']+)')");
    for (std::sregex_iterator each(table.begin(), table.end(), row), end; each != end; ++each) {
        labels[(*each)[1]] = (*each)[2];
    }
    return labels;
}

velmora::LiveParameter sensorsOf(obd::ParameterIdentifier::Id id)
{
    auto const ecu = std::make_shared<support::FakeEcu>();
    auto const parameter = obd::ParameterFactory().createParameter(id);
    if (parameter == nullptr) {
        return {};
    }
    return velmora::liveSensors({parameter, ecu, obd::UnitSystem::Imperial}, {parameter, ecu, obd::UnitSystem::Metric},
                                ecu->id(), {}, velmora::Units::Imperial);
}

TEST(DashUnits, ThePageShowsTheUnitsOfTheLibrary)
{
    std::ifstream in(VELMORA_SOURCE_DIR "/libvelmora/dash/page/units.js");
    std::string const script{std::istreambuf_iterator<char>(in), {}};
    Labels const units = tableOf(script, "imperial");
    Labels const columns = tableOf(script, "columns");
    std::size_t turned = 0;
    for (int pid = 0; pid <= 0xFF; ++pid) {
        for (velmora::LiveSensor const& sensor : sensorsOf(static_cast<obd::ParameterIdentifier::Id>(pid))) {
            std::string const key = std::regex_replace(sensor.key, std::regex("_[0-9]$"), "");
            bool const column = sensor.metricUnit == "kPa" && columns.contains(key);
            bool const known = column || units.contains(sensor.metricUnit);
            std::string const shown = column  ? columns.at(key)
                                      : known ? units.at(sensor.metricUnit)
                                              : sensor.metricUnit;
            EXPECT_EQ(shown, sensor.unit) << sensor.key;
            turned += shown != sensor.metricUnit ? 1 : 0;
        }
    }
    EXPECT_GT(turned, 30U);
}

} // namespace
