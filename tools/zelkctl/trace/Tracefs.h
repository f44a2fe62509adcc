/* SPDX-License-Identifier: Apache-2.0 */
#pragma once

#include <event-parse.h>

/*
 * What is needed of libtracefs. Its header cannot be compiled as C++: an inline function of it passes an int
 * for an enumeration.
 */

#ifdef __cplusplus
extern "C" {
#endif

struct tracefs_instance;

/* Where tracefs is mounted, or null where it is not. Mounts nothing, and prints nothing. */
const char* tracefsFolder(void);

/* What the kernel tells of the events of a group. Null when it cannot be read. */
struct tep_handle* tracefsFormats(const char* group);

/* Makes instances/NAME. Null when that fails, with errno. */
struct tracefs_instance* tracefsInstance(const char* name);

/* Frees the memory, and leaves the instance as it is. */
void tracefsFree(struct tracefs_instance* instance);

/* Calls `take` for all records that are there now. It may return 0 alone. */
int tracefsRead(struct tep_handle* formats, struct tracefs_instance* instance,
                int (*take)(struct tep_event*, struct tep_record*, int cpu, void* context),
                void* context);

#ifdef __cplusplus
}
#endif
