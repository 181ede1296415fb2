// Provider_For<C>::type: which provider class serves CIM class C.  Every
// class is catalogue-backed unless a service provider claims it with a
// specialisation (see module/Service_Providers.h).
#pragma once

#include "derivedObjects/Catalogue_Provider.h"

namespace cimple {

template <class C>
struct Provider_For {
  using type = Catalogue_Provider<C>;
};

}  // namespace cimple
