#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class ICIMNamespace;

// What every report about a server asks first, read out of a namespace that a provider has filled. Static operations
// only; no state.
//
// Unless said otherwise a query reads one property of the only instance of its class and throws kZEPStatusNotFound when
// the class, the property or that one instance is missing; a value that is NULL or no string throws what the conversion
// of TCIMValue throws. Other failures of the namespace pass through.
//
// The namespace is asked with a context that names the provider (kContextName is kPluginNSPName). Where a query takes a
// context, its entries go along, and an entry kContextName of the caller's own is kept.
class ZEP_EXPORT TCIMSchemaHelper {
public:
  static std::string const kSystemCreationClassName;           // "QRVSG_ComputerSystem"
  static std::string const kOperatingSystemCreationClassName;  // "QRVSG_OperatingSystem"
  static std::string const kContextName;                       // "nspID": the context key that names the provider to ask
  static std::string const kPluginNSPName;                     // "plugin": the provider name put under that key
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

  // ---- Machine type and model: 4 + 3 characters, the model "xxx" where it is unknown ----

  // The product name as it stands. Each reason for kZEPStatusNotFound, NULL and a value that is no string included, is
  // logged at debug severity.
  static std::string GetRawMTMString(boost::shared_ptr<ICIMNamespace> ns);

  // Found in the product name: "Server X1-[1234ABC]-", "Server X1-[1234]-", "1234ABC" or "1234". A few older models, known
  // by name, carry it without brackets. Throws kZEPStatusInvalidFormat for any other form.
  static std::string GetMTM(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetMachineType(boost::shared_ptr<ICIMNamespace> ns);  // its first 4 characters
  static std::string GetModelNumber(boost::shared_ptr<ICIMNamespace> ns);  // its last 3

  // True when the first four characters are letters or digits; what follows does not matter.
  static bool IsValidMachineType(std::string const& text);

  // The same, and the three characters behind are letters, digits or blanks.
  static bool IsValidMTM(std::string const& text);

  // ---- Serial number ----

  static std::string GetRawSerialNumberString(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);  // as GetRawMTMString

  // Less its trailing blanks exactly 7 letters or digits, else throws kZEPStatusInvalidFormat.
  static std::string GetSerialNumber(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // ---- Parts of the data source's version, such as 3.20.5. Throw kZEPStatusNotFound when the dots are missing. ----

  static std::string GetDataSourceMajorVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);  // before the first "."
  static std::string GetDataSourceMinorVersion(boost::shared_ptr<ICIMNamespace> ns,
                                               TCIMContext context);                  // between the first two
  static std::string GetDataSourceBuildVersion(boost::shared_ptr<ICIMNamespace> ns);  // behind the last

  // ---- VMware ESXi hosts, which describe themselves in other classes. These look at every instance and answer "Unknown"
  //      for what is missing. ----

  // The last "Model" of the CIM_PhysicalElement instances that holds "-[" and "]-".
  static std::string GetSystemProductName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);
  static std::string GetMTM_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);  // what stands between its "-[" and "]-"

  // The last "LargeBuildNumber" of the VMware_HypervisorSoftwareIdentity instances, a text or a number.
  static std::string GetOperatingSystemName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns);

  // The last "SerialNumber" of the OMC_Chassis instances; throws kZEPStatusNotFound when there is no instance. For the
  // placeholders "XxXxXxX" and "none": the text behind the ":" of the first "OtherIdentifyingInfo" entry of
  // OMC_UnitaryComputerSystem that has one.
  static std::string GetSerialNumber_vmwesxi(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);
};

}  // namespace NQRVZEP20
