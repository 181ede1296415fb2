// The catalogue's maps grouped by who empties them and when: the adapter
// groups (clearAdapterMaps, in this order), the two SAN groups (clearSANMaps)
// and the SAN class list that tells a provider which readiness to wait for.
//
// Each list is an X-macro over the instance struct names; a map is named
// m_<struct>_map.  Maps of classes listed nowhere here survive every rebuild
// (diagnostic jobs and records, iSCSI setting service and statistics data):
// their owners empty them.
#pragma once

#define NRV_HOST_MAPS(X) \
  X(CIM_ComputerSystem)  \
  X(CIM_Chassis)

#define NRV_RECORD_LOG_MAPS(X)         \
  X(NRVTAVO_RecordLog)                 \
  X(NRVTAVO_EnabledRecordLogCapabilities) \
  X(NRVTAVO_RecordLogCapabilities)     \
  X(NRVTAVO_ProviderUseOfLog)          \
  X(NRVTAVO_RecordLogConformsToProfile)

// Adapter, NIC and IP, with the SR-IOV, dump and PHY feature maps at the
// points where their features empty them.
#define NRV_NIC_MAPS(X)                                    \
  X(NRVTAVO_PhysicalPackage)                               \
  X(NRVTAVO_Product)                                       \
  X(NRVTAVO_RegisteredProfile)                             \
  X(NRVTAVO_SoftwareIdentity)                              \
  X(NRVTAVO_ProviderConfigSetting)                         \
  X(NRVTAVO_Card)                                          \
  X(NRVTAVO_PhysicalConnector)                             \
  X(NRVTAVO_PortController)                                \
  X(NRVTAVO_Transceiver)                                   \
  X(NRVTAVO_ChassisContainsCard)                           \
  X(NRVTAVO_PCIDeviceConformsToProfile)                    \
  X(NRVTAVO_SystemVirtualPCIDevice)                        \
  X(NRVTAVO_LogicalConcreteIdentity)                       \
  X(NRVTAVO_VFBindsToLANEndpoint)                          \
  X(NRVTAVO_VFActiveConnection)                            \
  X(NRVTAVO_VFElementSettingData)                          \
  X(NRVTAVO_VFAllocationSettingData)                       \
  X(NRVTAVO_NICControlledBy)                               \
  X(NRVTAVO_NICLogicalDevice)                              \
  X(NRVTAVO_EthernetPort)                                  \
  X(NRVTAVO_DownEthernetPort)                              \
  X(NRVTAVO_LANEndpoint)                                   \
  X(NRVTAVO_EnabledLogicalElementCapabilities)             \
  X(NRVTAVO_NICCapabilities)                               \
  X(NRVTAVO_NICSAPImplementation)                          \
  X(NRVTAVO_EndpointCapabilities)                          \
  X(NRVTAVO_HostedLANEndpoint)                             \
  X(NRVTAVO_EthernetPortSystemDevice)                      \
  X(NRVTAVO_NICPortConformsToProfile)                      \
  X(NRVTAVO_FCPortSoftwareIdentity)                        \
  X(NRVTAVO_EthernetPortSoftwareIdentity)                  \
  X(NRVTAVO_VLANEndpoint)                                  \
  X(NRVTAVO_HostedVLANEndpoint)                            \
  X(NRVTAVO_VLANEndPointidentity)                          \
  X(NRVTAVO_VLANEndpointSettingData)                       \
  X(NRVTAVO_VLANSettingData)                               \
  X(NRVTAVO_IPProtocolEndpoint)                            \
  X(NRVTAVO_EnabledLogicalIPProtocolEndpointCapabilities)  \
  X(NRVTAVO_IPProtocolEndpointCapabilities)                \
  X(NRVTAVO_HostedIPProtocolEndpoint)                      \
  X(NRVTAVO_IPConfigurationService)                        \
  X(NRVTAVO_IPConfigurationServiceAffectsElement)          \
  X(NRVTAVO_HostedIPConfigurationService)                  \
  X(NRVTAVO_IPAssignmentSettingData)                       \
  X(NRVTAVO_StaticIPAssignmentSettingData)                 \
  X(NRVTAVO_IPProtocolEndpointIPAssignmentSettingData)     \
  X(NRVTAVO_StaticIPProtocolEndpointIPAssignmentSettingData) \
  X(NRVTAVO_OrderedIPAssignmentSettingData)                \
  X(NRVTAVO_IPProtocolEndpointConformsToProfile)           \
  X(NRVTAVO_BindsToLANEndpoint)                            \
  X(NRVTAVO_PCIDevice)                                     \
  X(NRVTAVO_PCIElementConformsToProfile)                   \
  X(NRVTAVO_SystemDevice)                                  \
  X(NRVTAVO_Realizes)                                      \
  X(NRVTAVO_Container)                                     \
  X(NRVTAVO_ConcreteIdentity)                              \
  X(NRVTAVO_ComputerSystemConformsToProfile)               \
  X(NRVTAVO_SoftwareConformsToProfile)                     \
  X(NRVTAVO_InstalledSoftwareIdentity)                     \
  X(NRVTAVO_ProductPortControllerComponent)                \
  X(NRVTAVO_ElementSoftwareIdentity)                       \
  X(NRVTAVO_FirmwareElementSoftwareIdentity)               \
  X(NRVTAVO_ProviderElementSoftwareIdentity)               \
  X(NRVTAVO_ControlledBy)                                  \
  X(NRVTAVO_PortControllerSystemDevice)                    \
  X(NRVTAVO_TransceiverComponent)                          \
  X(NRVTAVO_PortControllerRealizes)                        \
  X(NRVTAVO_PortControllerRealizesPhysicalPackage)         \
  X(NRVTAVO_CardRealizesPortController)                    \
  X(NRVTAVO_PortControllerConformsToProfile)               \
  X(NRVTAVO_FlashImageSoftwareIdentity)                    \
  X(NRVTAVO_TAVOPortFlashImageSoftwareIdentity)            \
  X(NRVTAVO_ProductPhysicalComponent)                      \
  X(NRVTAVO_ProductPhysicalComponentPhysicalPackage)       \
  X(NRVTAVO_DumpService)                                   \
  X(NRVTAVO_HostedDumpService)                             \
  X(NRVTAVO_DumpServiceAffectsElement)                     \
  X(NRVTAVO_VitalProductData)                              \
  X(NRVTAVO_ElementVPD)                                    \
  X(NRVTAVO_ExtFATDumpData)                                \
  X(NRVTAVO_ElementExtFATDumpData)                         \
  X(NRVTAVO_ExtFATDumpAdvancedData)                        \
  X(NRVTAVO_ElementExtFATDumpAdvancedData)                 \
  X(NRVTAVO_PHYPhysicalComponent)                          \
  X(NRVTAVO_PHYComponent)                                  \
  X(NRVTAVO_PHYPhysicalComponentData)                      \
  X(NRVTAVO_PHYPhysicalComponentSettingData)               \
  X(NRVTAVO_ChannelMgmtServiceAffectsElement)              \
  X(NRVTAVO_HostedChannelMgmtService)                      \
  X(NRVTAVO_ChannelMgmtServiceElementSettingData)          \
  X(NRVTAVO_ChannelSettingData)                            \
  X(NRVTAVO_ChannelMgmtService)                            \
  X(NRVTAVO_FRUVitalProductData)                           \
  X(NRVTAVO_FRUElementVPD)                                 \
  X(NRVTAVO_Chip)                                          \
  X(NRVTAVO_CardContainsChip)                              \
  X(NRVTAVO_ConnectorDependsOnChip)                        \
  X(NRVTAVO_InstallServiceAffectsChip)

