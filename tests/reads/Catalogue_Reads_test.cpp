// The indexed reads of the catalogue (get instance by key look-up,
// references and associator names from the reference index, associators
// read in-process) answer exactly what the generic fallbacks answer: every
// class the module registers, over the site the test runs on, each request
// made twice through the real module in the CIMOM stand-in, once with
// NRV_GENERIC_READS set, and the two answers compared in full and in order.
#include <gtest/gtest.h>
#include <stdlib.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/Host.h"
#include "host/PathText.h"

namespace {

using namespace nrv::host;

// One request of the table, made from an end of an association instance
// (`end`, the reference named `role`; `other`/`other_role` the far end).
struct End {
  std::string association;
  PathData end;
  std::string role;
  PathData other;
  std::string other_role;
};

struct Read {
  const char* name;
  std::function<Result(Host&, const End&)> run;
};

AssocFilter only(const End& e) {
  AssocFilter f;
  f.assocClass = e.association;
  return f;
}
AssocFilter filtered(const End& e) {
  AssocFilter f = only(e);
  f.resultClass = e.other.className;
  f.role = e.role;
  f.resultRole = e.other_role;
  return f;
}
AssocFilter by_role(const End& e, const std::string& role) {
  AssocFilter f;
  f.resultClass = e.association;  // references name association classes there
  f.role = role;
  return f;
}
const PropertyList kSomeProperties = std::vector<std::string>{"ElementName", "InstanceID", "Caption"};

const Read kAssociationReads[] = {
    {"ai", [](Host& h, const End& e) { return h.associators(e.end, only(e)); }},
    {"ai filtered", [](Host& h, const End& e) { return h.associators(e.end, filtered(e)); }},
    {"ai property list", [](Host& h, const End& e) { return h.associators(e.end, only(e), kSomeProperties); }},
    {"ai wrong role",
     [](Host& h, const End& e) {
       AssocFilter f = only(e);
       f.role = e.other_role == e.role ? "NoSuchRole" : e.other_role;
       return h.associators(e.end, f);
     }},
    {"ain", [](Host& h, const End& e) { return h.associatorNames(e.end, only(e)); }},
    {"ain filtered", [](Host& h, const End& e) { return h.associatorNames(e.end, filtered(e)); }},
    {"ain result class of the source",
     [](Host& h, const End& e) {
       AssocFilter f = only(e);
       f.resultClass = e.end.className;
       return h.associatorNames(e.end, f);
     }},
    {"ri", [](Host& h, const End& e) { return h.references(e.end, by_role(e, "")); }},
    {"ri role", [](Host& h, const End& e) { return h.references(e.end, by_role(e, e.role)); }},
    {"ri property list", [](Host& h, const End& e) { return h.references(e.end, by_role(e, ""), kSomeProperties); }},
    {"rin", [](Host& h, const End& e) { return h.referenceNames(e.end, by_role(e, "")); }},
    {"rin role", [](Host& h, const End& e) { return h.referenceNames(e.end, by_role(e, e.role)); }},
    {"rin other role", [](Host& h, const End& e) { return h.referenceNames(e.end, by_role(e, e.other_role)); }},
};

const Read kInstanceReads[] = {
    {"gi", [](Host& h, const End& e) { return h.getInstance(e.end); }},
    {"gi property list", [](Host& h, const End& e) { return h.getInstance(e.end, kSomeProperties); }},
};

// Runs `read` with the indexed answers and with the generic ones.
std::pair<Result, Result> both(Host& host, const Read& read, const End& e) {
  unsetenv("NRV_GENERIC_READS");
  Result indexed = read.run(host, e);
  setenv("NRV_GENERIC_READS", "1", 1);
  Result generic = read.run(host, e);
  unsetenv("NRV_GENERIC_READS");
  return {std::move(indexed), std::move(generic)};
}

void expect_same(const Result& indexed, const Result& generic, const std::string& what) {
  EXPECT_EQ(indexed.rc, generic.rc) << what << ": " << indexed.errorText() << " / " << generic.errorText();
  ASSERT_EQ(indexed.paths.size(), generic.paths.size()) << what;
  for (size_t i = 0; i < indexed.paths.size(); ++i)
    EXPECT_EQ(formatPath(indexed.paths[i]), formatPath(generic.paths[i])) << what << " #" << i;
  ASSERT_EQ(indexed.instances.size(), generic.instances.size()) << what;
  for (size_t i = 0; i < indexed.instances.size(); ++i) {
    EXPECT_EQ(formatPath(indexed.instances[i].path), formatPath(generic.instances[i].path)) << what << " #" << i;
    EXPECT_TRUE(indexed.instances[i].properties == generic.instances[i].properties) << what << " #" << i;
  }
}

// The first, a middle and the last instance: the index answers alike
// wherever an instance sits in its map.
std::vector<const InstanceData*> sample(const std::vector<InstanceData>& all) {
  std::vector<const InstanceData*> picked;
  for (size_t i : {size_t{0}, all.size() / 2, all.size() - 1})
    if (i < all.size() && (picked.empty() || picked.back() != &all[i])) picked.push_back(&all[i]);
  return picked;
}

std::vector<std::pair<std::string, PathData>> ends_of(const InstanceData& association) {
  std::vector<std::pair<std::string, PathData>> ends;
  for (const auto& [name, value] : association.properties)
    if (value.type == CMPI_ref && value.path()) ends.emplace_back(name, *value.path());
  return ends;
}

std::string name_space_of(const RegisteredClass& c) {
  for (const std::string& ns : c.namespaces)
    if (ns == "root/norvane") return ns;
  return c.namespaces.empty() ? "root/norvane" : c.namespaces.front();
}

bool has(const RegisteredClass& c, const char* type) {
  for (const std::string& t : c.types)
    if (t == type) return true;
  return false;
}

class CatalogueReads : public ::testing::Test {
 protected:
  static void SetUpTestSuite() {
    const char* platform = getenv("NRV_READS_PLATFORM");
    host_ = std::make_unique<Host>(Host::defaultModulePath(),
                                   Host::Options{platform ? std::optional<std::string>(platform) : std::nullopt});
  }
  static void TearDownTestSuite() { host_.reset(); }
  static std::unique_ptr<Host> host_;
};
std::unique_ptr<Host> CatalogueReads::host_;

TEST_F(CatalogueReads, EveryClassAnswersAsTheGenericFallbacks) {
  Host& host = *host_;
  ASSERT_TRUE(host.moduleLoaded()) << host.loadError();
  ASSERT_NE(host.registration(), nullptr);
  size_t classes = 0, associations = 0, requests = 0, nonempty = 0;
  std::vector<std::pair<const RegisteredClass*, Result>> before;
  for (const RegisteredClass& c : host.registration()->entries()) {
    if (!has(c, "instance")) continue;
    const Result& all =
        before.emplace_back(&c, host.enumerateInstances(name_space_of(c), c.className)).second;
    ASSERT_TRUE(all.ok()) << c.className << ": " << all.errorText();
    ++classes;
    for (const InstanceData* instance : sample(all.instances)) {
      for (const Read& read : kInstanceReads) {
        auto [indexed, generic] = both(host, read, End{c.className, instance->path, "", {}, ""});
        expect_same(indexed, generic, c.className + " " + read.name);
        ++requests;
      }
      if (!has(c, "association")) continue;
      const auto ends = ends_of(*instance);
      for (size_t i = 0; i < ends.size(); ++i) {
        const auto& [other_role, other] = ends[(i + 1) % ends.size()];
        const End e{c.className, ends[i].second, ends[i].first, other, other_role};
        for (const Read& read : kAssociationReads) {
          auto [indexed, generic] = both(host, read, e);
          expect_same(indexed, generic, c.className + " " + read.name + " from " + ends[i].first);
          nonempty += !indexed.instances.empty() || !indexed.paths.empty();
          ++requests;
        }
      }
    }
    associations += has(c, "association") && !all.instances.empty();
  }
  // Reads share the catalogue's instances: none of them changed one.
  for (const auto& [c, all] : before)
    expect_same(host.enumerateInstances(name_space_of(*c), c->className), all, c->className + " after the reads");
  std::printf("compared %zu requests (%zu with results) over %zu classes, %zu associations with instances\n",
              requests, nonempty, classes, associations);
  EXPECT_GT(associations, 50u);
  EXPECT_GT(nonempty, requests / 4);
}

// Not found stays not found: a key value no instance has, in a plain class
// and in a refreshing one.
TEST_F(CatalogueReads, AMissingKeyIsNotFoundBothWays) {
  Host& host = *host_;
  for (const char* name : {"NRVTAVO_Chip", "NRVTAVO_FCPort", "NRVTAVO_Card"}) {
    Result all = host.enumerateInstances("root/norvane", name);
    ASSERT_FALSE(all.instances.empty()) << name;
    PathData missing = all.instances.front().path;
    for (auto& [key, value] : missing.keys)
      if (value.type == CMPI_string) value.text += "-none";
    auto [indexed, generic] = both(host, kInstanceReads[0], End{"", missing, "", {}, ""});
    EXPECT_EQ(indexed.rc, CMPI_RC_ERR_NOT_FOUND) << name;
    expect_same(indexed, generic, name);
  }
}

}  // namespace
