// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The settings of a stand-in for libcurl, and the record of its calls. The test owns it.
struct TCurlRecord {
  // Settings:
  bool givesNoHandle = false;
  int refusedOption = 0;            // the option that cannot be set; 0: none
  int result = 0;                   // the result of perform
  std::string errorText;            // the text that perform leaves in the error buffer
  std::vector<std::string> chunks;  // perform passes them to the write callback one by one, until it refuses one
  std::string fileToWatch;          // the file whose size is recorded after each chunk

  // The calls, in order: "global_init 3", "setopt UPLOAD 1", "perform", "write 5", "unload" and so on.
  std::vector<std::string> calls;
  std::string errorTextAtStart;  // the contents of the error buffer when perform is called
  std::string uploaded;          // the data that perform read from READDATA
};

using TUseRecord = void(TCurlRecord*);  // the function "StandInUse" of the stand-in

}  // namespace NQRVZEP20