// Software update comes in two steps, each announced by its own message.
#define NRV_SOFTWARE_SERVICE_MAPS(X)   \
  X(NRVTAVO_SoftwareInstallationService) \
  X(NRVTAVO_SoftwareInstallationServiceCapabilities)

#define NRV_SOFTWARE_UPDATE_MAPS(X)         \
  X(NRVTAVO_ElementCapabilities)            \
  X(NRVTAVO_InstallServiceAffectsSystem)    \
  X(NRVTAVO_HostedInstallationService)      \
  X(NRVTAVO_InstallServiceConformsToProfile) \
  X(NRVTAVO_InstallServiceAffectsFirmwareIdentity)

#define NRV_DIAGNOSTIC_MAPS(X)              \
  X(NRVTAVO_DiagnosticTest)                 \
  X(NRVTAVO_AvailableDiagnosticService)     \
  X(NRVTAVO_DiagnosticServiceCapabilities)  \
  X(NRVTAVO_DiagnosticsLog)                 \
  X(NRVTAVO_HelpService)                    \
  X(NRVTAVO_ServiceAffectsElement)          \
  X(NRVTAVO_ServiceAvailableToElement)      \
  X(NRVTAVO_UseOfLog)                       \
  X(NRVTAVO_JobSettingData)                 \
  X(NRVTAVO_ElementSettingData)             \
  X(NRVTAVO_DiagHostedService)              \
  X(NRVTAVO_HostedService)                  \
  X(NRVTAVO_DiagnosticSettingData)          \
  X(NRVTAVO_DiagnosticIdentity)             \
  X(NRVTAVO_DiagElementSoftwareIdentity)    \
  X(NRVTAVO_ServiceConformsToProfile)       \
  X(NRVTAVO_DiagElementCapabilities)

