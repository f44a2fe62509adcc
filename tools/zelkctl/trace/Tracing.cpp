// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/Tracing.h"

#include <android-base/file.h>
#include <fmt/core.h>
#include <signal.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <sstream>
#include <system_error>
#include <utility>

#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/trace/EventDecoder.h"

namespace pemaro::zelkctl {
namespace {

/// Followed by the process.
constexpr const char* kInstance = "zelkctl-";

std::string readFile(const std::string& path) {
    std::string text;
    android::base::ReadFileToString(path, &text);
    return text;
}

bool isThere(const std::string& path) {
    return access(path.c_str(), F_OK) == 0;
}

/// Of processes that have ended, and could not remove them.
void removeLeftOvers(const std::string& instances) {
    std::error_code ignored;
    for (const auto& entry : std::filesystem::directory_iterator(instances, ignored)) {
        const std::string name = entry.path().filename();
        int process = 0;
        if (sscanf(name.c_str(), (kInstance + std::string("%d")).c_str(), &process) == 1 &&
            kill(process, 0) != 0 && errno == ESRCH) {
            rmdir(entry.path().c_str());
        }
    }
}

}  // namespace

std::string tracingProblem() {
    if (readFile("/proc/filesystems").find("\ttracefs\n") == std::string::npos) {
        return "this kernel has no tracefs: it was built without CONFIG_FTRACE and "
               "CONFIG_EVENT_TRACING";
    }
    const char* mounted = tracefsFolder();
    if (mounted == nullptr) {
        return "tracefs is not mounted; as root: mount -t tracefs tracefs /sys/kernel/tracing";
    }
    const std::string folder = mounted;
    if (access((folder + "/instances").c_str(), W_OK | X_OK) != 0) {
        return fmt::format(
                "{}/instances: {}{}", folder, strerror(errno),
                errno == EACCES || errno == EPERM ? "; tracing takes root's rights" : "");
    }
    const std::string events = folder + "/events/" + kBinderEvents;
    if (!isThere(events)) {
        return fmt::format(
                "{} is not there: the Binder driver of this kernel has no trace events, or was "
                "built without CONFIG_EVENT_TRACING",
                events);
    }
    std::vector<std::string> missing;
    for (const std::string& event : readEvents()) {
        if (!isThere(fmt::format("{}/{}", events, event))) {
            missing.push_back(event);
        }
    }
    return missing.empty() ? ""
                           : fmt::format(
                                     "{} lacks {}: this kernel's Binder driver is not told by "
                                     "these events",
                                     events, joined(missing));
}

std::unique_ptr<Tracing> Tracing::start(std::string* problem) {
    const std::string top = tracefsFolder();
    removeLeftOvers(top + "/instances");
    tep_handle* formats = tracefsFormats(kBinderEvents);
    if (formats == nullptr) {
        *problem = fmt::format("cannot read what {}/events/{} tells of the events", top,
                               kBinderEvents);
        return nullptr;
    }
    const std::string name = kInstance + std::to_string(getpid());
    const std::string folder = fmt::format("{}/instances/{}", top, name);
    tracefs_instance* instance = tracefsInstance(name.c_str());
    if (instance == nullptr) {
        *problem = fmt::format("cannot make {}: {}", folder, strerror(errno));
        tep_free(formats);
        return nullptr;
    }
    std::unique_ptr<Tracing> tracing(new Tracing(instance, formats, folder));
    return tracing->enable(problem) ? std::move(tracing) : nullptr;
}

Tracing::Tracing(tracefs_instance* instance, tep_handle* formats, std::string folder)
        : mInstance(instance), mFormats(formats), mFolder(std::move(folder)) {}

Tracing::~Tracing() {
    remove();
    tracefsFree(mInstance);
    tep_free(mFormats);
}

bool Tracing::enable(std::string* problem) {
    const std::string events = fmt::format("events/{}/", kBinderEvents);
    // All events begin together. The clock is that of our own lookups, and one for all processors. Of what
    // the driver returns, most is of no interest here, and a lot.
    std::vector<std::pair<std::string, std::string>> settings = {
            {"tracing_on", "0"},
            {"trace_clock", "mono"},
            {events + "binder_return/filter", returnFilter()}};
    for (const std::string& event : readEvents()) {
        settings.emplace_back(events + event + "/enable", "1");
    }
    settings.emplace_back("tracing_on", "1");
    for (const auto& [file, value] : settings) {
        const std::string path = mFolder + "/" + file;
        if (!android::base::WriteStringToFile(value, path)) {
            *problem = fmt::format("cannot write '{}' to {}: {}", value, path, strerror(errno));
            return false;
        }
    }
    return true;
}

void Tracing::read(std::vector<BinderEvent>* events) {
    mEvents = events;
    tracefsRead(mFormats, mInstance, takeRecord, this);
}

int Tracing::takeRecord(tep_event* event, tep_record* record, int /*cpu*/, void* context) {
    BinderEvent decoded;
    if (decodeEvent(*event, *record, &decoded)) {
        static_cast<Tracing*>(context)->mEvents->push_back(decoded);
    }
    return 0;
}

uint64_t Tracing::lost() const {
    uint64_t count = 0;
    const long processors = sysconf(_SC_NPROCESSORS_CONF);
    for (long i = 0; i < processors; ++i) {
        std::istringstream stats(readFile(fmt::format("{}/per_cpu/cpu{}/stats", mFolder, i)));
        for (std::string line; std::getline(stats, line);) {
            unsigned long long number = 0;
            if (sscanf(line.c_str(), "overrun: %llu", &number) == 1 ||
                sscanf(line.c_str(), "dropped events: %llu", &number) == 1) {
                count += number;
            }
        }
    }
    return count;
}

std::string Tracing::nameOfThread(int thread) {
    // It is that of the whole tracing.
    std::istringstream names(readFile(std::string(tracefsFolder()) + "/saved_cmdlines"));
    for (std::string line; std::getline(names, line);) {
        const size_t space = line.find(' ');
        if (space != std::string::npos && atoi(line.c_str()) == thread) {
            return line.substr(space + 1);
        }
    }
    return "";
}

void Tracing::remove() const {
    // Its events are switched off along with it.
    rmdir(mFolder.c_str());
}

}  // namespace pemaro::zelkctl
