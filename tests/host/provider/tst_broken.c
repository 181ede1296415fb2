/* TST_Broken: a factory that answers no MI, as a provider that fails to load does. */
#include "cmpimacs.h"

CMPI_EXTERN_C CMPI_EXPORT CMPIInstanceMI *TST_Broken_Provider_Create_InstanceMI(
    const CMPIBroker *broker, const CMPIContext *ctx, CMPIStatus *rc) {
    CMSetStatusWithChars(broker, rc, CMPI_RC_ERR_FAILED, "broken on purpose");
    return NULL;
}
