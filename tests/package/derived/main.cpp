// Derives from the library's classes, as an application may: derived

#include <obd/obd.h>

#include <cstdio>
#include <vector>

namespace {

using Octets = std::vector<unsigned char>;

// A bridge that counts what comes from the adapter.
struct CountingBridge : obd::DataBridge
{
    std::size_t count = 0;
    void set(Octets const& bytes) override
    {
        count += bytes.size();
        DataBridge::set(bytes);
    }
};

// A reading that an application works out by itself.
struct Twice : obd::SensorValue
{
    using SensorValue::SensorValue;
    std::string textualValue() override { return std::to_string(2 * uid()); }
};

} // namespace

int main()
{
    CountingBridge bridge;
    obd::IDataConnection& connection = bridge;
    connection.setDelimiter('>');
    connection.send({'A', 'T', 'I'});
    static_cast<obd::IDataBridge&>(bridge).set({'O', 'K', '>'});
    Octets sent;
    Octets received;
    bool const moved = bridge.get(sent) && connection.receive(received, 1000);
    std::printf("%zu bytes sent, %zu received\n", sent.size(), received.size());
    bool const worked = Twice(21).textualValue() == "42";
    return moved && worked && sent.size() == 3 && bridge.count == 3 ? 0 : 1;
}
