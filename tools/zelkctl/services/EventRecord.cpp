// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/EventRecord.h"

#include <fmt/format.h>

#include <algorithm>
#include <cctype>

#include "simulator/Panel.h"
#include "tools/common/Number.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/StrokeDrawing.h"

namespace pemaro::zelkctl {
namespace {

using simulator::GesturePoint;
using simulator::GestureRecord;
using simulator::HandEvent;
using simulator::HandRecord;

/// How a name is typed.
std::string asWord(std::string name) {
    std::transform(name.begin(), name.end(), name.begin(), [](unsigned char character) {
        return character == ' ' ? '-' : static_cast<char>(std::tolower(character));
    });
    return name;
}

/// The names of all numbers from 1 that have one, as they are typed.
template <typename Name>
std::vector<std::string> wordsFor(Name name) {
    std::vector<std::string> words;
    for (int number = 1; *name(number) != '\0'; ++number) {
        words.push_back(asWord(name(number)));
    }
    return words;
}

const char* nameOfEvent(int number) {
    return simulator::handEventName(static_cast<HandEvent>(number));
}

/// The number of a word in a list, counted from 1, or the number that it is itself.
std::optional<int> numberOf(const std::string& text, const std::vector<std::string>& words) {
    const auto found = std::find(words.begin(), words.end(), asWord(text));
    if (found != words.end()) {
        return static_cast<int>(found - words.begin()) + 1;
    }
    const auto number = tools::parseNumber(text, {1, INT32_MAX});
    return number ? std::optional<int>(static_cast<int>(*number)) : std::nullopt;
}

std::string nameOf(const GestureRecord& record) {
    const std::string name = simulator::gestureName(record.gesture);
    return name.empty() ? "a gesture of the user's" : name;
}

std::string nameOf(const HandRecord& record) {
    const std::string name = simulator::handEventName(record.event);
    return name.empty() ? fmt::format("event {}", static_cast<uint32_t>(record.event)) : name;
}

std::string pathText(const GestureRecord& record) {
    if (record.pointCount == 0) {
        return "nothing drawn";
    }
    const GesturePoint& first = record.points[0];
    const GesturePoint& last = record.points[record.pointCount - 1];
    return fmt::format("{}, {} to {}, {} in {} ms", first.x, first.y, last.x, last.y, last.timeMs);
}

std::string wordsOf(const GestureRecord& record) {
    std::string text =
            fmt::format("#{}  {} (gesture {}", record.sequence, nameOf(record), record.gesture);
    text += record.feature == 0 ? ")" : fmt::format(", feature {})", record.feature);
    text += "  " + pathText(record);
    if ((record.flags & simulator::kGestureWakeup) != 0) {
        text += "  woke the device";
    }
    if ((record.flags & simulator::kGestureRegionOn) != 0) {
        const bool isInside = (record.flags & simulator::kGestureInsideRegion) != 0;
        text += isInside ? "  inside the region" : "  outside the region";
    }
    return text;
}

std::string wordsOf(const HandRecord& record) {
    std::string text = fmt::format("#{}  {}", record.sequence, nameOf(record));
    switch (record.event) {
        case HandEvent::kEnrollmentProgress:
            return text + fmt::format(", {} %", record.progress);
        case HandEvent::kEnrollmentDone:
            return text + fmt::format(" as {}", printable(record.profile));
        case HandEvent::kMatched:
            return text + fmt::format(" {}, score {} at security level {}",
                                      printable(record.profile), record.score, record.security);
        case HandEvent::kNotMatched:
            return text +
                   fmt::format(", score {} at security level {}", record.score, record.security);
        default:
            return text;
    }
}

void addGesture(JsonObject& object, const GestureRecord& record, bool stroke) {
    object.add("kind", "gesture").add("sequence", record.sequence);
    object.add("device_time_ns", static_cast<int64_t>(record.timeNs));
    object.add("gesture", record.gesture).add("name", nameOf(record));
    object.add("feature", record.feature);
    object.addFlag("wakeup", (record.flags & simulator::kGestureWakeup) != 0);
    object.addFlag("region", (record.flags & simulator::kGestureRegionOn) != 0);
    object.addFlag("inside", (record.flags & simulator::kGestureInsideRegion) != 0);
    object.add("points", record.pointCount);
    if (!stroke) {
        return;
    }
    JsonArray points;
    for (uint32_t i = 0; i < record.pointCount; ++i) {
        const GesturePoint& point = record.points[i];
        points.add(JsonObject()
                           .add("ms", point.timeMs)
                           .add("x", point.x)
                           .add("y", point.y)
                           .add("pressure", point.pressure)
                           .add("finger", point.finger));
    }
    object.add("stroke", points);
}

void addHand(JsonObject& object, const HandRecord& record) {
    object.add("kind", "hand").add("sequence", record.sequence);
    object.add("device_time_ns", static_cast<int64_t>(record.timeNs));
    object.add("event", static_cast<int64_t>(record.event)).add("name", nameOf(record));
    object.add("progress", record.progress).add("score", record.score);
    object.add("security", record.security).add("profile", record.profile);
}

}  // namespace

std::optional<int> gestureOf(const std::string& text) {
    return numberOf(text, wordsFor(simulator::gestureName));
}

std::optional<HandEvent> handEventOf(const std::string& text) {
    const auto number = numberOf(text, wordsFor(nameOfEvent));
    const bool isEvent = number && *nameOfEvent(*number) != '\0';
    return isEvent ? std::optional<HandEvent>(static_cast<HandEvent>(*number)) : std::nullopt;
}

std::string gestureWords() {
    return fmt::format("{}, and the user's by their numbers",
                       fmt::join(wordsFor(simulator::gestureName), ", "));
}

std::string handEventWords() {
    return fmt::format("{}", fmt::join(handEventNames(), ", "));
}

std::vector<std::string> handEventNames() {
    return wordsFor(nameOfEvent);
}

EventRecord EventRecord::read(const void* record, size_t size) {
    EventRecord event;
    if (record != nullptr && size == sizeof(GestureRecord)) {
        event.mGesture = simulator::readGestureRecord(record);
    } else if (record != nullptr && size == sizeof(HandRecord)) {
        event.mHand = simulator::readHandRecord(record);
    }
    return event;
}

std::string EventRecord::words() const {
    return mGesture != nullptr ? wordsOf(*mGesture) : wordsOf(*mHand);
}

void EventRecord::describe(JsonObject& object, bool stroke) const {
    if (mGesture != nullptr) {
        addGesture(object, *mGesture, stroke);
    } else if (mHand != nullptr) {
        addHand(object, *mHand);
    }
}

std::optional<HandEvent> EventRecord::handEvent() const {
    return mHand != nullptr ? std::optional<HandEvent>(mHand->event) : std::nullopt;
}

bool EventRecord::passes(const EventFilter& filter) const {
    const bool gesture =
            !filter.gesture || (mGesture != nullptr && mGesture->gesture == *filter.gesture);
    const bool feature =
            !filter.feature || (mGesture != nullptr && mGesture->feature == *filter.feature);
    const bool event = !filter.event || (mHand != nullptr && mHand->event == *filter.event);
    return gesture && feature && event;
}

std::vector<std::string> EventRecord::drawing(bool unicode) const {
    if (mGesture == nullptr) {
        return {};
    }
    std::vector<StrokePoint> points;
    for (uint32_t i = 0; i < mGesture->pointCount; ++i) {
        const GesturePoint& point = mGesture->points[i];
        points.push_back({point.x, point.y, point.finger});
    }
    StrokeStyle style;
    style.width = simulator::kPanelWidth;
    style.height = simulator::kPanelHeight;
    style.unicode = unicode;
    return drawStroke(points, style);
}

}  // namespace pemaro::zelkctl
