#ifndef ZEP_PLATFORM_IPMI_CLIENT_H
#define ZEP_PLATFORM_IPMI_CLIENT_H

/*
 * The IPMI client library, libipmiClient.so. The core loads it at run time by OpenConnection, SendIpmiCommand and
 * CloseConnection and never links it.
 *
 * It holds at most one session, which belongs to the whole process: use it from one thread at a time. Every call blocks
 * until the controller has answered or has been silent for about 5 s; a command may then take as long again to open the
 * session anew, for a controller that has forgotten it is as silent.
 */

#ifdef __cplusplus
extern "C" {
#endif

/* What the functions return. Other libraries may have other numbers; 0 is success with all of them. */
enum {
  kIpmiClientOk = 0,
  kIpmiClientWrongPassword = 1,
  kIpmiClientUnknownUser = 2,     /* or one that is disabled */
  kIpmiClientNoAnswer = 3,        /* the controller is silent, or nobody listens */
  kIpmiClientHostUnknown = 4,     /* the host name has no address */
  kIpmiClientUnreachable = 5,     /* the system cannot send there */
  kIpmiClientBusy = 6,            /* the controller has no session left */
  kIpmiClientRefused = 7,         /* the account may not be administrator, or no cipher suite is in common */
  kIpmiClientBadArgument = 8,     /* an argument that cannot be used; a user name or password that is too long */
  kIpmiClientNoSession = 9,       /* nothing is open */
  kIpmiClientCompletionCode = 10, /* the controller answered that it did not carry the command out */
  kIpmiClientOutOfMemory = 11,
  kIpmiClientFail = 12 /* anything else, such as answers that make no sense */
};

enum {
  kIpmiClientLan = 3,           /* the mode of a connection over the LAN; there is no other */
  kIpmiClientResponseSize = 256 /* the least size of a response buffer */
};

/*
 * Opens a session with the controller at `host` (a name or an address) and the UDP port `port`, as administrator. A
 * session that is open is closed first, also when opening fails then. IPMI 2.0 is spoken, and 1.5 with a controller that
 * knows nothing else.
 */
int OpenConnection(int mode, const char* host, const char* port, const char* user, const char* password);

/*
 * Sends one command to the controller and waits for its answer. `response`: at least kIpmiClientResponseSize bytes;
 * `responseLength` comes back as the number of bytes written there, the answer's data without the completion code. When
 * the controller refuses the command, `completionCode` says why and kIpmiClientCompletionCode is returned. A session
 * that has expired meanwhile is opened again once, and the command sent again.
 */
int SendIpmiCommand(unsigned char command, const unsigned char* request, int requestLength, unsigned char* response,
                    unsigned short* responseLength, unsigned char* completionCode, unsigned char netFn);

/* Closes the session, if there is one. Returns 0. */
int CloseConnection(void);

#ifdef __cplusplus
}
#endif

#endif
