// The static adapter record: one per provider, zero-initialised at load time,
// holding the live adapter, the four CMPI function tables and MI objects the
// provider's factories hand out, and their names.
#pragma once

#include "cmpift.h"
#include "framework/Provider.h"

namespace cimple {

class CMPI_Adapter;

struct CMPI_Static_Data {
  CMPI_Adapter* adapter;
  CMPIInstanceMIFT instance_ft;
  CMPIMethodMIFT method_ft;
  CMPIIndicationMIFT indication_ft;
  CMPIAssociationMIFT association_ft;
  CMPIInstanceMI instance_mi;
  CMPIMethodMI method_mi;
  CMPIIndicationMI indication_mi;
  CMPIAssociationMI association_mi;
  char instance_name[256];
  char method_name[256];
  char indication_name[256];
  char association_name[256];
};

}  // namespace cimple

extern "C" {
// Binds a provider to CMPI: creates the provider's adapter on first use (or
// counts one more MI object), and stores the MI object of `kind` ('I', 'M',
// 'A' or 'N') in *mi.  `tag` is always 67 and unused.  Returns 0.
int cimple_cmpi_adapter(int tag, cimple::CMPI_Static_Data* record, const cimple::Provider_Registration* registration,
                        const CMPIBroker* broker, const CMPIContext* context, const char* provider_name, char kind,
                        void** mi);
}
