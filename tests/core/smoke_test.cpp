#include <gtest/gtest.h>

#include "polycurve.h"

TEST(NodeTypeConstants, HaveTheirPublishedValues) {
  EXPECT_EQ(NodeTypes::arc, 0xC0);
  EXPECT_EQ(NodeTypes::Closed::line, 0x48);
  EXPECT_EQ(NodeTypes::Open::symmCurve, 0xA4);
}
