#include "support/StringFormat.h"

#include <gtest/gtest.h>

TEST(StringWithFormat, FillsPlaceholdersInOrderOrByPosition) {
    EXPECT_EQ(stringWithFormat("Check out my recording of %@ by %@!", {"Racer", "Example Games"}),
              "Check out my recording of Racer by Example Games!");
    EXPECT_EQ(stringWithFormat("%2$@ made %1$@", {"Racer", "Example Games"}),
              "Example Games made Racer");
    EXPECT_EQ(stringWithFormat("100%% %@ %@", {"sure"}), "100% sure ");
    EXPECT_EQ(stringWithFormat("%@ %d %", {"%@"}), "%@ %d %") << "arguments are not formats";
}
