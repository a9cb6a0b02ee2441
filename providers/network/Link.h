// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The counters of an interface since it was created: those of the kernel's rtnl_link_stats64 that this provider reports.
struct TLinkCounters {
  std::uint64_t fReceivedPackets, fSentPackets, fReceivedBytes, fSentBytes, fReceiveErrors, fSendErrors, fReceiveDrops,
      fSendDrops, fMulticast, fCollisions, fLengthErrors, fOverErrors, fCrcErrors, fFrameErrors, fReceiveFifoErrors,
      fMissedErrors, fAbortedErrors, fCarrierErrors, fSendFifoErrors, fHeartbeatErrors, fWindowErrors;
};

// A network interface ("link") of the kernel, as rtnetlink or sysfs describes it.
struct TLink {
  template <class T>
  using TValue = TFinding<T>;

  std::string fName;
  TValue<std::uint32_t> fIndex = WhyAbsent();
  TValue<std::uint16_t> fType = WhyAbsent();      // ARPHRD_ETHER, …
  TValue<std::uint32_t> fFlags = WhyAbsent();     // IFF_UP, …
  TValue<std::uint8_t> fOperState = WhyAbsent();  // IF_OPER_UP, …
  TValue<bool> fHasCarrier = WhyAbsent();
  TValue<std::string> fAddress = WhyAbsent();  // addresses: hexadecimal digits, two per byte
  TValue<std::string> fBroadcast = WhyAbsent();
  TValue<std::string> fPermanentAddress = WhyAbsent();
  TValue<std::uint32_t> fMtu = WhyAbsent();  // bytes
  TValue<std::uint32_t> fMinMtu = WhyAbsent();
  TValue<std::uint32_t> fMaxMtu = WhyAbsent();
  TValue<std::string> fQueueDiscipline = WhyAbsent();
  TValue<std::uint32_t> fQueueLength = WhyAbsent();
  TValue<std::uint32_t> fSendQueues = WhyAbsent();
  TValue<std::uint32_t> fReceiveQueues = WhyAbsent();
  TValue<std::uint32_t> fPromiscuity = WhyAbsent();
  TValue<std::uint32_t> fGroup = WhyAbsent();
  TValue<std::uint8_t> fLinkMode = WhyAbsent();
  TValue<std::uint32_t> fCarrierChanges = WhyAbsent();
  TValue<std::string> fAlias = WhyAbsent();
  std::vector<std::string> fOtherNames;
  TValue<std::string> fKind = WhyAbsent();            // "bond", "vlan", …
  TValue<std::uint32_t> fMaster = WhyAbsent();        // the index of the bond or bridge that it is a member of
  TValue<std::uint32_t> fLower = WhyAbsent();         // the index of the interface below, in this network namespace
  TValue<std::string> fParentBus = WhyAbsent();       // "pci"
  TValue<std::string> fParentDevice = WhyAbsent();    // "0000:00:03.0"
  TValue<std::string> fPhysicalPort = WhyAbsent();    // "p0": the name of the port on its device
  TValue<std::uint16_t> fVlanId = WhyAbsent();        // of a VLAN interface
  TValue<std::uint16_t> fVlanProtocol = WhyAbsent();  // 0x8100 or 0x88a8
  TValue<std::uint32_t> fVlanFlags = WhyAbsent();
  TValue<TLinkCounters> fCounters = WhyAbsent();
  bool fIsInSysfs = false;  // /sys/class/net describes this interface, and not one of another network namespace

  bool IsKind(char const* kind) const { return fKind && *fKind == kind; }

  static TMissing WhyAbsent() { return {kMissingNotGiven, "the kernel does not report it"}; }
};

// The interfaces of a machine, and where their values come from.
struct TLinks {
  std::string fSource;
  std::vector<TLink> fAll;             // in the kernel's order: by index
  std::optional<TMissing> fWhyNotAll;  // why there are no interfaces, or not all

  TLink const* WithIndex(TFinding<std::uint32_t> const& index) const;

  // The name of the interface with this index; missing if there is none.
  TFinding<std::string> NameOf(TFinding<std::uint32_t> const& index) const;
};

// The interfaces in an answer to RTM_GETLINK. At most 1,000; of several with the same name, the first.
TLinks LinksIn(std::string const& dump);

// The interfaces below /sys/class/net, for a machine that refuses rtnetlink. Values that only rtnetlink reports are missing.
TLinks LinksInSysfs(TMachineFiles const& files, TMissing const& whyNotNetlink);

// The interfaces, from the answer "netlink/links" or, if it is missing, from sysfs.
TLinks LinksOf(TMachineFiles const& files);

// The files of an interface below /sys/class/net. All are missing if sysfs describes another network namespace.
class TLinkFiles {
public:
  // Keeps a reference to `files`.
  TLinkFiles(TMachineFiles const& files, TLink const& link)
      : fFiles(files), fDirectory("/sys/class/net/" + link.fName + "/"), fIsThere(link.fIsInSysfs) {}

  // The first line of the file; `name` is relative to the interface's directory: "bonding/mode".
  TFinding<std::string> Line(std::string const& name) const { return fIsThere ? fFiles.Line(fDirectory + name) : WhyAbsent(); }

  template <class T>
  TFinding<T> Number(std::string const& name) const {
    return fIsThere ? fFiles.Number<T>(fDirectory + name) : WhyAbsent();
  }

  // The first word of each of these files in the directory, as "arp_validate: none". A file that this kernel lacks is left out;
  // missing if the kernel lacks all of them.
  template <std::size_t N>
  TFinding<std::vector<std::string>> Settings(std::string const& directory, char const* const (&names)[N]) const {
    std::vector<std::string> settings;
    for (char const* const name : names)
      if (auto const line = Line(directory + "/" + name)) settings.push_back(name + (": " + line->substr(0, line->find(' '))));
    if (settings.empty()) return Line(directory + "/" + names[0]).Why();
    return settings;
  }

private:
  static TMissing WhyAbsent() { return {kMissingUnreadable, "/sys/class/net does not describe this network namespace"}; }

  TMachineFiles const& fFiles;
  std::string fDirectory;
  bool fIsThere;
};

// Two hexadecimal digits for each byte. Missing for no bytes, and for zeros only.
TFinding<std::string> AddressText(std::string_view bytes);

}  // namespace NQRVZEP20
