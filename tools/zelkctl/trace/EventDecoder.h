// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <event-parse.h>

#include <string>
#include <vector>

#include "tools/zelkctl/trace/BinderEvent.h"

namespace pemaro::zelkctl {

/// The group of the driver's events, and those of them that are read.
constexpr const char* kBinderEvents = "binder";
const std::vector<std::string>& readEvents();

/// Of the returns, those that stand in the place of a reply, as the kernel filters them.
std::string returnFilter();

/// Reads a record, whose layout the kernel described to `event`. False for an event that is not one of
/// those, or that lacks a field.
bool decodeEvent(tep_event& event, tep_record& record, BinderEvent* decoded);

}  // namespace pemaro::zelkctl
