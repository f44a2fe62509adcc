/* SPDX-License-Identifier: Apache-2.0 */
#include "tools/zelkctl/trace/Tracefs.h"

#include <stdlib.h>
#include <tracefs.h>

const char* tracefsFolder(void) {
    const char* folder = NULL;
    tracefs_set_loglevel(TEP_LOG_NONE);
    return tracefs_tracing_dir_is_mounted(false, &folder) > 0 ? folder : NULL;
}

static bool readHeader(struct tep_handle* formats) {
    int size = 0;
    char* const text = tracefs_instance_file_read(NULL, "events/header_page", &size);
    const bool read = text != NULL && tep_parse_header_page(formats, text, size, sizeof(long)) == 0;
    free(text);
    return read;
}

/* tracefs_local_events_system does this as well, and reads the names of all the kernel's functions besides. */
struct tep_handle* tracefsFormats(const char* group) {
    struct tep_handle* const formats = tep_alloc();
    char** const events = tracefs_system_events(tracefsFolder(), group);
    if (formats == NULL || events == NULL || !readHeader(formats)) {
        tracefs_list_free(events);
        tep_free(formats);
        return NULL;
    }
    for (char** event = events; *event != NULL; ++event) {
        int size = 0;
        char* const text = tracefs_event_file_read(NULL, group, *event, "format", &size);
        if (text != NULL) {
            tep_parse_event(formats, text, size, group);
        }
        free(text);
    }
    tracefs_list_free(events);
    return formats;
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
