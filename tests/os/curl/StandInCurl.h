// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20 {

// What a stand-in for libcurl is to do, and what it was asked for. It belongs to the test.
struct TCurlRecord {
  // To do:
  bool givesNoHandle = false;
  int refusedOption = 0;            // whose setting fails; 0: none
  int result = 0;                   // of perform
  std::string errorText;            // that perform leaves in the error buffer
  std::vector<std::string> chunks;  // that perform hands to the write callback, one after the other, until it refuses one
  std::string fileToWatch;          // whose size is written down after each chunk

  // Asked for, in order: "global_init 3", "setopt UPLOAD 1", "perform", "write 5", "unload" and so on.
  std::vector<std::string> calls;
  std::string errorTextAtStart;  // of perform
  std::string uploaded;          // what perform read from READDATA
};

using TUseRecord = void(TCurlRecord*);  // the function "StandInUse" of the stand-in

}  // namespace NQRVZEP20
