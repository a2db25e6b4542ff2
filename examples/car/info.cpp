// Tells what the control modules say of themselves and the vehicle: info PORT

#include <velmora/car.h>

#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::Car car(count > 1 ? arguments[1] : "auto");
        for (auto const& module : car.info()) {
            std::cout << module << '\n';
        }
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
