// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace pemaro::zelkctl {

struct KnownInterface;

struct KnownOperation {
    const char* name;
    /// The interface of the object that a request, or a reply, hands over; null where there is none.
    const KnownInterface* handed = nullptr;
    const KnownInterface* returned = nullptr;
};

/// An interface whose operations are known by name.
struct KnownInterface {
    const char* word;                        ///< what its service is called on the command line
    const char* descriptor;                  ///< of a service, its name in the service manager too
    std::vector<KnownOperation> operations;  ///< the first has the code 1
    size_t recordBytes = 0;                  ///< what each request holds behind the token, if known

    /// The operation with this code, or null.
    const KnownOperation* find(uint32_t code) const {
        return code >= 1 && code <= operations.size() ? &operations[code - 1] : nullptr;
    }
};

/// The four services. What they and their clients hand over is reached from their operations.
const std::vector<const KnownInterface*>& knownServices();

/// The one that the command line calls so. REQUIRES: there is one.
const KnownInterface& knownService(const std::string& word);

/// The interfaces through which the managers report.
const std::vector<const KnownInterface*>& knownCallbacks();

/// What a code means: the name of an operation, of what every Binder object can be asked, or the
/// number itself.
std::string operationName(const KnownInterface& interface, uint32_t code);

}  // namespace pemaro::zelkctl
