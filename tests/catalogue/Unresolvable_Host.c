/* Preloaded into nrv-cim: no host name resolves, as on a host missing from
   its own name service. */
#include <netdb.h>

int getaddrinfo(const char* node, const char* service, const struct addrinfo* hints, struct addrinfo** res) {
  (void)node;
  (void)service;
  (void)hints;
  *res = 0;
  return EAI_NONAME;
}
