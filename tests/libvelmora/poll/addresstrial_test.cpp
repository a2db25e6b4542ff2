#include "libvelmora/poll/addresstrial.h"

#include <gtest/gtest.h>

namespace {

using std::chrono::milliseconds;
using velmora::AddressTrial;

// Six requests of one way: three by which the channel learns, however long they take, and three that are measured.
void answer(AddressTrial& trial, int first, int second, int third)
{
    for (int const took : {5000, 5000, 5000, first, second, third}) {
        trial.answered(milliseconds(took));
    }
}

bool takesTheModulesAddress(int first, int second, int third)
{
    AddressTrial trial;
    answer(trial, 10, 10, 9);
    EXPECT_TRUE(trial.isAddressed()) << "the other way is tried";
    answer(trial, first, second, third);
    answer(trial, 9999, 9999, 9999); // it is decided
    return trial.isAddressed();
}

TEST(AddressTrial, TakesTheWayThatGainsATenth)
{
    AddressTrial trial;
    EXPECT_FALSE(trial.isAddressed());
    for (int i = 0; i < 5; ++i) {
        trial.answered(milliseconds(1));
    }
    EXPECT_FALSE(trial.isAddressed()) << "five requests tell nothing yet";
    EXPECT_TRUE(takesTheModulesAddress(9, 9, 8));
    EXPECT_FALSE(takesTheModulesAddress(9, 9, 9)) << "27 of 29 ms";
    EXPECT_FALSE(takesTheModulesAddress(10, 10, 9));
}

TEST(AddressTrial, GivesItUpAtTheSecondMissInARow)
{
    AddressTrial trial;
    trial.missed();
    trial.missed();
    trial.missed(); // of broadcasts
    answer(trial, 10, 10, 10);
    trial.missed();
    EXPECT_TRUE(trial.isAddressed());
    trial.answered(milliseconds(1));
    trial.missed();
    EXPECT_TRUE(trial.isAddressed()) << "one in between was answered";
    trial.missed();
    EXPECT_FALSE(trial.isAddressed());
    answer(trial, 1, 1, 1);
    answer(trial, 1, 1, 1);
    EXPECT_FALSE(trial.isAddressed()) << "for good";
}

} // namespace
