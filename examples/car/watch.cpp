// Shows live values until it has shown so many, over losses of the link: watch PORT COUNT

#include <velmora/car.h>

#include <atomic>
#include <cstdlib>
#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::Car car(count > 1 ? arguments[1] : "auto");
        std::atomic<int> left = count > 2 ? std::atoi(arguments[2]) : 20;
        // Both are called on the car's thread, one at a time.
        auto const onReading = [&left](velmora::Reading const& reading) {
            std::cout << reading << std::endl;
            --left;
            left.notify_one();
        };
        auto const onLink = [](velmora::LinkState state) { std::cout << "The link is " << state << std::endl; };
        auto const watch = car.watch({"RPM@10hz", "SPEED"}, onReading, onLink);
        for (int now = left; now > 0; now = left) {
            left.wait(now);
        }
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
