// The reference index of an association map follows the map: every insert,
// removal, clear and swap leaves referring_to answering what a
// scan of the map with Association_Walk's rules would.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "framework/Association_Walk.h"
#include "framework/Instance_Map.h"
#include "schema/NRVTAVO_Card.h"
#include "schema/NRVTAVO_CardContainsChip.h"
#include "schema/NRVTAVO_Chip.h"

using namespace cimple;

namespace {

template <class C>
C* keyed(const char* class_name, const char* tag) {
  auto* c = C::create();
  c->CreationClassName.set(class_name);
  c->Tag.set(tag);
  return c;
}
NRVTAVO_Card* card(const char* tag) { return keyed<NRVTAVO_Card>("NRVTAVO_Card", tag); }
NRVTAVO_Chip* chip(const char* tag) { return keyed<NRVTAVO_Chip>("NRVTAVO_Chip", tag); }

NRVTAVO_CardContainsChip* link(const char* k, const char* c) {
  auto* l = NRVTAVO_CardContainsChip::create();
  l->GroupComponent = card(k);
  l->PartComponent = chip(c);
  return l;
}

// What a scan of the whole map answers.
std::vector<size_t> scanned(const Instance_Map& map, const Instance* source, const char* role) {
  std::vector<size_t> positions;
  for (size_t i = 0; i < map.size(); ++i)
    if (references_source(map[i], source, role)) positions.push_back(i);
  return positions;
}

class ReferenceIndex : public ::testing::Test {
 protected:
  void SetUp() override {
    for (auto [k, c] : {std::pair{"k1", "c1"}, {"k1", "c2"}, {"k2", "c3"}, {"k2", "c1"}}) map.insert(link(k, c));
    sources = {card("k1"), card("k2"), card("k9"), chip("c1"), chip("c3"), chip("k1")};
  }
  void TearDown() override {
    for (Instance* s : sources) unref(s);
  }
  // Every source, with and without a role, as the scan answers.
  void expect_as_scanned(const std::string& step) {
    for (const Instance* s : sources)
      for (const char* role : {"", "GroupComponent", "partcomponent", "NoSuchRole"})
        EXPECT_EQ(map.referring_to(s, role), scanned(map, s, role)) << step << " role " << role;
  }
  Instance_Map map{&NRVTAVO_CardContainsChip::static_meta_class};
  std::vector<Instance*> sources;
};

TEST_F(ReferenceIndex, FollowsEveryChangeOfItsMap) {
  expect_as_scanned("built");
  EXPECT_EQ(map.referring_to(sources[3], nullptr), (std::vector<size_t>{0, 3}));  // chip c1
  EXPECT_TRUE(map.referring_to(sources[5], nullptr).empty());  // a chip keyed like card k1 is not the card

  map.remove(0);
  expect_as_scanned("after a removal");

  Instance_Map other{&NRVTAVO_CardContainsChip::static_meta_class};
  other.insert(link("k9", "c3"));
  map.swap(other);
  expect_as_scanned("after a swap");
  EXPECT_EQ(map.referring_to(sources[2], nullptr), (std::vector<size_t>{0}));

  map.clear();
  expect_as_scanned("after a clear");
  map.insert(link("k1", "c3"));
  expect_as_scanned("refilled");
}

TEST(ReferenceIndexOfPlainMaps, IsNone) {
  Instance_Map chips{&NRVTAVO_Chip::static_meta_class};
  chips.insert(chip("c1"));
  NRVTAVO_Chip* c1 = chip("c1");
  EXPECT_TRUE(chips.referring_to(c1, nullptr).empty());
  unref(c1);
}

}  // namespace
