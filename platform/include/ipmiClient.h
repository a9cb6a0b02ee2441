// SPDX-License-Identifier: Apache-2.0
#ifndef ZEP_PLATFORM_IPMI_CLIENT_H
#define ZEP_PLATFORM_IPMI_CLIENT_H

/*
 * The IPMI client library, libipmiClient.so. The core loads it at run time by OpenConnection, SendIpmiCommand and
 * CloseConnection and never links it.
 *
 * It holds at most one session, which belongs to the whole process: use it from one thread at a time.
 *
 * Answers may take 3 s, and the network may lose, duplicate and reorder packets. An unanswered request is
 * sent again: the first query of all every 0.5 s, the other steps of opening a session after 3.5 s and then every second, a
 * command every 3.5 s. When the first query took longer to be answered, each later wait is at least a second longer than
 * that. Every call blocks until it is done:
 *
 *   OpenConnection   the time that the system needs to find the host's address, then at most 60 s. A silent address is given
 *                    up after 7 s, and the host's next one is tried; a closed port is given up immediately. If a session is
 *                    open, the time of CloseConnection is added
 *   SendIpmiCommand  at most 30 s; a silent controller is given up after 21 s. If the session has to be reopened first, the
 *                    times of CloseConnection and OpenConnection are added; after kIpmiClientFail, that of CloseConnection
 *   CloseConnection  at most 1.5 s
 */

#ifdef __cplusplus
extern "C" {
#endif

/* The results of the functions. Other libraries may have other numbers; in each, 0 is success. */
enum {
  kIpmiClientOk = 0,
  kIpmiClientWrongPassword = 1,   /* with IPMI 1.5 also a controller that is silent when the password is checked */
  kIpmiClientUnknownUser = 2,     /* or one that is disabled */
  kIpmiClientNoAnswer = 3,        /* the controller is silent, or its port is closed; see SendIpmiCommand */
  kIpmiClientHostUnknown = 4,     /* the host name has no address */
  kIpmiClientUnreachable = 5,     /* the system cannot send there */
  kIpmiClientBusy = 6,            /* the controller has no session left */
  kIpmiClientRefused = 7,         /* the account may not be administrator, or no cipher suite is in common */
  kIpmiClientBadArgument = 8,     /* an argument that cannot be used; a user name, password or request that is too long */
  kIpmiClientNoSession = 9,       /* nothing is open */
  kIpmiClientCompletionCode = 10, /* the controller answered that it did not carry the command out */
  kIpmiClientOutOfMemory = 11,
  kIpmiClientFail = 12 /* anything else, such as invalid answers (an echo of the packets sent, for example) */
};

enum {
  kIpmiClientLan = 3,           /* the mode of a connection over the LAN; there is no other */
  kIpmiClientResponseSize = 256 /* the least size of a response buffer */
};

/*
 * Opens a session with the controller at `host` (a name or an address) and the UDP port `port`, as administrator. An
 * open session is closed first, even if opening then fails. The session uses IPMI 2.0, or 1.5 if the controller supports
 * only that.
 */
int OpenConnection(int mode, char const* host, char const* port, char const* user, char const* password);

/*
 * Sends one command to the controller and waits for its answer. `response`: at least kIpmiClientResponseSize bytes;
 * `responseLength` receives the number of bytes written there, the answer's data without the completion code. When
 * the controller refuses the command, `completionCode` receives the reason and kIpmiClientCompletionCode is returned.
 *
 * A command that is refused because the session lacks the privilege is sent once more after the privilege was requested
 * again; with some controllers a late copy of a packet takes it away.
 *
 * A session without an answer for 20 s is reopened before the command is sent, because controllers close idle ones. An
 * unanswered command is sent again within the session and with the same request number, which shows the controller
 * that it is the same command; it is never sent in a second session. When the call ends without an answer
 * (kIpmiClientNoAnswer) or with kIpmiClientFail, the controller may or may not have carried the command out; the session is
 * abandoned, and the next command opens another.
 */
int SendIpmiCommand(unsigned char command, unsigned char const* request, int requestLength, unsigned char* response,
                    unsigned short* responseLength, unsigned char* completionCode, unsigned char netFn);

/* Closes the session, if there is one. Returns 0. */
int CloseConnection(void);

#ifdef __cplusplus
}
#endif

#endif
