// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TextReader.h"

#include <cstring>

#include "pemaro/Status.h"
#include "values/TextScan.h"

namespace pemaro {

int findValueType(const std::string& token) {
    return scalarType(token);
}

int removeWhitesSpaces(std::string& text) {
    text = std::string(trimSpaces(text));
    return STATUS_NO_ERROR;
}

int findKey(const char* from, char** colon, std::string& key) {
    FoundKey found;
    if (!findKey(from, from + strlen(from), found)) {
        logMissingKey();
        return STATUS_INVALID_FORMAT;
    }
    *colon = const_cast<char*>(found.colon);
    key = found.key;
    return STATUS_NO_ERROR;
}

}  // namespace pemaro
