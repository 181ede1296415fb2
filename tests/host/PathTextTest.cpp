// Object path and value text: what nrv-cim reads and prints must round-trip, and malformed
// text must be refused with a message rather than guessed at.
#include <gtest/gtest.h>

#include "host/PathText.h"

namespace nrv::host {
namespace {

// The keys a small class repository declares: an association of two widgets, a widget.
std::optional<std::vector<KeyDecl>> testKeys(const std::string& className) {
  if (className == "Assoc") return std::vector<KeyDecl>{{"Left", CMPI_ref, "W"}, {"Right", CMPI_ref, "W"}};
  if (className == "W") return std::vector<KeyDecl>{{"Id", CMPI_string, ""}, {"Slot", CMPI_uint16, ""}};
  return std::nullopt;
}

PathData mustParse(const std::string& text, const KeySchema& schema = {}) {
  auto r = parsePath(text, kDefaultNameSpace, schema);
  EXPECT_TRUE(std::holds_alternative<PathData>(r)) << text;
  return std::holds_alternative<PathData>(r) ? std::get<PathData>(r) : PathData{};
}

std::string refusal(const std::string& text, const KeySchema& schema = {}) {
  auto r = parsePath(text, kDefaultNameSpace, schema);
  return std::holds_alternative<TextError>(r) ? std::get<TextError>(r).message : "";
}

TEST(PathTextTest, FullPathWithTypedKeys) {
  PathData p = mustParse("root/test:TST_Port.Name=\"p \\\"1\\\"\",Index=3,Up=true,Neg=-4");
  EXPECT_EQ(p.nameSpace, "root/test");
  EXPECT_EQ(p.className, "TST_Port");
  ASSERT_EQ(p.keys.size(), 4u);
  EXPECT_EQ(p.keys[0].second.text, "p \"1\"");
  EXPECT_EQ(p.keys[1].second.type, CMPI_sint64);
  EXPECT_EQ(p.keys[1].second.asInteger(), 3);
  EXPECT_EQ(p.keys[2].second.type, CMPI_boolean);
  EXPECT_EQ(p.keys[3].second.asInteger(), -4);
}

TEST(PathTextTest, RoundTripsThroughPrinting) {
  for (const std::string text :
       {"root/norvane:NRVTAVO_Chip", "root/norvane:NRVTAVO_Chip.InstanceID=\"NRV:1\"",
        "root/a:C.K1=\"a,b\",K2=18446744073709551615,K3=false,K4=1.5",
        "root/a:Assoc.Left=\"root/a:W.Id=\\\"x\\\"\",Right=\"root/a:W.Slot=2\""}) {
    PathData p = mustParse(text, testKeys);
    EXPECT_EQ(formatPath(p), text);
    EXPECT_EQ(mustParse(formatPath(p), testKeys), p);
  }
}

// DSP0207: an untyped quoted value is a reference only where the class declares a reference.
TEST(PathTextTest, KeysTakeTheTypesTheClassDeclares) {
  const std::string left = "Left=\"root/a:W.Id=\\\"x\\\"\"";
  PathData p = mustParse("root/a:Assoc." + left, testKeys);
  ASSERT_EQ(p.keys[0].second.type, CMPI_ref);
  EXPECT_EQ(p.keys[0].second.path()->className, "W");
  EXPECT_EQ(p.keys[0].second.path()->keys[0].second.text, "x");
  EXPECT_EQ(mustParse("root/a:W.Slot=7", testKeys).keys[0].second.type, CMPI_uint16);
  EXPECT_EQ(mustParse("K.Note=\"a.b=1\"").keys[0].second.type, CMPI_string);
  EXPECT_EQ(mustParse("root/a:Other." + left).keys[0].second.type, CMPI_string);
  PathData typed = mustParse("root/a:Other.Left=(reference)\"root/a:W.Id=\\\"x\\\"\",N=(uint8)3");
  EXPECT_EQ(typed.keys[0].second.type, CMPI_ref);
  EXPECT_EQ(typed.keys[1].second.type, CMPI_uint8);

  EXPECT_NE(refusal("W.Id=\"x\",Color=\"red\"", testKeys).find("no key Color"), std::string::npos);
  EXPECT_NE(refusal("W.Slot=70000", testKeys), "");
  EXPECT_NE(refusal("W.Slot=(string)\"7\"", testKeys), "");
  EXPECT_NE(refusal("Assoc.Left=\"not a path\"", testKeys), "");
  EXPECT_NE(refusal("K.A=(banana)1"), "");
  EXPECT_NE(refusal("K.A=(uint8"), "");
}

TEST(PathTextTest, MalformedPathsAreRefused) {
  EXPECT_NE(refusal(""), "");
  EXPECT_NE(refusal("root/x:"), "");
  EXPECT_NE(refusal(":Class"), "");
  EXPECT_NE(refusal("root//x:Class"), "");
  EXPECT_NE(refusal("9Class"), "");
  EXPECT_NE(refusal("Class."), "");
  EXPECT_NE(refusal("Class.Key"), "");
  EXPECT_NE(refusal("Class.Key="), "");
  EXPECT_NE(refusal("Class.Key=\"open"), "");
  EXPECT_NE(refusal("Class.Key=\"v\"tail"), "");
  EXPECT_NE(refusal("Class.Key=bare"), "");
  EXPECT_NE(refusal("Class.K=1,K=2"), "");
  EXPECT_NE(refusal("Class.K=1,"), "");
  EXPECT_NE(refusal("Cl ass"), "");
  EXPECT_NE(refusal("Class.=1"), "");
}

TEST(PathTextTest, ValuePrinting) {
  EXPECT_EQ(formatValue(Datum::null(CMPI_string)), "NULL");
  EXPECT_EQ(formatValue(Datum::string("a\"b\\c")), "\"a\\\"b\\\\c\"");
  EXPECT_EQ(formatValue(Datum::boolean(false)), "false");
  EXPECT_EQ(formatValue(Datum::unsignedInt(CMPI_uint64, 18446744073709551615ULL)),
            "18446744073709551615");
  EXPECT_EQ(formatValue(Datum::signedInt(CMPI_sint8, -3)), "-3");
  EXPECT_EQ(formatValue(Datum::real(CMPI_real64, 0.25)), "0.25");
}

}  // namespace
}  // namespace nrv::host
