// Asks a simulated adapter, as the test of a program would: sim

#include <obdsim/sim.h>

#include <iostream>

int main()
{
    velmora::sim::Options options;
    options.vehicle = "petrol-can11";
    velmora::sim::Simulator simulator(options);
    simulator.ask("ATE0");
    std::string const speed = simulator.ask("010C");
    simulator.control("ignition off");
    std::string const silence = simulator.ask("010C");
    std::cout << "running: " << speed << "\noff: " << silence << '\n';
    bool const told = speed.find("41 0C") != std::string::npos;
    bool const silent = silence.find("41 0C") == std::string::npos;
    return told && silent && simulator.count("010C") == 2 ? 0 : 1;
}
