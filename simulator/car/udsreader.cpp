#include "simulator/car/udsreader.h"

#include "simulator/car/codereader.h"
#include "simulator/car/drive.h"

namespace obdsim {

namespace {

SignalField readField(TableReader& table, std::size_t size)
{
    constexpr int mostBytes = 4;
    SignalField field;
    field.bytes = static_cast<std::size_t>(table.integer("bytes", 1, mostBytes, static_cast<int>(field.bytes)));
    field.at = static_cast<std::size_t>(table.integer("at", 0, 0xFFF));
    field.value = table.text("value");
    field.scale = table.number("scale", field.scale);
    field.offset = table.number("offset", field.offset);
    if (field.at + field.bytes > size) {
        table.fail("at", "the field ends behind the data");
    }
    if (!Drive::value(DriveState{}, field.value)) {
        table.fail("value", "the drive has no \"" + field.value + "\"");
    }
    return field;
}

void readSignal(ModuleData& module, TableReader& table)
{
    Bytes const request = table.bytes("request");
    bool const local = request.size() == 2 && (request[0] == 0x21 || request[0] == 0x1A);
    bool const identifier = request.size() == 3 && request[0] == 0x22;
    if (!local && !identifier) {
        table.fail("request", "a signal is asked by 22 and two bytes, or by 21 or 1A and one");
    }
    SignalData signal;
    signal.data = table.has("text") ? Bytes() : table.bytes("data");
    for (char const each : table.text("text", "")) {
        signal.data.push_back(static_cast<std::uint8_t>(each));
    }
    table.tables("fields", [&](TableReader& field) { signal.fields.push_back(readField(field, signal.data.size())); });
    module.signals[request] = std::move(signal);
}

} // namespace

void readUdsOf(ModuleData& module, TableReader& table)
{
    module.uds = table.flag("uds", module.uds);
    table.tables("signals", [&](TableReader& signal) { readSignal(module, signal); });
    table.tables("uds_codes", [&](TableReader& code) {
        std::uint16_t const number = readCode(code, "code", code.text("code"));
        std::uint8_t const type = code.byte("type");
        module.udsCodes.push_back({number, type, code.byte("status")});
    });
    module.hasKwpCodes = table.has("kwp_codes");
    table.tables("kwp_codes", [&](TableReader& code) {
        std::uint16_t const number = readCode(code, "code", code.text("code"));
        module.kwpCodes.push_back({number, code.byte("status")});
    });
    table.table("refusals", [&](TableReader& refusals) {
        refusals.entries([&](Bytes const& request, std::vector<Bytes> const& codes) {
            if (codes.size() != 1 || codes[0].size() != 1) {
                refusals.fail(hexText(request), "a refusal is one response code");
            }
            module.refusals[request] = codes[0][0];
        });
    });
}

} // namespace obdsim
