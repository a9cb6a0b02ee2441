// SPDX-License-Identifier: Apache-2.0
#ifndef ZEP_PLATFORM_SMBIOS_H
#define ZEP_PLATFORM_SMBIOS_H

/*
 * The SMBIOS access library, libsmbios.so. The core loads it at run time by smBiosLoad, smBiosGetFirst and smBiosClose
 * and never links it.
 *
 * The tables are those that the kernel exports (/sys/firmware/dmi/tables/DMI, which only root may read), or those in the file
 * that the environment variable ZEP_SMBIOS_TABLE names: a bare DMI table, or a dump as `dmidecode --dump-bin` writes it, with
 * an entry point of any form ("_SM3_", "_SM_", "_DMI_"). If only ZEP_ROOT is set, the kernel's file is the one below the
 * directory that it names. Each smBiosLoad reads the variables; the file read last is not read again while it is unchanged.
 * A table ends at its end-of-table structure (type 127), or before the first incomplete structure; no more than the first
 * 16 MiB of a file are read.
 *
 * A handle holds a copy of the tables and is used by one thread at a time; any number may be open.
 */

#ifdef __cplusplus
extern "C" {
#endif

/* The results of the functions: statuses of the core, with the core's numbers. */
enum {
  kSmbiosOk = 0,
  kSmbiosFail = 3, /* an argument that cannot be used; a file that is not a regular one or holds no table */
  kSmbiosOutOfMemory = 4,
  kSmbiosNoMoreItems = 5,      /* no structure of that type, or no further one */
  kSmbiosFileSystemError = 11, /* the tables cannot be opened or read for a reason other than the two below: see errno */
  kSmbiosFileNotFound = 26,    /* the kernel exports no tables, or the named file is missing */
  kSmbiosAccessDenied = 27     /* this user may not read the tables */
};

/* Reads the tables and sets `handle`, to null on failure. `provider` is ignored and may be null. */
int smBiosLoad(void* provider, void** handle);

/*
 * Copies the first structure of that type, string set and its double zero included, into the caller's buffer. `length`:
 * in, the buffer's size in bytes; out, the structure's. A structure that does not fit is copied in part, and `length` is
 * then larger than it was; with a size of 0 the buffer may be null. On failure the buffer and `length` do not
 * change.
 */
int smBiosGetFirst(void* handle, int type, void* buffer, int* length);

/*
 * The same for the next structure of that type after the one that smBiosGetFirst or smBiosGetNext copied last, whatever
 * its type was. On a new handle the search begins with the first structure. A search that finds nothing does not change
 * the place. The core does not use this function, and works with a libsmbios.so without it.
 */
int smBiosGetNext(void* handle, int type, void* buffer, int* length);

/* Releases the handle; null is allowed. Returns 0. */
int smBiosClose(void* handle);

#ifdef __cplusplus
}
#endif

#endif
