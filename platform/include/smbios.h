#ifndef ZEP_PLATFORM_SMBIOS_H
#define ZEP_PLATFORM_SMBIOS_H

/*
 * The SMBIOS access library, libsmbios.so. The core loads it at run time by these three functions and never links it.
 *
 * Each returns a status of the core's list: 0 success, 3 failure (kZEPStatusFail), 5 no structure of that type
 * (kZEPStatusNoMoreItems). A handle is used by one thread at a time; any number may be open.
 */

#ifdef __cplusplus
extern "C" {
#endif

/* Opens the tables and hands out a handle, null on failure. `provider` is not looked at and may be null. */
int smBiosLoad(void* provider, void** handle);

/*
 * Copies the first structure of that type, string set and its double zero included, into the caller's buffer. `length`:
 * in, the buffer's size in bytes; out, the structure's. A structure that does not fit is cut to the buffer.
 */
int smBiosGetFirst(void* handle, int type, void* buffer, int* length);

/* Releases the handle; null is allowed. */
int smBiosClose(void* handle);

#ifdef __cplusplus
}
#endif

#endif
