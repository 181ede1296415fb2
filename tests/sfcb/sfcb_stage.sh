#!/usr/bin/env bash
# The real-CIMOM stage: the module, installed with the install target, registered with SFCB
# (built from ../shared/sfcb into a cache outside the checkout), driven with Debian's wbemcli,
# and every answer compared with the CIMOM stand-in's (nrv-cim) for the same request.
#
# usage: tests/sfcb/sfcb_stage.sh BUILD_DIR
#   BUILD_DIR   a build of this project (its module, nrv-cim and simulated libraries are used;
#               a sanitizer build runs inside sfcbd with its runtime preloaded)
# Environment: NRV_SFCB_PREFIX (default ${XDG_CACHE_HOME:-$HOME/.cache}/norvane_tavo_provider/
# sfcb-1.4.10) is where SFCB is built and reused while its sources do not change;
# NRV_SHARED_DIR (default ../shared beside the checkout) holds sfcb/ and cim-schema/.
# Exit status 0 when every check passed or ../shared/sfcb is absent (the stage is skipped).
set -Eeuo pipefail

top=$(cd "$(dirname "$0")/../.." && pwd)
build=$(cd "${1:?usage: sfcb_stage.sh BUILD_DIR}" && pwd)
shared=${NRV_SHARED_DIR:-$top/../shared}
S=$shared/sfcb
say() { printf '[sfcb stage] %s\n' "$*"; }
if [ ! -d "$S" ]; then
  say "SKIP: $S is not present (SFCB's sources and scripts); the real-CIMOM stage did not run"
  exit 0
fi
S=$(cd "$S" && pwd)
SCHEMA=$(cd "$shared/cim-schema" && pwd)
P=${NRV_SFCB_PREFIX:-${XDG_CACHE_HOME:-$HOME/.cache}/norvane_tavo_provider/sfcb-1.4.10}
mkdir -p "$(dirname "$P")"
T0=$SECONDS

# One stage at a time per prefix: SFCB allows one sfcbd per prefix, and registering rewrites it.
exec 9> "$P.lock"
flock -w 900 9 || { say "another stage holds $P.lock for more than 15 minutes"; exit 1; }

work=$(mktemp -d "${TMPDIR:-/tmp}/nrv-sfcb-stage.XXXXXX")
out=$work/answers
mkdir -p "$out"
running=0
failed=1

