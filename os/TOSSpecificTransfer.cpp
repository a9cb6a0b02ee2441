// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "core/Failure.h"
#include "core/Handles.h"
#include "os/ProxyCheck.h"
#include "os/RemotePath.h"
#include "os/WriteContext.h"

#include <fcntl.h>
#include <netdb.h>
#include <sys/stat.h>

#include <cstdlib>
#include <iostream>

namespace NQRVZEP20 {
namespace {

constexpr char kTransfer[] = "TOSSpecific|CurlTransferFile: ";  // before the reason, in a line of the log

constexpr TCurlMessages kTransferMessages = {
    "TOSSpecific|CurlTransferFile: Error opening curl library: ", "TOSSpecific|CurlTransferFile: Error loading curl library: ",
    "TOSSpecific|CurlTransferFile: Error initalizing curl", "TOSSpecific|CurlTransferFile: Error configuring curl error buffer"};

constexpr unsigned long kRefused = 0xFFFFFFFF;  // no chunk has this length, so libcurl stops

// ---- Downloads ----

bool CanBeRead(std::string const& path) { return TUniqueFile(std::fopen(path.c_str(), "r")) != nullptr; }

// Asks until the answer is one of "y", "Y", "n" and "N". The end of the input counts as "n".
bool MayOverwrite() {
  std::cin.clear();  // an earlier end of the input does not count
  std::clearerr(stdin);
  std::string answer;
  do {
    std::cout << "Local file exists, overwrite it anyway?(y/n): " << std::flush;
    if (!std::getline(std::cin, answer)) return false;
  } while (answer != "y" && answer != "Y" && answer != "n" && answer != "N");
  return answer == "y" || answer == "Y";
}

// Whether a download may create that file: it does not exist, or was deleted with the user's consent.
bool MakeWayFor(std::string const& path) {
  if (!CanBeRead(path)) return true;
  if (!MayOverwrite()) return false;
  if (::unlink(path.c_str()) == 0) return true;
  std::cout << "Permission denied." << std::endl;
  return false;
}

// ---- Uploads ----

void CheckStatusOf(std::string const& path) {
  TUniqueFd const file(::open(path.c_str(), O_RDONLY));
  struct stat status;
  if (file && ::fstat(file.get(), &status) == 0) return;
  LogErrorAndThrow(kZEPStatusLibCurlFailure, kTransfer, "Error getting file size");
}

TUniqueFile OpenForUpload(std::string const& path) {
  CheckStatusOf(path);
  TUniqueFile stream(std::fopen(path.c_str(), "rb"));
  if (!stream) LogErrorAndThrow(kZEPStatusLibCurlFailure, kTransfer, "Error creating file stream");
  return stream;
}

// ---- Both ----

void SetUrl(TCurl& curl, std::string const& url) {
  curl.Set(CURLOPT_URL, url.c_str(), "TOSSpecific|CurlTransferFile: Error setting curl target");
}

// Also for a download: on an FTP server the missing directories are made before the file is found to be missing. Kept.
void CreateMissingDirectories(TCurl& curl) {
  curl.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 1L,
           "TOSSpecific|CurlTransferFile: Error setting curl option: CURLOPT_FTP_CREATE_MISSING_DIRS");
}

void PerformTransfer(TCurl& curl) {
  CURLcode const result = curl.Perform();
  if (result == CURLE_OK) return;
  if (result == CURLE_COULDNT_RESOLVE_HOST || result == CURLE_COULDNT_CONNECT)
    LogErrorAndThrow(kZEPStatusConnectionFailed, kTransfer, "Error connecting to Server");
  LogErrorAndThrow(kZEPStatusAccessDenied, kTransfer, std::string("Error performing command: ") + curl.ErrorText());
}

void Download(TCurl& curl, std::string const& url, std::string const& localFile) {
  if (!MakeWayFor(localFile)) return;
  TCurlWriteContext context{localFile, nullptr};
  SetWriteContext(curl, context);
  SetUrl(curl, url);
  CreateMissingDirectories(curl);
  PerformTransfer(curl);
}

// libcurl treats a failing read as the end of the file: the uploaded file ends there.
void CheckWasReadToItsEnd(std::FILE* stream) {
  if (std::ferror(stream) == 0) return;
  LogErrorAndThrow(kZEPStatusAccessDenied, kTransfer, "Error performing command: the local file cannot be read to its end");
}

void Upload(TCurl& curl, std::string const& url, TUniqueFile& stream, std::string const& localFile) {
  stream = OpenForUpload(localFile);
  curl.Set(CURLOPT_UPLOAD, 1L, "TOSSpecific|CurlTransferFile: Error setting curl upload");
  SetUrl(curl, url);
  curl.Set(CURLOPT_READDATA, stream.get(), "TOSSpecific|CurlTransferFile: Error setting curl upload file");
  CreateMissingDirectories(curl);
  PerformTransfer(curl);
  CheckWasReadToItsEnd(stream.get());
}

}  // namespace

