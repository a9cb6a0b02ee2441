#include "SendReport.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "Text.h"

#include <stdlib.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string MakeDirectory() {
  std::string pattern = (fs::temp_directory_path() / "zep-report.XXXXXX").string();
  if (::mkdtemp(pattern.data()) == nullptr) throw std::system_error(errno, std::generic_category(), "no temporary directory");
  return pattern;
}

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

void SayWhereItIsKept(std::string const& file) { std::cerr << "zep: the report is kept in " << Printable(file) << "\n"; }

TTransferred SendOrSayWhereItIsKept(std::string const& file, TTarget const& target, TTransferOptions const& options) {
  try {
    TTransferred const sent = SendFile(file, target, "", options);
    if (sent.fOutcome.fExit == kExitComplete) return sent;
    std::cerr << "zep: " << sent.fUrl << ": " << sent.fOutcome.fReason << "\n";
    SayWhereItIsKept(file);
    return sent;
  } catch (...) {
    SayWhereItIsKept(file);
    throw;
  }
}

}  // namespace

EExitStatus SendReport(TReport const& report, TTarget const& target, TTransferOptions const& options) {
  std::string const directory = MakeDirectory(), file = directory + "/" + ReportFileName(report, ".json");
  WriteReport(report, file);
  TTransferred const sent = SendOrSayWhereItIsKept(Packed(file), target, options);
  if (sent.fOutcome.fExit != kExitComplete) return sent.fOutcome.fExit;
  if (!options.fQuiet)
    std::cerr << "zep: sent to " << sent.fUrl << ": " << sent.fBytes << " bytes, SHA-256 " << sent.fSha256 << "\n";
  std::error_code ignored;
  fs::remove_all(directory, ignored);
  return report.fStatus;
}

}  // namespace NQRVZEP20::zep
