#pragma once

#include <obd/connectiondescriptors.h>
#include <obd/isettings.h>

#include <memory>
#include <vector>

namespace obd {

// The list of Bluetooth devices that were used before, under numbered keys of the store. A device is known by its
// address.
class RememberedBluetoothDevices
{
public:
    // Empty until loaded.
    explicit RememberedBluetoothDevices(std::shared_ptr<ISettings> settings);

    void load();

    // Appends the device, in place of one with its address, and writes the list; does nothing if it is in the list as
    // it stands.
    void add(BluetoothDescriptor const& device);

    std::vector<BluetoothDescriptor> const& devices() const { return m_devices; }

private:
    void save();

    std::shared_ptr<ISettings> m_settings;
    std::vector<BluetoothDescriptor> m_devices;
};

} // namespace obd
