// Reads some sensors once: read PORT [SENSOR...], such as read sim:petrol-can11 RPM coolant

#include <velmora/car.h>

#include <algorithm>
#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::Car car(count > 1 ? arguments[1] : "auto");
        for (velmora::Reading const& reading : car.read({arguments + std::min(count, 2), arguments + count})) {
            std::cout << reading << '\n';
        }
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
