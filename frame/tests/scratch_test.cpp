#include "frame/scratch.h"

#include <gtest/gtest.h>

TEST(Scratch, MergeFollowsTheRule) {
    EXPECT_EQ(qx::Merge(0, -20001), -20001);
    EXPECT_EQ(qx::Merge(20004, -20001), -20001);
    EXPECT_EQ(qx::Merge(20004, 20001), 20004);
    EXPECT_EQ(qx::Merge(-20003, -20001), -20003);
    EXPECT_EQ(qx::Merge(0, 20001), 20001);
}
