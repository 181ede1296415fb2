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

echo "== Adapter inventory (the module's discovery over the site $NRV_SITE)"
"$build/bin/nrv-inventory"
echo
echo "== The module inside the host: its settings instance through CMPI"
"$build/bin/nrv-cim" -m "$build/lib/libnorvane_tavo_provider.so" ei root/norvane:NRVTAVO_ProviderConfigSetting
