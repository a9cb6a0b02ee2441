// SPDX-License-Identifier: Apache-2.0

// zep media: the removable media of this machine.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/media/Media.h"
#include "tools/zep/media/TMountedMedium.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TMediaArguments {
  bool fAsJson = false;
  std::string fDevice;     // to mount
  std::string fDirectory;  // to unmount
};

TJson SizeAsJson(std::uint64_t size) { return size == 0 ? TJson(nullptr) : TJson(size); }

std::string OrDash(std::string const& text) { return text.empty() ? "-" : text; }

std::string MountedAt(TMedium const& medium) {
  std::string text;
  for (std::string const& mountPoint : medium.fMountPoints) text += (text.empty() ? "" : " ") + mountPoint;
  return OrDash(text) + (medium.fIsReadOnly ? " (read-only)" : "");
}

std::string AsText(std::vector<TMedium> const& media) {
  TTable table({12, 9, 11, 11, 12, 15});
  table.Add({"Device", "Size", "Label", "File system", "Mounted at", "Description"});
  for (TMedium const& medium : media)
    table.Add({medium.fDevice, medium.fSize == 0 ? "-" : SizeText(medium.fSize), OrDash(medium.fLabel),
               OrDash(medium.fFileSystem), MountedAt(medium), OrDash(medium.fDescription)});
  return table.GetText();
}

std::string AsJson(std::vector<TMedium> const& media, EExitStatus status, std::string const& reason) {
  TJson document = DocumentHead("zep media", status, reason);
  document["labelsReadable"] = AreLabelsReadable();
  document["media"] = TJson::array();
  for (TMedium const& medium : media)
    document["media"].push_back({{"device", medium.fDevice},
                                 {"description", OrNull(medium.fDescription)},
                                 {"size", SizeAsJson(medium.fSize)},
                                 {"label", OrNull(medium.fLabel)},
                                 {"fileSystem", OrNull(medium.fFileSystem)},
                                 {"readOnly", medium.fIsReadOnly},
                                 {"mounted", !medium.fMountPoints.empty()},
                                 {"mountPoints", medium.fMountPoints}});
  return zep::AsText(document);
}

// Why the list is empty or incomplete; empty when it is complete.
std::string WhyIncomplete(std::vector<TMedium> const& media) {
  if (media.empty()) return "no removable medium was found";
  return AreLabelsReadable() ? "" : "only root can read labels and file systems";
}

int List(bool asJson) {
  std::vector<TMedium> const media = FindMedia();
  std::string const missing = WhyIncomplete(media);
  EExitStatus const status = media.empty() ? kExitNothing : missing.empty() ? kExitComplete : kExitPartial;
  if (!media.empty() || asJson) WriteOutput(asJson ? AsJson(media, status, missing) : AsText(media));
  if (!missing.empty()) std::cerr << "zep: " << missing << "\n";
  return status;
}

int Mount(std::string const& device, bool asJson) {
  TMountedMedium const medium(device);
  TJson document = DocumentHead("zep media mount", kExitComplete, "");
  document["device"] = medium.Device();
  document["mountPoint"] = medium.MountPoint();
  WriteMessage(asJson ? zep::AsText(document) : medium.Device() + " is mounted at " + medium.MountPoint() + "\n");
  return kExitComplete;
}

int Unmount(std::string const& argument, bool asJson) {
  std::string const directory = WithoutTrailingSlashes(argument);
  std::vector<std::string> const stillMountedAt = UnmountDirectory(directory);
  EExitStatus const status = stillMountedAt.empty() ? kExitComplete : kExitPartial;
  std::string const why = stillMountedAt.empty() ? "" : "the medium " + RemovalText(stillMountedAt);
  TJson document = DocumentHead("zep media umount", status, why);
  document["mountPoint"] = directory;
  document["stillMountedAt"] = stillMountedAt;
  WriteMessage(asJson ? zep::AsText(document) : directory + " is unmounted; the medium " + RemovalText(stillMountedAt) + "\n");
  return status;
}

int Media(TMediaArguments const& arguments) {
  if (!arguments.fDevice.empty()) return Mount(arguments.fDevice, arguments.fAsJson);
  if (!arguments.fDirectory.empty()) return Unmount(arguments.fDirectory, arguments.fAsJson);
  return List(arguments.fAsJson);
}

}  // namespace

TRun AddMediaArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TMediaArguments>();
  CLI::App* const list = command.add_subcommand(kListMedia, "List removable media; the default");
  CLI::App* const mount = command.add_subcommand("mount", "Mount a medium at /mnt/key, or a floppy at /mnt/floppy");
  CLI::App* const unmount = command.add_subcommand("umount", "Unmount a medium so that it can be removed");
  mount
      ->add_option("device", arguments->fDevice,
                   "The device, such as /dev/sdb; if it cannot be mounted, its first partition is tried")
      ->required();
  unmount->add_option("directory", arguments->fDirectory, "The mount point of the medium")->required();
  for (CLI::App* const each : {&command, list, mount, unmount})
    each->add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.require_subcommand(0, 1);
  command.footer(
      "The list contains USB disks, floppies and CD-ROMs with a medium, as lsblk shows them. Mounting needs root.\n"
      "The device must be a path below /dev; the directory must be below /mnt, /media or /run/media. Both may contain only\n"
      "letters, digits, \"/\", \"-\", \"_\" and \".\".\n"
      "Exit status: 0 when everything was done, 2 when labels are missing from the list or when the unmounted medium is\n"
      "still mounted elsewhere, 1 when there is no medium or the command failed, 64 for wrong usage.");
  return [arguments] { return Media(*arguments); };
}

}  // namespace NQRVZEP20::zep
