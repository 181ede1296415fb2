// The device identifier page parser, on answers a library may really give.
#include <gtest/gtest.h>

#include <string.h>

#include "data/NRV_Target.h"

namespace {

using cimple::DeviceIdentifier;
using cimple::parseDeviceIdentifier;

TEST(DeviceIdentifier, NullRecordOrPageIsRefused) {
  uint8_t page[16] = {};
  DeviceIdentifier id;
  EXPECT_EQ(parseDeviceIdentifier(page, sizeof page, nullptr), 0x8001u);
  EXPECT_EQ(parseDeviceIdentifier(nullptr, sizeof page, &id), 0x8001u);
}

TEST(DeviceIdentifier, FirstDescriptorIsTaken) {
  const uint8_t page[] = {0x20 | 0x0C, 0x83, 0x00, 12, 0x01, 0x13, 0x00, 8,
                          1, 2, 3, 4, 5, 6, 7, 8, 0xEE, 0xEE};
  DeviceIdentifier id;
  ASSERT_EQ(parseDeviceIdentifier(page, sizeof page, &id), 0u);
  EXPECT_EQ(id.deviceType, 0x0C);
  EXPECT_EQ(id.pageCode, 0x83);
  EXPECT_EQ(id.pageLength, 12u);
  EXPECT_EQ(id.identifierType, 3u);
  ASSERT_EQ(id.identifierLength, 8u);
  EXPECT_EQ(memcmp(id.identifier, page + 8, 8), 0);
  EXPECT_EQ(id.identifier[8], 0);
}

TEST(DeviceIdentifier, LengthBeyondTheAnswerIsCut) {
  // A 255-byte response claiming a 255-byte identifier holds only 247 of them.
  uint8_t page[255];
  memset(page, 0xAB, sizeof page);
  page[7] = 255;
  DeviceIdentifier id;
  ASSERT_EQ(parseDeviceIdentifier(page, sizeof page, &id), 0u);
  EXPECT_EQ(id.identifierLength, 247u);
  EXPECT_EQ(id.identifier[246], 0xAB);
  EXPECT_EQ(id.identifier[247], 0);
}

}  // namespace
