/* SPDX-License-Identifier: Apache-2.0 */
#include "tools/zelkctl/trace/Tracefs.h"

#include <tracefs.h>

const char* tracefsFolder(void) {
    const char* folder = NULL;
    tracefs_set_loglevel(TEP_LOG_NONE);
    return tracefs_tracing_dir_is_mounted(false, &folder) > 0 ? folder : NULL;
}

struct tep_handle* tracefsFormats(const char* group) {
    const char* const groups[] = {group, NULL};
    return tracefs_local_events_system(tracefsFolder(), groups);
}

struct tracefs_instance* tracefsInstance(const char* name) {
    return tracefs_instance_create(name);
}

void tracefsFree(struct tracefs_instance* instance) {
    tracefs_instance_free(instance);
}

int tracefsRead(struct tep_handle* formats, struct tracefs_instance* instance,
                int (*take)(struct tep_event*, struct tep_record*, int, void*), void* context) {
    return tracefs_iterate_raw_events(formats, instance, NULL, 0, take, context);
}
