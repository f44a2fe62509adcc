// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <ui/Rect.h>

#include <cstdint>
#include <optional>
#include <set>

#include "pemaro/BnTouchManagerService.h"
#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/ManagerSimulator.h"

namespace pemaro::simulator {

using TouchManagerBase =
        ManagerSimulator<BnTouchManagerService, ITouchManagerClient,
                         ITouchManagerClient::GestureData, &ITouchManagerClient::gestureCallback>;

/// A touch manager that reports gestures of the features that are enabled, in turn. The features:
///
///     1  swipes        gestures 1 to 4
///     2  circle        gesture 5
///     3  letters       gestures 6 and 7
///     4  square        gesture 8
///     5  hover         known, but not supported by this panel
///
/// All are disabled at first. The shapes are those of Stroke.h, the record that of GestureRecord.h.
/// A feature that is not supported cannot be switched (0x4000000E); other numbers are not supported
/// either. A region, while it is on, marks the gestures that lie in it and keeps none away; it must
/// not be empty (0x4000000D). Any thread may call.
class TouchManagerSimulator : public TouchManagerBase {
  public:
    explicit TouchManagerSimulator(const ManagerOptions& options);

    /// The next gesture, if there is one. Its own clock calls this.
    void tick();

    int isSupported(int feature, bool& supported) override;
    int isEnabled(int feature, bool& enabled) override;
    int enable(int feature) override;
    int disable(int feature) override;
    int configure_vm_region(android::Rect& region, bool flag) override;

  protected:
    ~TouchManagerSimulator() override;

  private:
    int change(const char* operation, int feature, bool on);
    uint32_t regionFlags(const GestureRecord& record) const;

    std::set<int> mEnabled;
    std::optional<android::Rect> mRegion;
    uint32_t mSequence = 0;
};

}  // namespace pemaro::simulator
