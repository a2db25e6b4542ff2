// A car whose options a test chooses, and which several tests of it share.
#pragma once

#include "libvelmora/session/libraryuse.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/car.h>

#include <gtest/gtest.h>

#include <fstream>

namespace velmora::test {

class CarBeyond : public testing::Test
{
protected:
    CarOptions options(std::string const& vehicle = "petrol-can11") const
    {
        CarOptions options;
        options.port = "sim:" + vehicle + "?instant";
        options.settingsFile = m_folder.file("settings.toml");
        options.units = Units::Metric;
        return options;
    }
    // A car of raw replies.
    CarOptions raw(std::string const& modules) const
    {
        std::ofstream(m_folder.file("car.toml")) << "name = \"a car of raw replies\"\nprotocol = 6\n" << modules;
        return options(m_folder.file("car.toml"));
    }

    LibraryUse const m_library{""}; // keeps the catalogue from car to car
    testsupport::TemporaryFolder m_folder;
};

} // namespace velmora::test
