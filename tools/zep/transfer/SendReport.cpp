// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/SendReport.h"

#include "tools/zep/output/Failure.h"
#include "tools/zep/output/ReportJson.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/transfer/Gzip.h"
#include "tools/zep/transfer/ReportFileName.h"

#include <cerrno>
#include <fstream>
#include <iostream>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

void WriteReport(TReportDocument const& document, std::string const& file) {
  std::ofstream stream(file, std::ios::binary);
  stream << Gzipped(document.Text());
  stream.close();
  if (!stream) throw std::system_error(errno, std::generic_category(), file);
}

// The result of a failure before the transfer began.
TTransferred NotBegun(std::exception const& failure) {
  TTransferred transferred;
  transferred.fOutcome = {kZEPStatusFail, StatusOf(failure), failure.what()};
  return transferred;
}

TTransferred Send(std::string const& file, TTarget const& target, TTransferOptions const& options) {
  try {
    return SendFile(file, target, "", options);
  } catch (std::exception const& failure) {
    return NotBegun(failure);
  }
}

TSentReport WriteAndSend(TReportDocument const& document, TTarget const& target, TTransferOptions const& options) {
  TScratchDirectory directory("zep-report");
  std::string const file = directory.Path(ReportFileName(document.Members(), ".json.gz"));
  WriteReport(document, file);
  TSentReport sent{Send(file, target, options), ""};
  if (sent.fTransferred.fOutcome.fExit == kExitComplete) return sent;
  directory.Keep();
  sent.fKeptIn = file;
  return sent;
}

void Tell(TSentReport const& sent, bool isQuiet) {
  TTransferred const& transferred = sent.fTransferred;
  WarnOfLeft(transferred);
  if (transferred.fOutcome.fExit == kExitComplete) {
    if (isQuiet) return;
    std::cerr << "zep: sent to " << transferred.fUrl << ": " << transferred.fBytes << " bytes, SHA-256 " << transferred.fSha256
              << "\n";
    return;
  }
  std::string const url = transferred.fUrl.empty() ? "" : transferred.fUrl + ": ";
  std::cerr << "zep: " << url << Printable(transferred.fOutcome.fReason) << "\n";
  char const* const kept = transferred.fHasArrived ? "zep: a copy of the report is kept in " : "zep: the report is kept in ";
  if (!sent.fKeptIn.empty()) std::cerr << kept << Printable(sent.fKeptIn) << "\n";
}

}  // namespace

TSentReport SendReport(TReportDocument const& document, TTarget const& target, TTransferOptions const& options) {
  TSentReport sent;
  try {
    sent = WriteAndSend(document, target, options);
  } catch (std::exception const& failure) {
    sent.fTransferred = NotBegun(failure);
  }
  Tell(sent, options.fQuiet);
  return sent;
}

std::string ReasonOf(TTransferred const& transferred) {
  return (transferred.fHasArrived ? "" : "the report was not sent: ") + transferred.fOutcome.fReason;
}

}  // namespace NQRVZEP20::zep
