#!/usr/bin/env bash
# The main job: load the built module into the host over the sample site and
# show the adapter inventory as a CIM client sees it, walked by association
# from the chassis down.  Every system path is relocated into the build tree,
# so nothing outside it is read or written.
set -euo pipefail
build=${1:?usage: demo.sh BUILD_DIR}
top=$(cd "$(dirname "$0")/.." && pwd)
export NRV_SYSROOT="$build/demo-root"
export NRV_SITE="${NRV_SITE:-$top/sim/sites/sample.json}"
export LD_LIBRARY_PATH="$build/lib/sim${LD_LIBRARY_PATH:+:$LD_LIBRARY_PATH}"
mkdir -p "$NRV_SYSROOT/etc" "$NRV_SYSROOT/var/log" "$NRV_SYSROOT/opt/kelvar/platform/log"
cim=("$build/bin/nrv-cim" -m "$build/lib/libnorvane_tavo_provider.so")

# Chassis -> cards -> chips (firmware) and connectors; port controllers -> the
# Ethernet and FC ports they control -> the PCI function and driver of each.
# Each association is followed only from the end named after the colon.
follow=NRVTAVO_ChassisContainsCard:GroupComponent,NRVTAVO_CardContainsChip:GroupComponent
follow+=,NRVTAVO_FirmwareElementSoftwareIdentity:Dependent,NRVTAVO_Container:GroupComponent
follow+=,NRVTAVO_CardRealizesPortController:Antecedent
follow+=,NRVTAVO_ControlledBy:Antecedent,NRVTAVO_FCControlledBy:Antecedent
follow+=,NRVTAVO_ConcreteIdentity:SystemElement,NRVTAVO_FCConcreteIdentity:SystemElement
follow+=,NRVTAVO_EthernetPortSoftwareIdentity:Dependent,NRVTAVO_FCPortSoftwareIdentity:Dependent

echo "== Adapter inventory through the module in the host (site $NRV_SITE)"
"${cim[@]}" tree 'root/norvane:CIM_Chassis.CreationClassName="CIM_Chassis",Tag="NRV TAVO:Chassis"' "$follow"
echo
echo "== The module's settings through CMPI"
"${cim[@]}" ei root/norvane:NRVTAVO_ProviderConfigSetting