show_logs() {
  local f
  for f in "$P/var/log/sfcb/sfcbd.log" "$P/var/log/sfcb/syslog.log" \
           "$work"/root-*/opt/kelvar/platform/log/*.log "$work"/asan.*; do
    [ -s "$f" ] || continue
    printf '\n---- %s (last 60 lines)\n' "$f"
    tail -n 60 "$f"
  done
}
finish() {
  local status=$?
  [ "$running" = 1 ] && timeout 60 "$S/sfcb-stop.sh" --timeout 30 "$P" >/dev/null 2>&1 || true
  if [ "$failed" = 1 ] || [ "$status" != 0 ]; then
    say "FAILED after $((SECONDS - T0))s; logs of SFCB and the module follow (answers in $work)"
    show_logs
    exit 1
  fi
  rm -rf "$work"
}
trap finish EXIT

# 1. SFCB, built once per source change (build-sfcb.sh checks its stamp and exits at once)
t=$SECONDS
timeout 900 "$S/build-sfcb.sh" -j "$(nproc 2>/dev/null || echo 2)" "$P" > "$work/build-sfcb.log" 2>&1 ||
  { tail -n 40 "$work/build-sfcb.log"; exit 1; }
say "SFCB in $P ready after $((SECONDS - t))s"
command -v wbemcli > /dev/null || { say "wbemcli is missing (Debian package sblim-wbemcli)"; exit 1; }

# 2. the module, installed as an administrator installs it; and checked that DESTDIR works
inst=$work/install
cmake --install "$build" --prefix "$inst" > "$work/install.log"
DESTDIR=$work/destdir cmake --install "$build" --prefix /usr > /dev/null
[ -f "$work/destdir/usr/lib/cmpi/libnorvane_tavo_provider.so" ] ||
  { say "DESTDIR install did not put the module under DESTDIR"; exit 1; }
share=$inst/share/norvane_tavo_provider
module=$(find "$inst" -name libnorvane_tavo_provider.so -print -quit)
reg=$share/norvane_tavo_provider.reg
for f in "$module" "$reg" "$share/INSTALL" "$share"/mof/{qualifiers,dmtf,norvane_tavo_provider,norvane_tavo_provider_pg_interop}.mof; do
  [ -s "$f" ] || { say "the install lacks $f"; exit 1; }
done

# The installed MOF compiles alone, one namespace's file after qualifiers and DMTF classes.
for ns_file in norvane_tavo_provider norvane_tavo_provider_pg_interop; do
  rm -rf "$work/mofc"
  (cd "$share/mof" && timeout 120 "$P/bin/sfcbmof" -d "$work/mofc" -n root/x -o classSchemas \
      qualifiers.mof dmtf.mof "$ns_file.mof") > "$work/mofc.log" 2>&1 ||
    { cat "$work/mofc.log"; say "$ns_file.mof does not compile alone"; exit 1; }
  n=$("$P/bin/sfcbdump" "$work/mofc/root/x/classSchemas" | grep -c 'Class name' || true)
  say "installed MOF compiles alone: qualifiers.mof dmtf.mof $ns_file.mof -> $n classes"
done

# 3. registered in both namespaces, as the INSTALL text says
t=$SECONDS
for ns in root/norvane:norvane_tavo_provider root/pg_interop:norvane_tavo_provider_pg_interop; do
  timeout 300 "$S/sfcb-register.sh" "$P" "$SCHEMA" "${ns%%:*}" "$reg" "$module" \
      "$share/mof/${ns#*:}.mof" > "$work/register.log" 2>&1 ||
    { cat "$work/register.log"; exit 1; }
  grep -E 'namespace root/(norvane|pg_interop):|registered ' "$work/register.log" | sed 's/^/  /'
done
say "registered in $((SECONDS - t))s"

# 4. sfcbd on a free port with the simulated libraries and site, and a system root of its own
# (nrv-cim gets the same environment and a system root of its own too)
simenv=(LD_LIBRARY_PATH="$build/lib/sim" NRV_SITE="$top/sim/sites/sample.json")
if readelf -d "$module" | grep -q 'NEEDED.*libasan'; then
  # A sanitizer build: the runtime comes in with the module when sfcbd opens it (stack,
  # global and UB checks; the heap stays sfcbd's); reports go to files the stage checks. It is
  # not preloaded: in every sfcbd process the preloaded runtime's allocator lock was copied held
  # into forked HTTP request handlers, which then hung in their first malloc. Leaks and heap
  # errors are the unit tests' business.
  simenv+=(ASAN_OPTIONS="detect_leaks=0:verify_asan_link_order=0:log_path=$work/asan"
           UBSAN_OPTIONS="print_stacktrace=1:log_path=$work/asan")
fi
# Each system root starts as a fresh system: an /etc for the configuration files.
mkdir -p "$work/root-sfcb/etc" "$work/root-host/etc"
# sfcbd does not inherit the prefix lock (fd 9): a process it leaves behind would hold the lock
# and keep every later stage waiting.
start_sfcbd() {  # start_sfcbd [--append-logs]: the first start empties the logs, a restart keeps them
  timeout 90 "$S/sfcb-start.sh" --timeout 60 "$@" "$P" 0 "${simenv[@]}" \
      NRV_SYSROOT="$work/root-sfcb" > "$work/start.log" 2>&1 9>&- || { cat "$work/start.log"; exit 1; }
  running=1
  url=http://localhost:$(cat "$P/var/run/sfcb/sfcbd.port")
}
stop_sfcbd() {
  timeout 60 "$S/sfcb-stop.sh" --timeout 30 "$P" > /dev/null
  running=0
}
start_sfcbd
say "sfcbd answers on $url"

# 5. each request through wbemcli (SFCB) and nrv-cim (the stand-in); answers kept for the
# comparison. ask NAME OP PATH [ARG...]
export no_proxy=127.0.0.1,localhost
nrv_cim() {
  env "${simenv[@]}" NRV_SYSROOT="$work/root-host" NRV_MODULE="$build/lib/libnorvane_tavo_provider.so" \
      timeout 60 "$build/bin/nrv-cim" "$@"
}
asked=()
ask() {
  local name=$1 op=$2 path=$3; shift 3
  set +e
  local try rc
  # One retry after a timeout, so that a request lost by the CIMOM is told from one the module
  # hangs on, which times out again.
  for try in 1 2; do
    timeout 60 wbemcli -nl "$op" "$url/$path" "$@" > "$out/$name.sfcb" 2> "$out/$name.sfcb.err"
    rc=$?
    [ "$rc" = 124 ] && [ "$try" = 1 ] && { say "$name: no answer from sfcbd within 60 s, asking once more"; continue; }
    break
  done
  echo "$rc" > "$out/$name.sfcb.rc"
  nrv_cim "$op" "$path" "$@" > "$out/$name.host" 2> "$out/$name.host.err"
  echo $? > "$out/$name.host.rc"
  set -e
  asked+=("$name=$op")
}
setting='root/norvane:NRVTAVO_ProviderConfigSetting'
timeout_setting="$setting.InstanceID=\"Norvane TAVO Provider:cachetimeout\""

ask ei-setting ei "$setting"
ask ein-setting ein "$setting"
ask gi-setting gi "$timeout_setting"
ask mi-setting mi "$timeout_setting" current=20
ask gi-modified gi "$timeout_setting"
ask cm-unknown cm "$timeout_setting" NoSuchMethod
ask ein-poly-settingdata ein root/norvane:CIM_SettingData
ask ei-poly-settingdata ei root/norvane:CIM_SettingData
ask ein-poly-managedelement ein root/norvane:CIM_ManagedElement
ask ein-interop-profiles ein root/pg_interop:CIM_RegisteredProfile
ask ei-interop-profiles ei root/pg_interop:NRVTAVO_RegisteredProfile
ask ei-cards ei root/norvane:NRVTAVO_Card
ask ei-wrong-namespace ei "root/pg_interop:NRVTAVO_ProviderConfigSetting"
ask ei-unknown-namespace ei "root/bogus:NRVTAVO_ProviderConfigSetting"
ask mi-unknown-namespace mi "root/bogus:${timeout_setting#root/norvane:}" current=25
ask ein-unknown-class ein root/norvane:NRVTAVO_NoSuchClass
# Associations from the setting, the first software identity and the first card the module has,
# and from a profile in the interop namespace to the elements that conform to it in the module's.
first_path() { nrv_cim ein "root/norvane:$1" 2>/dev/null | head -n 1 || true; }
sources=("setting=$timeout_setting" "identity=$(first_path NRVTAVO_SoftwareIdentity)"
         "card=$(first_path NRVTAVO_Card)"
         'profile=root/pg_interop:NRVTAVO_RegisteredProfile.InstanceID="NRV:Physical Asset"')
for entry in "${sources[@]}"; do
  tag=${entry%%=*} source=${entry#*=}
  [ -n "$source" ] || { say "no $tag to start associations from"; exit 1; }
  for op in ai ain ri rin; do ask "$op-$tag" "$op" "$source"; done
done

# 6. the setting survives a restart of sfcbd (nrv-cim: the next process)
stop_sfcbd
start_sfcbd --append-logs
ask gi-after-restart gi "$timeout_setting"

# 7. an idle unload: with a provider timeout of 10 s SFCB cleans the module up, unloads it and
# ends its process; the next request loads it again in a new one.
module_processes() {
  local p
  for p in $(pgrep -f "^$P/sbin/sfcbd" || true); do
    grep -qs libnorvane_tavo_provider "/proc/$p/maps" && echo "$p"
  done
}
stop_sfcbd
start_sfcbd --append-logs --cfg providerTimeoutInterval=10 --cfg providerSampleInterval=2
ask ei-cards-before-idle ei root/norvane:NRVTAVO_Card
[ -n "$(module_processes)" ] || { say "no process holds the module after a request"; exit 1; }
t=$SECONDS
for _ in $(seq 60); do [ -z "$(module_processes)" ] && break; sleep 0.5; done
if [ -n "$(module_processes)" ]; then
  say "the module's process did not end after 30 s without requests (idle unload)"
  exit 1
fi
say "idle unload: the module's process ended $((SECONDS - t))s after its last request"
ask ei-cards-after-idle ei root/norvane:NRVTAVO_Card

# 8. the comparison, and the stage's own checks.
# Set persist_xfail=1 to mark the restart check as expected to fail.
persist_xfail=
status=0
python3 "$top/tests/sfcb/cim_compare.py" ${persist_xfail:+--xfail gi-after-restart} \
    "$out" "${asked[@]}" | tee "$work/compare.txt" || status=1
current=$(sed -n 's/^-current=//p' "$out/gi-after-restart.sfcb")
if [ "$current" = 20 ]; then
  say "persistence: current=20 after the sfcbd restart${persist_xfail:+ (XPASS: remove the expected-failure mark)}"
elif [ -n "$persist_xfail" ]; then
  say "persistence: XFAIL: current=${current:-?} after the sfcbd restart, expected 20"
else
  say "persistence: current=${current:-?} after the sfcbd restart, expected 20"
  status=1
fi
if compgen -G "$work/asan.*" > /dev/null; then
  say "the sanitizer reported errors"
  status=1
fi
[ "$status" = 0 ] || exit 1
failed=0
say "passed in $((SECONDS - T0))s"