// FCoE, with the NIC boot and QoS, driver-log and port virtualization
// feature maps at the points where their features empty them.
#define NRV_FCOE_MAPS(X)                     \
  X(NRVTAVO_FCPort)                          \
  X(NRVTAVO_FCPortStatistics)                \
  X(NRVTAVO_FCSystemDevice)                  \
  X(NRVTAVO_ElementStatisticalData)          \
  X(NRVTAVO_DeviceSAPImplementation)         \
  X(NRVTAVO_HostedDependency)                \
  X(NRVTAVO_FCControlledBy)                  \
  X(NRVTAVO_DriverParameterService)          \
  X(NRVTAVO_HostedDriverParameterService)    \
  X(NRVTAVO_DriverServiceAffectsElement)     \
  X(NRVTAVO_DriverParameterSettingData)      \
  X(NRVTAVO_DriverElementSettingData)        \
  X(NRVTAVO_LocalPortElementSettingData)     \
  X(NRVTAVO_FCRealizes)                      \
  X(NRVTAVO_FCConcreteIdentity)              \
  X(NRVTAVO_RemoteServiceAccessPoint)        \
  X(NRVTAVO_SAPAvailableForElement)          \
  X(NRVTAVO_RemoteHostedAccessPoint)         \
  X(NRVTAVO_FCPortConformsToProfile)         \
  X(NRVTAVO_CardConformsToProfile)           \
  X(NRVTAVO_FIPService)                      \
  X(NRVTAVO_HostedFIPService)                \
  X(NRVTAVO_FIPServiceAffectsElement)        \
  X(NRVTAVO_FIPData)                         \
  X(NRVTAVO_ElementFIPData)                  \
  X(NRVTAVO_FIPFCFData)                      \
  X(NRVTAVO_ElementFIPFCFData)               \
  X(NRVTAVO_CEEService)                      \
  X(NRVTAVO_PGData)                          \
  X(NRVTAVO_DcbxLldpData)                    \
  X(NRVTAVO_ElementPGData)                   \
  X(NRVTAVO_ElementDcbxLLdpData)             \
  X(NRVTAVO_HostedCEEService)                \
  X(NRVTAVO_CEEServiceAffectsElement)        \
  X(NRVTAVO_CEEServiceAffectsDriver)         \
  X(NRVTAVO_PortControllerDcbxLLdpData)      \
  X(NRVTAVO_PortControllerPGData)            \
  X(NRVTAVO_PFCThrottle)                     \
  X(NRVTAVO_ElementPFCThrottle)              \
  X(NRVTAVO_NICNetworkBootData)              \
  X(NRVTAVO_NICQOSData)                      \
  X(NRVTAVO_PortNICNetworkBootSettingData)   \
  X(NRVTAVO_PortNICQOSSettingData)           \
  X(NRVTAVO_ServiceNICNetworkBootSettingData) \
  X(NRVTAVO_NICSettingService)               \
  X(NRVTAVO_ServiceNICQOSSettingData)        \
  X(NRVTAVO_HostedNICSettingService)         \
  X(NRVTAVO_NICSettingServiceAffectsDriver)  \
  X(NRVTAVO_NICSettingServiceAffectsPort)    \
  X(NRVTAVO_FCDriverLogEntry)                \
  X(NRVTAVO_NICDriverLogEntry)               \
  X(NRVTAVO_ResourcePool)                    \
  X(NRVTAVO_ElementAllocatedFromPool)        \
  X(NRVTAVO_HostedResourcePool)              \
  X(NRVTAVO_VirtualFCPort)                   \
  X(NRVTAVO_VPortHostedDependency)           \
  X(NRVTAVO_VMSystemDevice)                  \
  X(NRVTAVO_FCWWNService)                    \
  X(NRVTAVO_HostedFCWWNService)              \
  X(NRVTAVO_FCWWNServiceAffectsSystem)       \
  X(NRVTAVO_FCWWNServiceAffectsFCPort)       \
  X(NRVTAVO_SCSIProtocolInitiatorEndpoint)   \
  X(NRVTAVO_LocalHostedInitiatorAccessPoint)

