#include "platform/runtime/Implementation.h"

#include <gtest/gtest.h>

#include <string>

using platform::Implementation;

TEST(Implementation, ReplacementsNestAndPutTheRealMakerBack) {
    Implementation<std::string(int)> chosen([](int n) { return "real " + std::to_string(n); });
    EXPECT_EQ(chosen.make(1), "real 1");
    {
        auto outer = chosen.replace([](int n) { return "outer " + std::to_string(n); });
        EXPECT_EQ(chosen.make(2), "outer 2");
        {
            auto inner = chosen.replace([](int n) { return "inner " + std::to_string(n); });
            EXPECT_EQ(chosen.make(3), "inner 3");
            auto moved = std::move(inner); // a moved-from replacement restores nothing
        }
        EXPECT_EQ(chosen.make(4), "outer 4");
    }
    EXPECT_EQ(chosen.make(5), "real 5");
}
