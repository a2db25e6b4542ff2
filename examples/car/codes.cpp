// Tells the trouble codes, and what was frozen when the first one was set: codes PORT

#include <velmora/car.h>

#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::Car car(count > 1 ? arguments[1] : "auto");
        for (velmora::StoredCode const& code : car.codes()) {
            std::cout << code << '\n';
        }
        for (auto const& module : car.freezeFrame()) {
            std::cout << module << '\n';
        }
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
