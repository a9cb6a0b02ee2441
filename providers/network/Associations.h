// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TRecordWriter.h"

namespace NQRVZEP20 {

// The associations of the network's instances, as the schema defines them.
constexpr TAssociation kSapOfDevice{"CIM_DeviceSAPImplementation", "Antecedent", "CIM_LogicalDevice", "Dependent",
                                    "CIM_ServiceAccessPoint"};
constexpr TAssociation kControlledBy{"CIM_ControlledBy", "Antecedent", "CIM_Controller", "Dependent", "CIM_LogicalDevice"};
constexpr TAssociation kSoftwareOf{"CIM_ElementSoftwareIdentity", "Antecedent", "CIM_SoftwareIdentity", "Dependent",
                                   "CIM_ManagedElement"};
constexpr TAssociation kCapabilitiesOf{"CIM_ElementCapabilities", "ManagedElement", "CIM_ManagedElement", "Capabilities",
                                       "CIM_Capabilities"};
constexpr TAssociation kStatisticsOf{"CIM_ElementStatisticalData", "ManagedElement", "CIM_ManagedElement", "Stats",
                                     "CIM_StatisticalData"};
constexpr TAssociation kHostedAccessPoint{"CIM_HostedAccessPoint", "Antecedent", "CIM_System", "Dependent",
                                          "CIM_ServiceAccessPoint"};
constexpr TAssociation kBindsTo{"CIM_BindsTo", "Antecedent", "CIM_ProtocolEndpoint", "Dependent", "CIM_ServiceAccessPoint"};
constexpr TAssociation kHostedCollection{"CIM_HostedCollection", "Antecedent", "CIM_System", "Dependent",
                                         "CIM_SystemSpecificCollection"};
constexpr TAssociation kMemberOf{"CIM_MemberOfCollection", "Collection", "CIM_Collection", "Member", "CIM_ManagedElement"};
constexpr TAssociation kSameAs{"CIM_ConcreteIdentity", "SystemElement", "CIM_ManagedElement", "SameElement",
                               "CIM_ManagedElement"};
constexpr TAssociation kHostedService{"CIM_HostedService", "Antecedent", "CIM_System", "Dependent", "CIM_Service"};
constexpr TAssociation kProvidesEndpoint{"CIM_ProvidesEndpoint", "Antecedent", "CIM_Service", "Dependent",
                                         "CIM_ProtocolEndpoint"};
constexpr TAssociation kSwitchesAmong{"CIM_SwitchesAmong", "Antecedent", "CIM_SwitchPort", "Dependent", "CIM_SwitchService"};
constexpr TAssociation kHostedRoute{"CIM_HostedRoute", "Antecedent", "CIM_System", "Dependent", "CIM_NextHopRoute"};
constexpr TAssociation kRouteUses{"CIM_RouteUsesEndpoint", "Antecedent", "CIM_ProtocolEndpoint", "Dependent", "CIM_NextHopRoute"};
constexpr TAssociation kNextHop{"CIM_AssociatedNextHop", "Antecedent", "CIM_RemoteServiceAccessPoint", "Dependent",
                                "CIM_NextHopRoute"};
constexpr TAssociation kRemoteAccess{"CIM_RemoteAccessAvailableToElement", "Antecedent", "CIM_RemoteServiceAccessPoint",
                                     "Dependent", "CIM_EnabledLogicalElement"};
constexpr TAssociation kSettingOf{"CIM_ElementSettingData", "ManagedElement", "CIM_ManagedElement", "SettingData",
                                  "CIM_SettingData"};

}  // namespace NQRVZEP20
