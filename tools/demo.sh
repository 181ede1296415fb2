#!/usr/bin/env bash
# The main job: load the built module into the host over the sample site and
# show the adapter inventory.  Every system path is relocated into the build
# tree, so nothing outside it is read or written.
set -euo pipefail
build=${1:?usage: demo.sh BUILD_DIR}
top=$(cd "$(dirname "$0")/.." && pwd)
export NRV_SYSROOT="$build/demo-root"
export NRV_SITE="${NRV_SITE:-$top/sim/sites/sample.json}"
export LD_LIBRARY_PATH="$build/lib/sim${LD_LIBRARY_PATH:+:$LD_LIBRARY_PATH}"
mkdir -p "$NRV_SYSROOT/etc" "$NRV_SYSROOT/var/log" "$NRV_SYSROOT/opt/kelvar/platform/log"

cli="$build/bin/nrv-cim"
module="$build/lib/libnorvane_tavo_provider.so"
if [ ! -x "$cli" ]; then
  echo "The host is not built yet; the module registers these providers:"
  nm -D --defined-only "$module" | awk '/_Provider_Create_InstanceMI$/ {sub(/_Provider_Create_InstanceMI$/, "", $3); print "  " $3}'
  exit 0
fi
for class in NRVTAVO_Card NRVTAVO_PortController NRVTAVO_EthernetPort NRVTAVO_FCPort NRVTAVO_SoftwareIdentity; do
  echo "== $class"
  "$cli" -m "$module" ei "root/norvane:$class"
done
