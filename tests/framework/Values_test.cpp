// Strings, arrays and datetimes: sharing, copy-on-write and the CIM datetime
// text forms with their refusals.
#include <gtest/gtest.h>

#include <cstdlib>

#include "framework/Instance.h"

using namespace cimple;

namespace {

class UtcZone : public ::testing::Environment {
 public:
  void SetUp() override {
    setenv("TZ", "UTC", 1);
    tzset();
  }
};
const auto* const utc_zone = ::testing::AddGlobalTestEnvironment(new UtcZone);

TEST(String, ZeroHandleIsEmptyAndCopiesShareUntilReassigned) {
  String empty;
  EXPECT_STREQ(empty.c_str(), "");
  EXPECT_EQ(empty.size(), 0u);
  String a("NRV:card");
  String b = a;
  EXPECT_EQ(a.c_str(), b.c_str());
  b.append("/1");
  EXPECT_EQ(a, "NRV:card");
  EXPECT_EQ(b, "NRV:card/1");
  EXPECT_TRUE(String("Chip").equal_nocase("cHIP"));
  EXPECT_FALSE(String("Chip").equal_nocase("Chips"));
}

TEST(Array, CopyOnWriteKeepsCopiesIndependent) {
  Array<uint16> a{2, 3};
  Array<uint16> b = a;
  b.append(5);
  b.set(0, 9);
  ASSERT_EQ(a.size(), 2u);
  EXPECT_EQ(a[0], 2);
  EXPECT_EQ(b[0], 9);
  EXPECT_EQ(b.size(), 3u);
  b.remove(1);
  EXPECT_EQ(b, (Array<uint16>{9, 5}));
}

TEST(Array, StringElementsSurviveGrowthAndSelfAppend) {
  Array<String> names;
  for (int i = 0; i < 100; ++i) names.append(String(std::to_string(i)));
  names.append(names[0]);  // the element lives inside the array being grown
  EXPECT_EQ(names.size(), 101u);
  EXPECT_EQ(names[100], "0");
  EXPECT_EQ(names[99], "99");
}

TEST(Datetime, TimestampTextRoundTrip) {
  Datetime dt;
  ASSERT_TRUE(dt.set("20091231235959.000000+000"));
  EXPECT_TRUE(dt.is_timestamp());
  EXPECT_EQ(dt.utc_offset(), 0);
  EXPECT_EQ(dt.ascii(), "20091231235959.000000+000");
  EXPECT_EQ(dt.ascii(true), "2009/12/31 23:59:59.000000+000");
}

TEST(Datetime, IntervalTextRoundTrip) {
  Datetime dt;
  ASSERT_TRUE(dt.set("00000001020304.000005:000"));
  EXPECT_TRUE(dt.is_interval());
  EXPECT_EQ(dt.usec(), ((((1ull * 24 + 2) * 60 + 3) * 60) + 4) * 1000000ull + 5);
  EXPECT_EQ(dt.ascii(), "00000001020304.000005:000");
  EXPECT_EQ(dt.ascii(true), "00000001 02 03 04.000005:000");
}

TEST(Datetime, OffsetSignFollowsTheStoredOffset) {
  EXPECT_EQ(Datetime::timestamp(0, -300).ascii(), "19700101000000.000000-300");
  EXPECT_EQ(Datetime::timestamp(0, 0).ascii(), "19700101000000.000000+000");
  EXPECT_EQ(Datetime::timestamp(1500000, 60).ascii(), "19700101000001.500000+060");
}

TEST(Datetime, MalformedTextIsRefusedAndLeavesTheValueAlone) {
  Datetime dt = Datetime::interval(42);
  const char* bad[] = {
      "00000001020304.000005:001",   // interval must end in :000
      "0000000102030.000005:000",    // 24 characters
      "000000010203045.000005:000",  // 26 characters
      "2009123123595a.000000+000",   // non-digit
      "20091231235959:000000+000",   // wrong separator at 14
      "20091231235959.000000*000",   // neither + nor - nor :
      "20091331235959.000000+000",   // month 13
      "",
  };
  for (const char* text : bad) {
    EXPECT_FALSE(dt.set(text)) << text;
    EXPECT_EQ(dt, Datetime::interval(42)) << text;
  }
  EXPECT_FALSE(dt.set(nullptr));
}

TEST(Datetime, ZeroHandleIsTheZeroInterval) {
  Datetime zero;
  EXPECT_TRUE(zero.is_interval());
  EXPECT_EQ(zero.ascii(), "00000000000000.000000:000");
}

}  // namespace
