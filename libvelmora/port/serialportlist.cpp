#include "libvelmora/port/serialportlist.h"

#include <algorithm>
#include <array>
#include <fstream>
#include <string_view>

namespace velmora {

namespace {

constexpr std::array<std::string_view, 3> adapterKinds = {"ttyUSB", "ttyACM", "rfcomm"};

std::string firstLine(std::filesystem::path const& file)
{
    std::ifstream in(file);
    std::string line;
    std::getline(in, line);
    return line;
}

// The product text stands in the folder of the USB device, some levels above that of the line.
std::string usbProduct(std::filesystem::path const& ttyFolder)
{
    std::error_code error;
    std::filesystem::path folder = std::filesystem::canonical(ttyFolder / "device", error);
    for (int level = 0; level < 4 && !error && folder.has_relative_path(); ++level) {
        std::string product = firstLine(folder / "product");
        if (!product.empty()) {
            return product;
        }
        folder = folder.parent_path();
    }
    return {};
}

} // namespace

std::vector<SerialPortEntry> listSerialPorts(std::filesystem::path const& sysRoot, std::filesystem::path const& devRoot)
{
    std::vector<SerialPortEntry> ports;
    std::error_code error;
    for (auto const& entry : std::filesystem::directory_iterator(sysRoot / "class" / "tty", error)) {
        std::string const name = entry.path().filename();
        bool const candidate = std::any_of(adapterKinds.begin(), adapterKinds.end(),
                                           [&name](std::string_view kind) { return name.starts_with(kind); });
        if (candidate) {
            ports.push_back({devRoot / name, usbProduct(entry.path())});
        }
    }
    std::sort(ports.begin(), ports.end(),
              [](SerialPortEntry const& a, SerialPortEntry const& b) { return a.device < b.device; });
    return ports;
}

} // namespace velmora
