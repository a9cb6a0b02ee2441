#pragma once

#include <functional>
#include <string>

// The stand-in for libipmiClient.so: writes each call into the log, between the library's own lines, and does what it is
// told.
struct TStandInIpmiClient {
  int openResult = 0;
  int sendResult = 0;
  std::string response;          // what SendIpmiCommand writes
  int responseLength = -1;       // what it says that it wrote; -1: the truth
  int thrownByOpen = 0;          // an integer that OpenConnection throws; 0: none
  std::function<void()> atOpen;  // called by OpenConnection
};

extern "C" TStandInIpmiClient* StandInIpmiClient();
