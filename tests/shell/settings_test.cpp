#include <gtest/gtest.h>

#include "shell/settings.h"

TEST(ParseStoredNumber, StopsAtDataLength)
{
    EXPECT_EQ(-1, ParseStoredNumber("-1", 2));
    EXPECT_EQ(12, ParseStoredNumber("123", 2));
}
