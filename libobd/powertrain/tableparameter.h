#pragma once

#include "libobd/powertrain/ecustore.h"
#include "libobd/powertrain/parameterrow.h"

#include <obd/powertrainparameter.h>

#include <array>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace obd {

// A parameter that a row of a table tells. Decoding needs the row alone; classes that know better than their row
// override single steps. Values may be read while another thread updates.
class TableParameter : public PowertrainParameter
{
public:
    // row must outlive the parameter.
    TableParameter(ParameterRow const& row, ObdMode mode, unsigned char frame);

    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) override;
    void clear() override;

    // The number of the sensor at index in a unit system, not rounded; 0.0 if the module delivered none.
    double value(IEcu const& ecu, UnitSystem system, std::size_t index = 0) const;

    // The number as it was decoded, in the metric unit; nothing if the module delivered none.
    std::optional<double> stored(IEcu const& ecu, std::size_t index = 0) const;

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

    ParameterRow const& row() const { return m_row; }

private:
    using Reading = std::array<std::optional<double>, ParameterRow::maxSensors>;

    int uid(std::size_t index) const;
    std::shared_ptr<SensorInfo const> info(std::size_t index, double maximum) const;

    ParameterRow const& m_row;
    std::size_t m_count;
    std::vector<std::shared_ptr<SensorInfo const>> m_infos; // null where the range depends on the module
    EcuStore<Reading> m_readings;
};

// The class of one PID: a base that is built from a row, with the PID's row of a table.
template <typename Base, auto const& rows, int id>
class RowParameter : public Base
{
public:
    static constexpr std::size_t bytes = rows[rowIndex(rows, id)].bytes;

    RowParameter(ObdMode mode, unsigned char frame) : Base(rows[rowIndex(rows, id)], mode, frame) {}
};

// The class of a PID's row, which is made of the row alone. A table whose rows need more, or a row with a class of its
// own, specialises it beside that class.
template <auto const& rows, int id>
struct ParameterClass
{
    using Type = RowParameter<TableParameter, rows, id>;
};

} // namespace obd
