// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class ICIMNamespace;

// Queries for the identity of a server in a namespace that a provider has filled. All functions are static; there is no
// state.
//
// Unless its comment states otherwise, a query reads one property of the only instance of its class. It throws
// kZEPStatusNotFound when the class or the property is missing or the class does not have exactly one instance. For a value
// that is NULL it throws kZEPStatusValueIsNULL, and for a value that is not a string kZEPStatusTypeMismatch. Other exceptions
// thrown by the namespace pass through.
//
// Every query passes the namespace a context that names the provider: the entry kContextName with the value kPluginNSPName. A
// query with a `context` argument adds that entry to the caller's entries, unless the caller's context has an entry
// kContextName of its own.
class ZEP_EXPORT TCIMSchemaHelper {
public:
  static std::string const kSystemCreationClassName;           // "QRVSG_ComputerSystem"
  static std::string const kOperatingSystemCreationClassName;  // "QRVSG_OperatingSystem"
  static std::string const kContextName;                       // "nspID": the context entry that names the provider to query
  static std::string const kPluginNSPName;                     // "plugin": the value of that entry
  static std::string const kCMPINSPName;                       // "cmpi"

  static std::string GetSystemCreationClassName();
  static std::string GetOperatingSystemCreationClassName();

  // ---- Single properties ----

  static std::string GetSystemProductName(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetSystemName(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetOperatingSystemName(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetOperatingSystemVersion(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetOperatingSystemType(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetDataSourceVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);
  static std::string GetDataSourceBuild(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // ---- Machine type and model (MTM): a type of 4 characters and a model of 3, "xxx" when the model is unknown ----

  // The product name, unchanged. Throws kZEPStatusNotFound for every failure, including a value that is NULL or not a
  // string, and logs the reason at debug severity.
  static std::string GetRawMTMString(boost::shared_ptr<ICIMNamespace> ns);

  // The machine type and model in the product name, which has the form "Server X1-[1234ABC]-", "Server X1-[1234]-", "1234ABC"
  // or "1234"; trailing blanks are ignored. The product names of a few older models, which have other forms, are also
  // recognised. Throws kZEPStatusInvalidFormat for any other form, and kZEPStatusNotFound as GetRawMTMString does.
  static std::string GetMTM(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetMachineType(boost::shared_ptr<ICIMNamespace> ns);  // the first 4 characters of GetMTM
  static std::string GetModelNumber(boost::shared_ptr<ICIMNamespace> ns);  // the last 3

  // True if the first four characters are letters or digits; the rest is not examined. False for a shorter string.
  static bool IsValidMachineType(std::string const& text);

  // True if IsValidMachineType(text) is true and the next three characters are letters, digits or blanks. False for a shorter
  // string.
  static bool IsValidMTM(std::string const& text);

  // ---- Serial number ----

  // The serial number, unchanged. Fails as GetRawMTMString does.
  static std::string GetRawSerialNumberString(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // The serial number without trailing blanks. Throws kZEPStatusInvalidFormat unless it consists of exactly 7 letters or
  // digits, and kZEPStatusNotFound as GetRawSerialNumberString does.
  static std::string GetSerialNumber(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // ---- Parts of the data source's version, such as 3.20.5. Each throws kZEPStatusNotFound when a dot is missing. ----

  static std::string GetDataSourceMajorVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);  // before the first "."
  static std::string GetDataSourceMinorVersion(boost::shared_ptr<ICIMNamespace> ns,
                                               TCIMContext context);                  // between the first two
  static std::string GetDataSourceBuildVersion(boost::shared_ptr<ICIMNamespace> ns);  // after the last

  // ---- VMware ESXi hosts, which are described by other classes. These queries examine every instance and return "Unknown"
  //      when the data is missing. ----

  // The property "Model" of the last CIM_PhysicalElement instance in which it contains both "-[" and "]-".
  static std::string GetSystemProductName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetMTM_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);  // the text between "-[" and "]-" in that name

  // The last "LargeBuildNumber", a string or an integer, among the VMware_HypervisorSoftwareIdentity instances.
  static std::string GetOperatingSystemName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);

  // The property "SerialNumber" of the last OMC_Chassis instance that has it; throws kZEPStatusNotFound when there is no
  // instance. If it is a placeholder, "XxXxXxX" or "none", the result is the text after the first ":" in the first entry with
  // a ":" of the array "OtherIdentifyingInfo", in the last OMC_UnitaryComputerSystem instance that has such an entry.
  static std::string GetSerialNumber_vmwesxi(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);
};

}  // namespace NQRVZEP20
