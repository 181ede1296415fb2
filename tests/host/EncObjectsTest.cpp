// The broker's encapsulated objects driven through the CMPI tables and macros, as an MI uses
// them, at smoke level: good calls give the standard's answers, released and foreign handles
// are refused, and a request's objects are gone when its arena ends.
#include <gtest/gtest.h>

#include <cstring>

#include "HostTestSupport.h"
#include "cmpimacs.h"
#include "host/EncObjects.h"

namespace nrv::host {
namespace {

class EncObjectsTest : public ::testing::Test {
 protected:
  test::ScriptedRouter router;
  Broker broker{router};
  const CMPIBroker* mb = broker.cmpi();
  std::unique_ptr<ArenaScope> scope = std::make_unique<ArenaScope>();
  CMPIStatus rc{CMPI_RC_OK, nullptr};

  void TearDown() override { scope.reset(); }

  CMPIObjectPath* path(const char* cls = "TST_Widget") {
    return CMNewObjectPath(mb, "root/test", cls, &rc);
  }
};

TEST_F(EncObjectsTest, ReleasedAndForeignHandlesAreRefused) {
  CMPIString* s = CMNewString(mb, "x", nullptr);
  const CMPIStringFT* ft = s->ft;
  ASSERT_EQ(CMRelease(s).rc, CMPI_RC_OK);
  EXPECT_EQ(ft->release(s).rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(ft->getCharPtr(s, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(ft->getCharPtr(nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  CMPIString fake{const_cast<char*>("fake"), ft};
  EXPECT_EQ(ft->getCharPtr(&fake, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(CMNewString(mb, nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
  // A live object of another kind is no string either.
  CMPIArgs* args = CMNewArgs(mb, nullptr);
  EXPECT_EQ(ft->getCharPtr(reinterpret_cast<CMPIString*>(args), &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(ft->release(reinterpret_cast<CMPIString*>(args)).rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(CMGetArgCount(args, &rc), 0u);
  EXPECT_EQ(rc.rc, CMPI_RC_OK);
}

TEST_F(EncObjectsTest, StringArrayTakesCharsAndStrings) {
  CMPIArray* a = CMNewArray(mb, 2, CMPI_stringA, &rc);
  ASSERT_EQ(CMGetArrayType(a, nullptr), CMPI_string);
  EXPECT_EQ(CMSetArrayElementAt(a, 0, "one", CMPI_chars).rc, CMPI_RC_OK);
  CMPIString* two = CMNewString(mb, "two", nullptr);
  EXPECT_EQ(CMSetArrayElementAt(a, 1, &two, CMPI_string).rc, CMPI_RC_OK);
  EXPECT_STREQ(CMGetCharPtr(CMGetArrayElementAt(a, 0, nullptr).value.string), "one");
  EXPECT_STREQ(CMGetCharPtr(CMGetArrayElementAt(a, 1, nullptr).value.string), "two");
  // SFCB keeps the element object itself: releasing it leaves the array unusable.
  CMRelease(two);
  CMGetArrayElementAt(a, 0, &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
}

TEST_F(EncObjectsTest, DateTimeFormsAgree) {
  CMPIDateTime* t = CMNewDateTimeFromChars(mb, "19700102000001.000002+000", &rc);
  ASSERT_EQ(rc.rc, CMPI_RC_OK);
  EXPECT_EQ(CMGetBinaryFormat(t, nullptr), 86401000002ULL);
  EXPECT_FALSE(CMIsInterval(t, nullptr));
  EXPECT_STREQ(CMGetCharPtr(CMGetStringFormat(t, nullptr)), "19700102000001.000002+000");

  CMPIDateTime* local = CMNewDateTimeFromChars(mb, "19700101010000.000000+060", &rc);
  EXPECT_EQ(CMGetBinaryFormat(local, nullptr), 0ULL);

  CMPIDateTime* i = CMNewDateTimeFromChars(mb, "00000001000000.000000:000", &rc);
  EXPECT_TRUE(CMIsInterval(i, nullptr));
  EXPECT_EQ(CMGetBinaryFormat(i, nullptr), 86400000000ULL);

  CMPIDateTime* b = CMNewDateTimeFromBinary(mb, 90061000000ULL, 1, &rc);
  EXPECT_STREQ(CMGetCharPtr(CMGetStringFormat(b, nullptr)), "00000001010101.000000:000");

  EXPECT_EQ(CMNewDateTimeFromChars(mb, "2024-01-02", &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(CMNewDateTimeFromChars(mb, "20241302000000.000000+000", &rc), nullptr);
  EXPECT_NE(CMNewDateTime(mb, &rc), nullptr);
}

TEST_F(EncObjectsTest, ObjectPathKeysAndComponents) {
  CMPIObjectPath* op = path();
  EXPECT_EQ(CMAddKey(op, "InstanceID", "W1", CMPI_chars).rc, CMPI_RC_OK);
  CMPIUint16 port = 3;
  EXPECT_EQ(CMAddKey(op, "Port", &port, CMPI_uint16).rc, CMPI_RC_OK);
  EXPECT_EQ(CMGetKeyCount(op, nullptr), 2u);
  CMPIData d = CMGetKey(op, "instanceid", &rc);
  ASSERT_EQ(rc.rc, CMPI_RC_OK);
  EXPECT_TRUE(CMIsKeyValue(d));
  EXPECT_STREQ(CMGetCharPtr(d.value.string), "W1");
  CMPIString* name = nullptr;
  d = CMGetKeyAt(op, 1, &name, &rc);
  EXPECT_STREQ(CMGetCharPtr(name), "Port");
  EXPECT_EQ(d.value.uint16, 3);
  CMGetKeyAt(op, 2, &name, &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
  CMGetKey(op, "Missing", &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);

  EXPECT_STREQ(CMGetCharPtr(CMGetClassName(op, nullptr)), "TST_Widget");
  EXPECT_EQ(CMSetNameSpace(op, "root/other").rc, CMPI_RC_OK);
  EXPECT_STREQ(CMGetCharPtr(CMGetNameSpace(op, nullptr)), "root/other");
  EXPECT_EQ(CMSetHostname(op, "h1").rc, CMPI_RC_OK);
  EXPECT_STREQ(CMGetCharPtr(CMGetHostname(op, nullptr)), "h1");
  EXPECT_STREQ(CMGetCharPtr(CMObjectPathToString(op, nullptr)),
               "root/other:TST_Widget.InstanceID=\"W1\",Port=3");
  EXPECT_EQ(CMSetClassName(op, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);

  CMPIObjectPath* other = CMNewObjectPath(mb, "root/x", "TST_Gadget", nullptr);
  EXPECT_EQ(CMSetNameSpaceFromObjectPath(other, op).rc, CMPI_RC_OK);
  EXPECT_STREQ(CMGetCharPtr(CMGetNameSpace(other, nullptr)), "root/other");
  EXPECT_EQ(CMSetNameSpaceFromObjectPath(other, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
  CMGetClassQualifier(op, "Key", &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(EncObjectsTest, InstanceAcceptsAnyPropertyAndKeepsItsPath) {
  CMPIObjectPath* op = path();
  CMAddKey(op, "InstanceID", "W1", CMPI_chars);
  CMPIInstance* ci = CMNewInstance(mb, op, &rc);
  ASSERT_EQ(rc.rc, CMPI_RC_OK);
  CMPIUint64 big = 1ULL << 40;
  EXPECT_EQ(CMSetProperty(ci, "Big", &big, CMPI_uint64).rc, CMPI_RC_OK);
  EXPECT_EQ(CMSetProperty(ci, "InstanceID", "W9", CMPI_chars).rc, CMPI_RC_OK);
  EXPECT_EQ(CMSetProperty(ci, "Empty", nullptr, CMPI_string).rc, CMPI_RC_OK);
  EXPECT_EQ(CMGetPropertyCount(ci, nullptr), 3u);
  CMPIData d = CMGetProperty(ci, "big", &rc);
  EXPECT_EQ(d.type, CMPI_uint64);
  EXPECT_EQ(d.value.uint64, big);
  d = CMGetProperty(ci, "Empty", &rc);
  EXPECT_TRUE(CMIsNullValue(d));
  EXPECT_EQ(d.type, CMPI_string);
  CMGetProperty(ci, "Nope", &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
  CMPIString* name = nullptr;
  CMGetPropertyAt(ci, 0, &name, &rc);
  EXPECT_STREQ(CMGetCharPtr(name), "Big");
  CMGetPropertyAt(ci, 3, &name, &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);

  // The instance path follows the key property.
  CMPIObjectPath* ip = CMGetObjectPath(ci, &rc);
  EXPECT_STREQ(CMGetCharPtr(CMGetKey(ip, "InstanceID", nullptr).value.string), "W9");
  CMPIObjectPath* moved = CMNewObjectPath(mb, "root/moved", "TST_Widget", nullptr);
  EXPECT_EQ(CMSetObjectPath(ci, moved).rc, CMPI_RC_OK);
  EXPECT_STREQ(CMGetCharPtr(CMGetNameSpace(CMGetObjectPath(ci, nullptr), nullptr)), "root/moved");
  EXPECT_EQ(CMNewInstance(mb, nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(EncObjectsTest, PropertyFilterDropsUnwantedProperties) {
  CMPIInstance* ci = CMNewInstance(mb, path(), nullptr);
  CMSetProperty(ci, "A", "a", CMPI_chars);
  CMSetProperty(ci, "B", "b", CMPI_chars);
  const char* props[] = {"B", nullptr};
  const char* keys[] = {"Id", nullptr};
  EXPECT_EQ(CMSetPropertyFilter(ci, props, keys).rc, CMPI_RC_OK);
  CMSetProperty(ci, "C", "c", CMPI_chars);
  CMSetProperty(ci, "Id", "k", CMPI_chars);
  EXPECT_EQ(CMGetPropertyCount(ci, nullptr), 2u);
  CMGetProperty(ci, "A", &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
  CMGetProperty(ci, "Id", &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_OK);
}

TEST_F(EncObjectsTest, CloneIsIndependentAndOutlivesTheRequest) {
  CMPIInstance* ci = CMNewInstance(mb, path(), nullptr);
  CMSetProperty(ci, "A", "a", CMPI_chars);
  CMPIInstance* copy = CMClone(ci, &rc);
  CMSetProperty(copy, "A", "changed", CMPI_chars);
  EXPECT_STREQ(CMGetCharPtr(CMGetProperty(ci, "A", nullptr).value.string), "a");
  const size_t before = ObjectRegistry::instance().liveCount(mb);
  scope.reset();  // the request ends
  EXPECT_LT(ObjectRegistry::instance().liveCount(mb), before);
  EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), 1u);
  EXPECT_EQ(CMRelease(copy).rc, CMPI_RC_OK);
  EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), 0u);
}

TEST_F(EncObjectsTest, ResultRefusesDeadObjects) {
  auto sink = std::make_shared<ResultSink>();
  CMPIResult* r = makeResult(mb, sink);
  CMPIInstance* ci = CMNewInstance(mb, path(), nullptr);
  CMPIUint32 first = 1, second = 2;
  CMSetProperty(ci, "Count", &first, CMPI_uint32);
  EXPECT_EQ(CMReturnInstance(r, ci).rc, CMPI_RC_OK);
  // What was returned stays as it was returned when the MI changes its instance afterwards.
  CMSetProperty(ci, "Count", &second, CMPI_uint32);
  EXPECT_EQ(CMReturnInstance(r, ci).rc, CMPI_RC_OK);
  CMRelease(ci);
  EXPECT_EQ(CMReturnInstance(r, ci).rc, CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(CMReturnObjectPath(r, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
  CMPIUint32 v = 4;
  EXPECT_EQ(CMReturnData(r, &v, CMPI_uint32).rc, CMPI_RC_OK);
  EXPECT_EQ(CMReturnDone(r).rc, CMPI_RC_OK);
  ASSERT_EQ(sink->items.size(), 3u);
  EXPECT_TRUE(sink->done);
  EXPECT_EQ(findNamed(sink->items[0].instance()->properties, "Count")->scalar.uint32, 1u);
  EXPECT_EQ(findNamed(sink->items[1].instance()->properties, "Count")->scalar.uint32, 2u);
  EXPECT_EQ(sink->items[2].scalar.uint32, 4u);
}

TEST_F(EncObjectsTest, RequestObjectsAreFreedWithTheirArena) {
  const size_t base = ObjectRegistry::instance().liveCount(mb);
  {
    ArenaScope inner;
    for (int i = 0; i < 50; ++i) CMNewString(mb, "tmp", nullptr);
    EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), base + 50);
  }
  EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), base);
}

}  // namespace
}  // namespace nrv::host
