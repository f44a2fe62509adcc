// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/HandRecord.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {

// Gestures and events of hands by their numbers, or by their names with - for each space, in any case.
// Nothing for what is neither; an unknown number of a gesture may be one of the user's.

std::optional<int> gestureOf(const std::string& text);
std::optional<simulator::HandEvent> handEventOf(const std::string& text);

/// All names, with commas between.
std::string gestureWords();
std::string handEventWords();

/// The names of the events of hands, as they are typed.
std::vector<std::string> handEventNames();

/// Which events are wanted: those that are all that is told here.
struct EventFilter {
    std::optional<int> gesture;
    std::optional<int> feature;
    std::optional<simulator::HandEvent> event;

    bool isEmpty() const { return !gesture && !feature && !event; }
};

/// The record of an event, read if it is of a kind that docs/simulator.md describes: what is in a record
/// is a matter between the service and its users.
class EventRecord {
  public:
    /// A copy of it; null stands for an event without a record.
    static EventRecord read(const void* record, size_t size);

    bool isKnown() const { return mGesture != nullptr || mHand != nullptr; }

    /// What happened, in words:
    ///
    ///     #17  circle (gesture 5, feature 2)  540, 500 to 560, 510 in 812 ms  woke the device
    ///     #3  enrollment progress, 40 %
    ///
    /// REQUIRES: isKnown().
    std::string words() const;

    /// The same as members. With `stroke`, the points of a gesture as well.
    void describe(JsonObject& object, bool stroke) const;

    /// Whether it is wanted. Of an unknown record nothing is known, so that it passes no filter.
    bool passes(const EventFilter& filter) const;

    /// What happened to a hand; nothing for other events.
    std::optional<simulator::HandEvent> handEvent() const;

    /// A gesture's stroke, in lines; nothing for other events.
    std::vector<std::string> drawing(bool unicode) const;

  private:
    std::shared_ptr<const simulator::GestureRecord> mGesture;
    std::shared_ptr<const simulator::HandRecord> mHand;
};

}  // namespace pemaro::zelkctl
