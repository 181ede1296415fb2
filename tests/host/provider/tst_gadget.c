/* TST_Gadget: read-only instance MI exported under the class name alone
 * (TST_Gadget_Create_InstanceMI), the alias a CIMOM also tries. */
#include "tst_store.h"

static const CMPIBroker *_broker;

static CMPIStatus GadgetCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean term) {
    tst_note_cleanup(term);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetEnumInstanceNames(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                          const CMPIResult *rslt, const CMPIObjectPath *op) {
    int i;
    for (i = 0; i < tst_gadget_count; i++) {
        CMReturnObjectPath(rslt, tst_gadget_path(_broker, tst_ns(op), tst_gadgets[i]));
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetEnumInstances(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                      const CMPIResult *rslt, const CMPIObjectPath *op,
                                      const char **props) {
    int i;
    for (i = 0; i < tst_gadget_count; i++) {
        CMReturnInstance(rslt, tst_gadget_instance(_broker, tst_ns(op), tst_gadgets[i], props));
    }
    CMReturnDone(rslt);
    CMReturn(CMPI_RC_OK);
}

static CMPIStatus GadgetGetInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                    const CMPIResult *rslt, const CMPIObjectPath *op,
                                    const char **props) {
    const char *tag = tst_key(op, "Tag");
    int i;
    for (i = 0; i < tst_gadget_count; i++) {
        if (tst_same(tag, tst_gadgets[i])) {
            CMReturnInstance(rslt, tst_gadget_instance(_broker, tst_ns(op), tst_gadgets[i], props));
            CMReturnDone(rslt);
            CMReturn(CMPI_RC_OK);
        }
    }
    CMReturn(CMPI_RC_ERR_NOT_FOUND);
}

static CMPIStatus GadgetCreateInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op,
                                       const CMPIInstance *ci) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus GadgetModifyInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op,
                                       const CMPIInstance *ci, const char **props) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus GadgetDeleteInstance(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                       const CMPIResult *rslt, const CMPIObjectPath *op) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

static CMPIStatus GadgetExecQuery(CMPIInstanceMI *mi, const CMPIContext *ctx,
                                  const CMPIResult *rslt, const CMPIObjectPath *op,
                                  const char *query, const char *lang) {
    CMReturn(CMPI_RC_ERR_NOT_SUPPORTED);
}

CMInstanceMIStub(Gadget, TST_Gadget, _broker, CMNoHook)
