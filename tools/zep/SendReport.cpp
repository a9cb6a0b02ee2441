#include "SendReport.h"

#include "TOSSpecific.h"
#include "TScratchDirectory.h"
#include "TZEPException.h"
#include "Text.h"

#include <cerrno>
#include <fstream>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

void WriteReport(TReport const& report, std::string const& file) {
  std::ofstream stream(file);
  stream << ReportAsJson(report);
  stream.close();
  if (!stream) throw std::system_error(errno, std::generic_category(), file);
}

// The file that gzip makes of this one; the file itself when it makes none.
std::string Packed(std::string const& file) {
  std::string complaints;
  try {
    if (TOSSpecific::SpawnProcess("gzip", {"-n", file}, complaints, -1) == 0) return file + ".gz";
  } catch (TZEPException const& failure) {
    complaints = failure.what();
  }
  std::cerr << "zep: the report could not be packed: " << Printable(complaints) << "\n";
  return file;
}

void KeepAndSayWhere(std::string const& file, TScratchDirectory& directory) {
  directory.Keep();
  std::cerr << "zep: the report is kept in " << Printable(file) << "\n";
}

TTransferred SendOrKeep(std::string const& file, TScratchDirectory& directory, TTarget const& target,
                        TTransferOptions const& options) {
  try {
    TTransferred const sent = SendFile(file, target, "", options);
    if (sent.fOutcome.fExit == kExitComplete) return sent;
    std::cerr << "zep: " << sent.fUrl << ": " << sent.fOutcome.fReason << "\n";
    KeepAndSayWhere(file, directory);
    return sent;
  } catch (...) {
    KeepAndSayWhere(file, directory);
    throw;
  }
}

}  // namespace

EExitStatus SendReport(TReport const& report, TTarget const& target, TTransferOptions const& options) {
  TScratchDirectory directory("zep-report");
  std::string const file = directory.Path(ReportFileName(report, ".json"));
  WriteReport(report, file);
  TTransferred const sent = SendOrKeep(Packed(file), directory, target, options);
  if (sent.fOutcome.fExit != kExitComplete) return sent.fOutcome.fExit;
  if (!options.fQuiet)
    std::cerr << "zep: sent to " << sent.fUrl << ": " << sent.fBytes << " bytes, SHA-256 " << sent.fSha256 << "\n";
  return report.fStatus;
}

}  // namespace NQRVZEP20::zep
