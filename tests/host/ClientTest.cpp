// nrv-cim end to end: the binary is spawned against the test provider module and its output,
// error lines and exit codes are checked for every operation.
#include <gtest/gtest.h>

#include <algorithm>

#include "HostTestSupport.h"

namespace nrv::host {
namespace {

using test::runClient;

std::vector<std::string> env() {
  return {"NRV_MODULE=" + test::testProvider(), "NRV_HOST_PLATFORM=" + test::platformFile()};
}

test::ProcessResult cim(std::vector<std::string> args) { return runClient(args, env()); }

TEST(ClientTest, EnumerateInstancesPrintsMof) {
  auto r = cim({"ei", "root/test:TST_Gadget"});
  ASSERT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out,
            "instance of TST_Gadget {\n    Tag = \"G1\";\n    Weight = -7;\n};\n"
            "instance of TST_Gadget {\n    Tag = \"G2\";\n    Weight = -7;\n};\n");
  EXPECT_EQ(r.err, "");
}

TEST(ClientTest, PropertyListOption) {
  auto r = cim({"ei", "-p", "Name", "root/test:TST_Widget"});
  ASSERT_EQ(r.status, 0) << r.err;
  EXPECT_NE(r.out.find("    Name = \"first\";\n"), std::string::npos);
  EXPECT_EQ(r.out.find("Count"), std::string::npos);
}

TEST(ClientTest, NamesOnePerLineAndGetByPrintedPath) {
  auto names = cim({"ein", "root/test:TST_Widget"});
  ASSERT_EQ(names.status, 0) << names.err;
  const std::string first = names.out.substr(0, names.out.find('\n'));
  EXPECT_EQ(first, "root/test:TST_Widget.InstanceID=\"W1\"");
  auto got = cim({"gi", first});
  ASSERT_EQ(got.status, 0) << got.err;
  EXPECT_EQ(got.out.rfind("instance of TST_Widget {\n", 0), 0u);
  EXPECT_NE(got.out.find("    Tags = {\"red\", \"W1\"};\n"), std::string::npos);
  EXPECT_NE(got.out.find("    Nothing = NULL;\n"), std::string::npos);
}

TEST(ClientTest, FailedCallExitsOneWithCodeName) {
  auto r = cim({"gi", "root/test:TST_Widget.InstanceID=\"W404\""});
  EXPECT_EQ(r.status, 1);
  EXPECT_EQ(r.err, "CMPI_RC_ERR_NOT_FOUND : no such widget\n");
  EXPECT_EQ(r.out, "");
  auto unknown = cim({"ei", "root/test:TST_Unknown"});
  EXPECT_EQ(unknown.status, 1);
  EXPECT_EQ(unknown.err.rfind("CMPI_RC_ERR_INVALID_CLASS : ", 0), 0u);
}

TEST(ClientTest, MalformedInputExitsTwoWithOneLine) {
  for (const std::vector<std::string>& args :
       {std::vector<std::string>{"gi", "root/test:TST_Widget.InstanceID=\"open"},
        std::vector<std::string>{"ei"},
        std::vector<std::string>{"zz", "TST_Widget"},
        std::vector<std::string>{"ei", "-q", "TST_Widget"},
        std::vector<std::string>{"ei", "TST_Widget", "-p"},
        std::vector<std::string>{"mi", "root/test:TST_Widget.InstanceID=\"W1\"", "Count"},
        std::vector<std::string>{"cm", "root/test:TST_Widget.InstanceID=\"W1\""},
        std::vector<std::string>{"cm", "root/test:TST_Widget.InstanceID=\"W1\"", "Add",
                                 "Amount:uint8=300"},
        std::vector<std::string>{"ci", "root/test:TST_Widget", "Bad Name=1"}}) {
    auto r = cim(args);
    EXPECT_EQ(r.status, 2) << args[0];
    EXPECT_EQ(r.err.rfind("nrv-cim: ", 0), 0u) << r.err;
    EXPECT_EQ(std::count(r.err.begin(), r.err.end(), '\n'), 1) << r.err;
  }
}

TEST(ClientTest, CreateModifyDelete) {
  auto created = cim({"ci", "root/test:TST_Widget", "InstanceID=\"WX\"", "Name=\"made\"",
                      "Count:uint16=4"});
  ASSERT_EQ(created.status, 0) << created.err;
  EXPECT_EQ(created.out, "root/test:TST_Widget.InstanceID=\"WX\"\n");
  // Each nrv-cim run loads the module afresh, so the widget lives only within that run;
  // modify and delete act on the module's own widgets.
  auto modified = cim({"mi", "root/test:TST_Widget.InstanceID=\"W1\"", "Count=12"});
  EXPECT_EQ(modified.status, 0) << modified.err;
  EXPECT_EQ(modified.out, "");
  auto deleted = cim({"di", "root/test:TST_Widget.InstanceID=\"W3\""});
  EXPECT_EQ(deleted.status, 0) << deleted.err;
  auto missing = cim({"di", "root/test:TST_Widget.InstanceID=\"W404\""});
  EXPECT_EQ(missing.status, 1);
  EXPECT_EQ(missing.err, "CMPI_RC_ERR_NOT_FOUND\n");
}

TEST(ClientTest, CallMethodWithArguments) {
  auto r = cim({"cm", "root/test:TST_Widget.InstanceID=\"W2\"", "Add", "Amount=3"});
  ASSERT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out, "ReturnValue = 5;\nNewCount = 5;\n");
  auto echo = cim({"cm", "root/test:TST_Widget.InstanceID=\"W2\"", "Echo", "Text=\"a b\""});
  EXPECT_EQ(echo.out, "ReturnValue = 0;\nEchoed = \"a b\";\n");
  auto compact = cim({"cm", "root/test:TST_Widget.InstanceID=\"W2\"", "Echo.Text=\"x,y\""});
  EXPECT_EQ(compact.out, "ReturnValue = 0;\nEchoed = \"x,y\";\n");
  auto bogus = cim({"cm", "root/test:TST_Widget.InstanceID=\"W2\"", "Bogus"});
  EXPECT_EQ(bogus.status, 1);
  EXPECT_EQ(bogus.err, "CMPI_RC_ERR_METHOD_NOT_FOUND : Bogus\n");
}

