// Site files: the sample loads with the shapes the module relies on, and a
// malformed file is refused with a message that names the place at fault.
#include <gtest/gtest.h>

#include <fstream>
#include <cstdlib>
#include <sstream>

#include "sim/SiteLoader.h"

namespace nrvsim {
namespace {

std::string sample_text() {
  std::ifstream in(std::string(NRVSIM_SOURCE_DIR) + "/sim/sites/sample.json");
  std::ostringstream s;
  s << in.rdbuf();
  return s.str();
}

LoadResult load(const std::string& text) { return load_site_text(text, "test.json"); }

// A minimal valid card with one function of `kind`, extra function fields spliced in.
std::string one_function(const std::string& fields) {
  return R"({"cards":[{"model":"M","serial":"S1","ports":[{}],"functions":[{"kind":"nic","mac":"00:90:fa:00:00:01")" +
         fields + "}]}]}";
}

TEST(SiteLoader, SampleHasAConvergedCardAndAFourPortNic) {
  const LoadResult r = load(sample_text());
  ASSERT_TRUE(r.ok) << r.error;
  const Site& site = r.loaded.site;
  ASSERT_EQ(site.cards.size(), 2u);
  int kinds[3] = {0, 0, 0};
  for (const auto& f : site.cards[0].functions) ++kinds[static_cast<int>(f.kind)];
  EXPECT_EQ(kinds[0], 2);  // NIC
  EXPECT_EQ(kinds[1], 2);  // iSCSI
  EXPECT_EQ(kinds[2], 2);  // FCoE
  EXPECT_EQ(site.cards[0].ports.size(), 2u);
  EXPECT_EQ(site.cards[1].functions.size(), 4u);
  for (const auto& f : site.cards[1].functions) EXPECT_EQ(f.kind, Kind::kNic);
}

TEST(SiteLoader, RefusesMalformedJsonWithTheFileName) {
  const LoadResult r = load("{\"cards\": [ {\"model\": ");
  EXPECT_FALSE(r.ok);
  EXPECT_NE(r.error.find("test.json"), std::string::npos);
  EXPECT_NE(r.error.find("parse"), std::string::npos) << r.error;
}

TEST(SiteLoader, RefusesAMissingFieldNamingItsPath) {
  const LoadResult r = load(R"({"cards":[{"model":"M","ports":[{}],"functions":[]}]})");
  EXPECT_FALSE(r.ok);
  EXPECT_NE(r.error.find("$.cards[0].serial: missing"), std::string::npos) << r.error;
}

TEST(SiteLoader, RefusesBadValues) {
  struct Case {
    std::string fields, where;
  };
  const Case cases[] = {
      {R"(,"kind":"token-ring")", "$.cards[0].functions[0].kind"},
      {R"(,"port":3)", "$.cards[0].functions[0].port"},
      {R"(,"identifier":"10:00:00:90:fa:zz:00:01")", "identifier"},
      {R"(,"mtu":"lots")", "mtu"},
      {R"(,"mtu":-1)", "mtu"},
      {R"(,"targets":[])", "only FCoE"},
      {R"(,"hba_attributes":{"seven":1})", "attribute number"},
  };
  for (const Case& c : cases) {
    const std::string text = one_function(c.fields);
    // A later key of the same name replaces the kind; keep the case's own.
    const LoadResult r = load(text);
    EXPECT_FALSE(r.ok) << c.fields;
    EXPECT_NE(r.error.find(c.where), std::string::npos) << c.fields << " -> " << r.error;
  }
}

TEST(SiteLoader, RefusesTwoFunctionsWithOneIdentifier) {
  const LoadResult r = load(
      R"({"cards":[{"model":"M","serial":"S","ports":[{}],"functions":[
        {"kind":"nic","mac":"00:90:fa:00:00:01"},{"kind":"nic","mac":"00:90:fa:00:00:01"}]}]})");
  EXPECT_FALSE(r.ok);
  EXPECT_NE(r.error.find("used twice"), std::string::npos) << r.error;
}

TEST(SiteLoader, MissingFileIsAnErrorNotACrash) {
  const LoadResult r = load_site_file("/nonexistent/site.json");
  EXPECT_FALSE(r.ok);
  EXPECT_NE(r.error.find("cannot open"), std::string::npos);
}

}  // namespace
}  // namespace nrvsim

namespace nrvsim {
namespace {

TEST(SiteLoader, GeneratedSitesLoad) {
  const char* build = std::getenv("NRV_BUILD_DIR");
  const std::string out = std::string(build ? build : ".") + "/sim_generated_site.json";
  const std::string cmd = "/usr/bin/python3 " + std::string(NRVSIM_SOURCE_DIR) +
                          "/tools/gen_site.py --cards 3 --ports 4 --targets 2 --luns 300 -o " + out;
  ASSERT_EQ(std::system(cmd.c_str()), 0);
  const LoadResult r = load_site_file(out);
  ASSERT_TRUE(r.ok) << r.error;
  ASSERT_EQ(r.loaded.site.cards.size(), 3u);
  const Card& card = r.loaded.site.cards[2];
  ASSERT_EQ(card.functions.size(), 12u);
  const Function& fcoe = card.functions[2];
  EXPECT_EQ(fcoe.kind, Kind::kFcoe);
  ASSERT_EQ(fcoe.fc_targets.size(), 2u);
  EXPECT_EQ(fcoe.fc_targets[1].luns.size(), 300u);
  EXPECT_EQ(card.functions[1].iscsi_targets[0].luns.size(), 300u);
}

}  // namespace
}  // namespace nrvsim
