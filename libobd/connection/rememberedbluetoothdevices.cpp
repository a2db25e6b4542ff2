#include "libobd/connection/rememberedbluetoothdevices.h"

#include "libobd/connection/settingskeys.h"

#include <algorithm>
#include <string>
#include <utility>

namespace obd {
namespace {

// No one has paired with more: a size beyond it is a damaged store, which must not keep the reader busy for hours.
constexpr int mostDevices = 10000;

// The list holds no ports: each device is reached on the channel where serial port profiles live.
constexpr int serialPortChannel = 1;

std::string deviceKey(std::size_t position, char const* field)
{
    return "bluetooth/" + std::to_string(position) + "/" + field;
}

} // namespace

RememberedBluetoothDevices::RememberedBluetoothDevices(std::shared_ptr<ISettings> settings)
    : m_settings(std::move(settings))
{}

void RememberedBluetoothDevices::load()
{
    m_devices.clear();
    int const size = std::min(settings::readInt(*m_settings, settings::rememberedSize), mostDevices);
    for (int position = 1; position <= size; ++position) {
        auto const number = static_cast<std::size_t>(position);
        std::string name;
        std::string address;
        if (m_settings->getString(deviceKey(number, "name"), name) &&
            m_settings->getString(deviceKey(number, "address"), address)) {
            m_devices.emplace_back(name, address, serialPortChannel);
        }
    }
}

void RememberedBluetoothDevices::add(BluetoothDescriptor const& device)
{
    auto const known = std::find_if(m_devices.begin(), m_devices.end(), [&device](BluetoothDescriptor const& entry) {
        return entry.address() == device.address();
    });
    if (known != m_devices.end()) {
        if (known->name() == device.name()) {
            return;
        }
        m_devices.erase(known);
    }
    m_devices.push_back(device);
    save();
}

// Positions beyond the new size may keep an older list's devices: the size governs.
void RememberedBluetoothDevices::save()
{
    std::size_t position = 0;
    for (BluetoothDescriptor const& device : m_devices) {
        ++position;
        m_settings->setString(deviceKey(position, "name"), device.name());
        m_settings->setString(deviceKey(position, "address"), device.address());
    }
    m_settings->setInt(settings::rememberedSize.key, static_cast<int>(position));
}

} // namespace obd