TEST(ClientTest, AssociationOperationsAndFilters) {
  const std::string w1 = "root/test:TST_Widget.InstanceID=\"W1\"";
  auto ain = cim({"ain", w1});
  ASSERT_EQ(ain.status, 0) << ain.err;
  EXPECT_EQ(ain.out, "root/test:TST_Gadget.Tag=\"G1\"\n");
  auto ai = cim({"ai", w1, "-rc", "TST_Gadget"});
  EXPECT_EQ(ai.out, "instance of TST_Gadget {\n    Tag = \"G1\";\n    Weight = -7;\n};\n");
  EXPECT_EQ(cim({"ain", w1, "--result-class", "TST_Widget"}).out, "");
  EXPECT_EQ(cim({"ain", w1, "-r", "Gadget"}).out, "");
  EXPECT_EQ(cim({"ain", w1, "-ac", "TST_WidgetGadget", "-rr", "Gadget"}).out, ain.out);
  auto rin = cim({"rin", w1});
  EXPECT_EQ(rin.out,
            "root/test:TST_WidgetGadget.Widget=\"root/test:TST_Widget.InstanceID=\\\"W1\\\"\","
            "Gadget=\"root/test:TST_Gadget.Tag=\\\"G1\\\"\"\n");
  auto ri = cim({"ri", w1});
  EXPECT_NE(ri.out.find("    Gadget = \"root/test:TST_Gadget.Tag=\\\"G1\\\"\";\n"),
            std::string::npos);
}

TEST(ClientTest, PlatformNamespaceAndModuleOption) {
  auto r = runClient({"-m", test::testProvider(), "ein", "root/kvlhost:KVLD_Chassis"},
                     {"NRV_MODULE=/nonexistent.so", "NRV_HOST_PLATFORM=" + test::platformFile()});
  ASSERT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out, "root/kvlhost:KVLD_Chassis.CreationClassName=\"KVLD_Chassis\",Tag=\"CH-1\"\n");
  auto noModule = runClient({"ei", "root/test:TST_Widget"}, {"NRV_MODULE=/nonexistent.so"});
  EXPECT_EQ(noModule.status, 1);
  EXPECT_EQ(noModule.err.rfind("CMPI_RC_ERR_FAILED : provider module not loaded", 0), 0u);
}

}  // namespace
}  // namespace nrv::host
