// The SFCB registration format as the host reads it: entries with their types and namespaces,
// and malformed files refused with a message.
#include <gtest/gtest.h>

#include "host/Registration.h"

namespace nrv::host {
namespace {

constexpr const char* kTwoEntries = R"(# comment
[TST_Widget]
   provider: TST_Widget_Provider
   location: tst
   type: instance method
   namespace: root/test
[TST_Link]
   provider: TST_Link_Provider
   location: tst
   type: instance association method
   namespace: root/test root/other
)";

TEST(RegistrationTest, EntriesAnswerByClassNamespaceAndType) {
  auto parsed = Registration::parse(kTwoEntries);
  ASSERT_TRUE(std::holds_alternative<Registration>(parsed)) << std::get<std::string>(parsed);
  const Registration& r = std::get<Registration>(parsed);
  ASSERT_EQ(r.entries().size(), 2u);
  EXPECT_TRUE(r.serves("tst_widget", "ROOT/test"));
  EXPECT_FALSE(r.serves("TST_Widget", "root/other"));
  EXPECT_TRUE(r.serves("TST_Link", "root/other"));
  EXPECT_TRUE(r.knowsNamespace("root/other"));
  EXPECT_FALSE(r.knowsNamespace("root/bogus"));
  EXPECT_EQ(r.classesIn("root/test", "association"), std::vector<std::string>{"TST_Link"});
  EXPECT_EQ(r.classesIn("root/test", "instance").size(), 2u);
}

TEST(RegistrationTest, MalformedFilesAreRefused) {
  for (const char* text : {"provider: P\n", "[TST_A\n", "[TST_A]\nno colon\n",
                           "[TST_A]\nprovider: P\nlocation: l\ntype: instance\n",
                           "[TST_A]\ncolour: red\n"}) {
    EXPECT_TRUE(std::holds_alternative<std::string>(Registration::parse(text))) << text;
  }
  EXPECT_TRUE(std::holds_alternative<std::string>(Registration::read("/nonexistent.reg")));
}

}  // namespace
}  // namespace nrv::host