unsigned long curl_fwrite(void* data, unsigned long size, unsigned long count, void* context) {
  auto* const write = static_cast<TCurlWriteContext*>(context);
  if (write == nullptr || write->fPath.empty()) return kRefused;
  write->fStream = std::fopen(write->fPath.c_str(), "ab");
  if (write->fStream == nullptr) return kRefused;
  std::setvbuf(write->fStream, nullptr, _IONBF,
               0);  // saves a tenth of a download's time: each chunk would get a buffer of its own
  unsigned long const written = std::fwrite(data, size, count, write->fStream);
  // Some file systems report only now that the disk is full. The complete chunk then counts as not written.
  bool const isClosed = std::fclose(write->fStream) == 0;
  write->fStream = nullptr;
  return isClosed ? written : 0;
}

void TOSSpecific::CurlTransferFile(std::string url, std::string localFile, bool download) {
  TUniqueFile stream;  // the file of an upload, open until libcurl is closed
  TCurl curl(kTransferMessages);
  curl.Set(CURLOPT_FTP_USE_EPSV, 0L, "TOSSpecific|CurlTransferFile: Error configuring curl passive mode");
  curl.Set(CURLOPT_PROXY, "", "TOSSpecific|CurlTransferFile: Error configuring curl proxy server");
  if (download)
    Download(curl, url, localFile);
  else
    Upload(curl, url, stream, localFile);
}

void TOSSpecific::FTPFile(std::string host, std::string localFile, std::string remoteName) {
  CurlTransferFile("ftp://" + host + "/" + RemotePathOf(remoteName), localFile, false);
}

void TOSSpecific::sFTPFile(std::string host, std::string localFile, std::string remoteName) {
  CurlTransferFile("sftp://" + host + "/" + RemotePathOf(remoteName), localFile, false);
}

void TOSSpecific::FTPFileFromQRV(std::string host, std::string localFile, std::string remoteName) {
  CurlTransferFile("ftp://" + host + "/" + remoteName, localFile, true);
}

void TOSSpecific::sFTPFileFromQRV(std::string host, std::string localFile, std::string remoteName) {
  CurlTransferFile("sftp://" + host + "/" + remoteName, localFile, true);
}

void TOSSpecific::UserFTPFile(std::string host, std::string localFile, std::string name) {
  std::string const remoteName = name + ".xml.gz";
  std::cout << "Remote file name = " << remoteName << std::endl;
  CurlTransferFile("ftp://" + host + "/" + remoteName, localFile, false);
}

TZEPStatusCode TOSSpecific::CheckProxySetting(std::string proxy, std::string port, std::string userAndPassword, long) {
  return CheckProxy(proxy, port, userAndPassword).fStatus;
}

int TOSSpecific::DetectHostnameAvailable(std::string hostName, std::string) {
  if (::gethostbyname(hostName.c_str()) == nullptr) {
    DebugOut("Network is unavailable.");
    return 1;
  }
  DebugOut("Network is ok.");
  return 0;  // 0 means available, despite the name. Kept.
}

}  // namespace NQRVZEP20
