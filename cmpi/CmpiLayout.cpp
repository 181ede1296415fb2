// Compile-time proof that the CMPI headers lay data and function tables out as the CMPI 2.0
// standard fixes them on LP64, so objects cross the CIMOM/module boundary unchanged.
#include <cstddef>
#include <type_traits>

#include "cmpimacs.h"

namespace {

constexpr std::size_t kPtr = sizeof(void*);
static_assert(kPtr == 8, "the CMPI binding here is for LP64 (x86-64)");

// Scalar widths.
static_assert(sizeof(CMPIBoolean) == 1 && sizeof(CMPIChar16) == 2);
static_assert(sizeof(CMPIUint8) == 1 && sizeof(CMPIUint16) == 2);
static_assert(sizeof(CMPIUint32) == 4 && sizeof(CMPIUint64) == 8);
static_assert(sizeof(CMPISint8) == 1 && sizeof(CMPISint16) == 2);
static_assert(sizeof(CMPISint32) == 4 && sizeof(CMPISint64) == 8);
static_assert(sizeof(CMPIReal32) == 4 && sizeof(CMPIReal64) == 8);
static_assert(sizeof(CMPICount) == 4 && sizeof(CMPIType) == 2);
static_assert(sizeof(CMPIValueState) == 2 && sizeof(CMPIFlags) == 4);
static_assert(sizeof(CMPIrc) == 4);

// CMPIValue is as wide as its widest member, CMPIValuePtr {void*, CMPICount}.
static_assert(sizeof(CMPIValuePtr) == 16);
static_assert(sizeof(CMPIValue) == 16 && alignof(CMPIValue) == 8);

// CMPIData: type, state, then the value on its 8-byte boundary.
static_assert(offsetof(CMPIData, type) == 0);
static_assert(offsetof(CMPIData, state) == 2);
static_assert(offsetof(CMPIData, value) == 8);
static_assert(sizeof(CMPIData) == 24);

static_assert(offsetof(CMPIStatus, rc) == 0 && offsetof(CMPIStatus, msg) == 8);
static_assert(sizeof(CMPIStatus) == 16);

// Type codes and states.
static_assert(CMPI_boolean == 2 && CMPI_char16 == 3);
static_assert(CMPI_real32 == 8 && CMPI_real64 == 12);
static_assert(CMPI_uint8 == 128 && CMPI_uint16 == 144 && CMPI_uint32 == 160 && CMPI_uint64 == 176);
static_assert(CMPI_sint8 == 192 && CMPI_sint16 == 208 && CMPI_sint32 == 224 && CMPI_sint64 == 240);
static_assert(CMPI_instance == 4096 && CMPI_ref == 4352 && CMPI_args == 4608);
static_assert(CMPI_string == 5632 && CMPI_chars == 5888 && CMPI_dateTime == 6144);
static_assert(CMPI_ptr == 6400 && CMPI_ARRAY == 8192 && CMPI_stringA == (8192 | 5632));
static_assert(CMPI_nullValue == 256 && CMPI_keyValue == 512 && CMPI_badValue == 0x8000);
static_assert(CMPI_RC_ERR_NOT_FOUND == 6 && CMPI_RC_ERR_METHOD_NOT_FOUND == 17);
static_assert(CMPI_RC_DO_NOT_UNLOAD == 50 && CMPI_RC_ERR_INVALID_HANDLE == 60);
static_assert(CMPI_RC_ERROR_SYSTEM == 100 && CMPI_RC_ERROR == 200);
static_assert(CMPICurrentVersion == 200);

// Every encapsulated object and MI is { hdl, ft }.
template <typename T>
constexpr bool handleThenTable() {
  return offsetof(T, hdl) == 0 && offsetof(T, ft) == kPtr && sizeof(T) == 2 * kPtr;
}
static_assert(handleThenTable<CMPIContext>() && handleThenTable<CMPIResult>());
static_assert(handleThenTable<CMPIString>() && handleThenTable<CMPIArray>());
static_assert(handleThenTable<CMPIEnumeration>() && handleThenTable<CMPIInstance>());
static_assert(handleThenTable<CMPIObjectPath>() && handleThenTable<CMPIArgs>());
static_assert(handleThenTable<CMPIDateTime>() && handleThenTable<CMPISelectExp>());
static_assert(handleThenTable<CMPIError>() && handleThenTable<CMPIInstanceMI>());
static_assert(handleThenTable<CMPIMethodMI>() && handleThenTable<CMPIAssociationMI>());
static_assert(handleThenTable<CMPIIndicationMI>() && handleThenTable<CMPIPropertyMI>());

static_assert(offsetof(CMPIBroker, hdl) == 0 && offsetof(CMPIBroker, bft) == 8);
static_assert(offsetof(CMPIBroker, eft) == 16 && offsetof(CMPIBroker, xft) == 24);
static_assert(offsetof(CMPIBroker, mft) == 32);

// Object tables: ftVersion, then release and clone, then the n-th function at slot 2+n.
#define NRV_SLOT(T, field, n) static_assert(offsetof(T, field) == kPtr * (n), #T "." #field)
#define NRV_OBJECT_HEAD(T) \
  NRV_SLOT(T, ftVersion, 0); NRV_SLOT(T, release, 1); NRV_SLOT(T, clone, 2)

NRV_OBJECT_HEAD(CMPIContextFT);
NRV_SLOT(CMPIContextFT, getEntry, 3);
NRV_SLOT(CMPIContextFT, addEntry, 6);
static_assert(sizeof(CMPIContextFT) == 7 * kPtr);

NRV_OBJECT_HEAD(CMPIResultFT);
NRV_SLOT(CMPIResultFT, returnData, 3);
NRV_SLOT(CMPIResultFT, returnInstance, 4);
NRV_SLOT(CMPIResultFT, returnObjectPath, 5);
NRV_SLOT(CMPIResultFT, returnDone, 6);
NRV_SLOT(CMPIResultFT, returnError, 7);

NRV_OBJECT_HEAD(CMPIStringFT);
NRV_SLOT(CMPIStringFT, getCharPtr, 3);

NRV_OBJECT_HEAD(CMPIArrayFT);
NRV_SLOT(CMPIArrayFT, getSize, 3);
NRV_SLOT(CMPIArrayFT, setElementAt, 6);

NRV_OBJECT_HEAD(CMPIEnumerationFT);
NRV_SLOT(CMPIEnumerationFT, getNext, 3);
NRV_SLOT(CMPIEnumerationFT, toArray, 5);

NRV_OBJECT_HEAD(CMPIInstanceFT);
NRV_SLOT(CMPIInstanceFT, getProperty, 3);
NRV_SLOT(CMPIInstanceFT, setProperty, 6);
NRV_SLOT(CMPIInstanceFT, getObjectPath, 7);
NRV_SLOT(CMPIInstanceFT, setPropertyFilter, 8);
NRV_SLOT(CMPIInstanceFT, setObjectPath, 9);
NRV_SLOT(CMPIInstanceFT, setPropertyWithOrigin, 10);

NRV_OBJECT_HEAD(CMPIObjectPathFT);
NRV_SLOT(CMPIObjectPathFT, setNameSpace, 3);
NRV_SLOT(CMPIObjectPathFT, getClassName, 8);
NRV_SLOT(CMPIObjectPathFT, addKey, 9);
NRV_SLOT(CMPIObjectPathFT, getKeyCount, 12);
NRV_SLOT(CMPIObjectPathFT, setNameSpaceFromObjectPath, 13);
NRV_SLOT(CMPIObjectPathFT, toString, 19);

NRV_OBJECT_HEAD(CMPIArgsFT);
NRV_SLOT(CMPIArgsFT, addArg, 3);
NRV_SLOT(CMPIArgsFT, getArgCount, 6);

NRV_OBJECT_HEAD(CMPIDateTimeFT);
NRV_SLOT(CMPIDateTimeFT, getBinaryFormat, 3);
NRV_SLOT(CMPIDateTimeFT, isInterval, 5);

NRV_OBJECT_HEAD(CMPIErrorFT);
NRV_SLOT(CMPIErrorFT, getErrorType, 3);
NRV_SLOT(CMPIErrorFT, setMessageArguments, 26);

// Broker tables.
static_assert(offsetof(CMPIBrokerFT, brokerCapabilities) == 0);
static_assert(offsetof(CMPIBrokerFT, brokerVersion) == 4);
static_assert(offsetof(CMPIBrokerFT, brokerName) == 8);
NRV_SLOT(CMPIBrokerFT, prepareAttachThread, 2);
NRV_SLOT(CMPIBrokerFT, attachThread, 3);
NRV_SLOT(CMPIBrokerFT, detachThread, 4);
NRV_SLOT(CMPIBrokerFT, deliverIndication, 5);
NRV_SLOT(CMPIBrokerFT, enumerateInstanceNames, 6);
NRV_SLOT(CMPIBrokerFT, getInstance, 7);
NRV_SLOT(CMPIBrokerFT, createInstance, 8);
NRV_SLOT(CMPIBrokerFT, modifyInstance, 9);
NRV_SLOT(CMPIBrokerFT, deleteInstance, 10);
NRV_SLOT(CMPIBrokerFT, execQuery, 11);
NRV_SLOT(CMPIBrokerFT, enumerateInstances, 12);
NRV_SLOT(CMPIBrokerFT, associators, 13);
NRV_SLOT(CMPIBrokerFT, associatorNames, 14);
NRV_SLOT(CMPIBrokerFT, references, 15);
NRV_SLOT(CMPIBrokerFT, referenceNames, 16);
NRV_SLOT(CMPIBrokerFT, invokeMethod, 17);
NRV_SLOT(CMPIBrokerFT, setProperty, 18);
NRV_SLOT(CMPIBrokerFT, getProperty, 19);
static_assert(sizeof(CMPIBrokerFT) == 20 * kPtr);

NRV_SLOT(CMPIBrokerEncFT, ftVersion, 0);
NRV_SLOT(CMPIBrokerEncFT, newInstance, 1);
NRV_SLOT(CMPIBrokerEncFT, newObjectPath, 2);
NRV_SLOT(CMPIBrokerEncFT, newArgs, 3);
NRV_SLOT(CMPIBrokerEncFT, newString, 4);
NRV_SLOT(CMPIBrokerEncFT, newArray, 5);
NRV_SLOT(CMPIBrokerEncFT, newDateTime, 6);
NRV_SLOT(CMPIBrokerEncFT, newDateTimeFromBinary, 7);
NRV_SLOT(CMPIBrokerEncFT, newDateTimeFromChars, 8);
NRV_SLOT(CMPIBrokerEncFT, newSelectExp, 9);
NRV_SLOT(CMPIBrokerEncFT, classPathIsA, 10);
NRV_SLOT(CMPIBrokerEncFT, toString, 11);
NRV_SLOT(CMPIBrokerEncFT, isOfType, 12);
NRV_SLOT(CMPIBrokerEncFT, getType, 13);
NRV_SLOT(CMPIBrokerEncFT, getMessage, 14);
NRV_SLOT(CMPIBrokerEncFT, logMessage, 15);
NRV_SLOT(CMPIBrokerEncFT, trace, 16);
NRV_SLOT(CMPIBrokerEncFT, newCMPIError, 17);
NRV_SLOT(CMPIBrokerEncFT, openMessageFile, 18);
NRV_SLOT(CMPIBrokerEncFT, closeMessageFile, 19);
NRV_SLOT(CMPIBrokerEncFT, getMessage2, 20);

NRV_SLOT(CMPIBrokerExtFT, resolveFileName, 1);
NRV_SLOT(CMPIBrokerExtFT, newThread, 2);
NRV_SLOT(CMPIBrokerExtFT, signalCondition, 20);
NRV_SLOT(CMPIBrokerMemFT, mark, 1);
NRV_SLOT(CMPIBrokerMemFT, cmpiMalloc, 3);
NRV_SLOT(CMPIBrokerMemFT, cmpiFree, 7);
NRV_SLOT(CMPIBrokerMemFT, freeInstance, 8);
NRV_SLOT(CMPIBrokerMemFT, freeSelectExp, 14);

// MI tables: ftVersion and miVersion share the first slot, miName, cleanup, operations.
#define NRV_MI_HEAD(T) \
  static_assert(offsetof(T, ftVersion) == 0 && offsetof(T, miVersion) == 4, #T); \
  NRV_SLOT(T, miName, 1); NRV_SLOT(T, cleanup, 2)

NRV_MI_HEAD(CMPIInstanceMIFT);
NRV_SLOT(CMPIInstanceMIFT, enumerateInstanceNames, 3);
NRV_SLOT(CMPIInstanceMIFT, enumerateInstances, 4);
NRV_SLOT(CMPIInstanceMIFT, getInstance, 5);
NRV_SLOT(CMPIInstanceMIFT, createInstance, 6);
NRV_SLOT(CMPIInstanceMIFT, modifyInstance, 7);
NRV_SLOT(CMPIInstanceMIFT, deleteInstance, 8);
NRV_SLOT(CMPIInstanceMIFT, execQuery, 9);
static_assert(sizeof(CMPIInstanceMIFT) == 10 * kPtr);

NRV_MI_HEAD(CMPIMethodMIFT);
NRV_SLOT(CMPIMethodMIFT, invokeMethod, 3);
static_assert(sizeof(CMPIMethodMIFT) == 4 * kPtr);

NRV_MI_HEAD(CMPIAssociationMIFT);
NRV_SLOT(CMPIAssociationMIFT, associators, 3);
NRV_SLOT(CMPIAssociationMIFT, associatorNames, 4);
NRV_SLOT(CMPIAssociationMIFT, references, 5);
NRV_SLOT(CMPIAssociationMIFT, referenceNames, 6);
static_assert(sizeof(CMPIAssociationMIFT) == 7 * kPtr);

NRV_MI_HEAD(CMPIIndicationMIFT);
NRV_SLOT(CMPIIndicationMIFT, authorizeFilter, 3);
NRV_SLOT(CMPIIndicationMIFT, mustPoll, 4);
NRV_SLOT(CMPIIndicationMIFT, activateFilter, 5);
NRV_SLOT(CMPIIndicationMIFT, deActivateFilter, 6);
NRV_SLOT(CMPIIndicationMIFT, enableIndications, 7);
NRV_SLOT(CMPIIndicationMIFT, disableIndications, 8);
static_assert(sizeof(CMPIIndicationMIFT) == 9 * kPtr);

NRV_MI_HEAD(CMPIPropertyMIFT);
NRV_SLOT(CMPIPropertyMIFT, setProperty, 3);
NRV_SLOT(CMPIPropertyMIFT, getProperty, 4);

#undef NRV_MI_HEAD
#undef NRV_OBJECT_HEAD
#undef NRV_SLOT

// The factory signature a CIMOM looks up by name.
using InstanceFactory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
static_assert(std::is_pointer_v<InstanceFactory>);

}  // namespace
