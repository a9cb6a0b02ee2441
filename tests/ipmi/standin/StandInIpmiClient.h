// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

// The settings of the stand-in for libipmiClient.so. The stand-in records each call in the core library's log and behaves as
// set here.
struct TStandInIpmiClient {
  int fOpenResult = 0;
  int fSendResult = 0;
  std::string fResponse;          // the response that SendIpmiCommand writes
  int fResponseLength = -1;       // the length that it reports; -1: the true length
  int fThrownByOpen = 0;          // an integer that OpenConnection throws; 0: none
  std::function<void()> fAtOpen;  // called by OpenConnection
};

extern "C" TStandInIpmiClient* StandInIpmiClient();
