// SPDX-License-Identifier: Apache-2.0
#ifndef ZEP_PLATFORM_CONTROLLER_PLUG_IN_H
#define ZEP_PLATFORM_CONTROLLER_PLUG_IN_H

/*
 * How a front end makes the provider plug-in libController.nsp.so read a remote controller, over a session of the front end,
 * instead of the controller of this machine: it passes the address of a TZepController, as a uint64, in the entry
 * kZepControllerEntry of the context of GetNamespace, at the first call. The name of the entry changes whenever the structure
 * does, so that a plug-in of another version does not misread it.
 */

#ifdef __cplusplus
extern "C" {
#endif

#define kZepControllerEntry "zep controller, time in milliseconds"

enum { kZepControllerAnswerSize = 300 };

struct TZepController {
  /* The name of the remote server, for the names of instances and of the cached sensor data. */
  char const* fName;

  /* Sends a command. `answer`, of kZepControllerAnswerSize bytes, receives the completion code and the data after it. Returns the
   * number of bytes there; 0 if there was no answer. */
  unsigned (*fSend)(unsigned char netFn, unsigned char command, unsigned char const* data, unsigned dataLength,
                    unsigned char* answer);

  /* Called after each part of a slow step. May be null. */
  void (*fProgress)(char const* step, unsigned long done, unsigned long all);

  /* No command is sent after this time. */
  unsigned fMilliseconds;
};

#ifdef __cplusplus
}
#endif

#endif
