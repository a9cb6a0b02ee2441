// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The settings of a stand-in for libcurl, and the record of its calls. The test owns it.
struct TCurlRecord {
  // Settings:
  bool fGivesNoHandle = false;
  int fRefusedOption = 0;            // the option that cannot be set; 0: none
  int fResult = 0;                   // the result of perform
  std::string fErrorText;            // the text that perform leaves in the error buffer
  std::vector<std::string> fChunks;  // perform passes them to the write callback one by one, until it refuses one
  std::string fFileToWatch;          // the file whose size is recorded after each chunk

  // The calls, in order: "global_init 3", "setopt UPLOAD 1", "perform", "write 5", "unload" and so on.
  std::vector<std::string> fCalls;
  std::string fErrorTextAtStart;  // the contents of the error buffer when perform is called
  std::string fUploaded;          // the data that perform read from READDATA
};

using TUseRecord = void(TCurlRecord*);  // the function "StandInUse" of the stand-in

}  // namespace NQRVZEP20