// iSCSI and IP tables, with the iSCSI driver-log entries.
#define NRV_ISCSI_MAPS(X)                            \
  X(NRVTAVO_iSCSIPortConformsToProfile)              \
  X(NRVTAVO_iSCSIBindsToTCP)                         \
  X(NRVTAVO_TCPBindsToIP)                            \
  X(NRVTAVO_IPProtocolEndpointSAPImplementation)     \
  X(NRVTAVO_HostedIPAccessPoint)                     \
  X(NRVTAVO_TCPProtocolEndpoint)                     \
  X(NRVTAVO_HostedTCPAccesspoint)                    \
  X(NRVTAVO_iSCSIProtocolEndpointSAPImplementation)  \
  X(NRVTAVO_SCSIProtocolController)                  \
  X(NRVTAVO_SCSIProtocolControllerSystemDevice)      \
  X(NRVTAVO_ProtocolControllerForPort)               \
  X(NRVTAVO_SAPAvailableForEthernetPort)             \
  X(NRVTAVO_ARPEntry)                                \
  X(NRVTAVO_RouteEntry)                              \
  X(NRVTAVO_ARPTable)                                \
  X(NRVTAVO_RouteTable)                              \
  X(NRVTAVO_CollectedARP)                            \
  X(NRVTAVO_CollectedRoute)                          \
  X(NRVTAVO_UseOfARPTable)                           \
  X(NRVTAVO_UseOfRouteTable)                         \
  X(NRVTAVO_ISCSIDriverLogEntry)                     \
  X(NRVTAVO_RemoteAccessAvailableToElement)

#define NRV_SAN_FCOE_MAPS(X)                                  \
  X(NRVTAVO_SCSIProtocolEndpoint)                             \
  X(NRVTAVO_LogicalDisk)                                      \
  X(NRVTAVO_StorageVolume)                                    \
  X(NRVTAVO_TapeDrive)                                        \
  X(NRVTAVO_StorageExtent)                                    \
  X(NRVTAVO_SCSIArbitraryLogicalUnit)                         \
  X(NRVTAVO_LocalHostedAccessPoint)                           \
  X(NRVTAVO_LogicalDiskSystemDevice)                          \
  X(NRVTAVO_StorageVolumeSystemDevice)                        \
  X(NRVTAVO_TapeDriveSystemDevice)                            \
  X(NRVTAVO_StorageExtentSystemDevice)                        \
  X(NRVTAVO_SCSIArbitraryLogicalUnitSystemDevice)             \
  X(NRVTAVO_SCSIInitiatorTargetLogicalDiskPath)               \
  X(NRVTAVO_SCSIInitiatorTargetStorageVolumePath)             \
  X(NRVTAVO_SCSIInitiatorTargetTapeDrivePath)                 \
  X(NRVTAVO_SCSIInitiatorTargetStorageExtentPath)             \
  X(NRVTAVO_SCSIInitiatorTargetArbitraryLogicalUnitPath)

#define NRV_SAN_ISCSI_MAPS(X)                                 \
  X(NRVTAVO_iSCSITargetProtocolEndpoint)                      \
  X(NRVTAVO_iSCSILocalHostedAccessPoint)                      \
  X(NRVTAVO_iSCSIInitiatorTargetLogicalDiskPath)              \
  X(NRVTAVO_iSCSIInitiatorTargetArbitraryLogicalUnitPath)     \
  X(NRVTAVO_iSCSIInitiatorTargetStorageExtentPath)            \
  X(NRVTAVO_iSCSIInitiatorTargetStorageVolumePath)            \
  X(NRVTAVO_iSCSIInitiatorTargetTapeDrivePath)                \
  X(NRVTAVO_iSCSIConnection)                                  \
  X(NRVTAVO_iSCSISession)                                     \
  X(NRVTAVO_iSCSIConnectionEndpointOfNetworkPipe)             \
  X(NRVTAVO_iSCSISessionEndpointOfNetworkPipe)                \
  X(NRVTAVO_NetworkPipeComposition)                           \
  X(NRVTAVO_ISCSISessionStatistics)                           \
  X(NRVTAVO_ISCSISessionStatisticalData)                      \
  X(NRVTAVO_SAPAvailableForISCSIEndpoint)                     \
  X(NRVTAVO_iSCSIProtocolEndpoint)                            \
  X(NRVTAVO_HostedISCSIAccesspoint)

// Classes whose providers wait for the SAN catalogue rather than the adapter one.
#define NRV_SAN_CATALOGUE_CLASSES(X) \
  NRV_SAN_FCOE_MAPS(X)               \
  NRV_SAN_ISCSI_MAPS(X)
