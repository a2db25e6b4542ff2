// Prints all that a car tells as one JSON document: json PORT

#include <velmora/car.h>

#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::Car car(count > 1 ? arguments[1] : "auto");
        std::cout << car.report().toJson();
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
