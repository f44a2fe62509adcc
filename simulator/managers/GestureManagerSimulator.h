// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <map>
#include <vector>

#include "pemaro/BnGestureManagerService.h"
#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/ManagerSimulator.h"
#include "simulator/managers/Stroke.h"

namespace pemaro::simulator {

using GestureManagerBase = ManagerSimulator<BnGestureManagerService, IGestureManagerClient,
                                            IGestureManagerClient::GestureData,
                                            &IGestureManagerClient::gestureCallback>;

/// A gesture manager that knows the shapes of Stroke.h, numbered from 1, and what users add to them,
/// each under the lowest free number from 9. All are enabled until told otherwise.
///
/// While detection is on, the enabled gestures are drawn and reported in turn; while it is off but
/// wake-up is on, one in four, marked as a wake-up.
///
/// A user's gesture is a number of samples, records of GestureRecord.h such as those reported. To
/// verify one is to compare it with every sample of every enabled user's gesture; the result is the
/// number of the most similar one, if it is similar to kSimilarEnough. Results are -1 otherwise.
///
/// Statuses: 0x4000001B for null records, 0x4000000D for a count below 1, 0x4000000C for a record
/// that is not intact or nothing drawn, 0x4000000A when no further gesture can be defined,
/// 0x40000019 for a number that is not there or a gesture that resembles none, 0x4000000E for the
/// deletion of a shape that the panel knows by itself. Any thread may call.
class GestureManagerSimulator : public GestureManagerBase {
  public:
    static constexpr double kSimilarEnough = 85;
    static constexpr int kFirstUserGesture = kShapes + 1;

    explicit GestureManagerSimulator(const ManagerOptions& options);

    /// The next gesture, if there is one. Its own clock calls this.
    void tick();

    /// A line for each gesture: its number, whether it is enabled, how many samples it has (none when
    /// the panel knows it by itself).
    std::vector<std::string> gestures();
    /// "detection=on" and "wakeup=off".
    std::vector<std::string> state();

    int enableWakeup() override;
    int disableWakeup() override;
    int startGestureDetection() override;
    int stopGestureDetection() override;
    int addGesture(int count, IGestureManagerClient::GestureData* samples, int& result) override;
    int deleteGesture(int gesture) override;
    int enableGesture(int gesture) override;
    int disableGesture(int gesture) override;
    int improveGestureTraining(IGestureManagerClient::GestureData* sample, int& result) override;
    int getMaxPreDefinedGesture(unsigned int& count) override;
    int getMaxUserDefinedGesture(unsigned int& count) override;

  protected:
    ~GestureManagerSimulator() override;

  private:
    struct Gesture {
        bool enabled = true;
        std::vector<Stroke> samples;  ///< none for a shape that the panel knows by itself
    };

    int change(const char* operation, bool* setting, bool on, const char* what);
    int changeGesture(const char* operation, int gesture, bool enabled);
    int store(std::vector<Stroke> samples, int* number);
    int mostSimilar(const Stroke& stroke) const;
    Stroke drawNext(int* number) const;

    std::map<int, Gesture> mGestures;
    bool mWakeup = false;
    bool mDetection = false;
    uint32_t mTicks = 0;
    uint32_t mSequence = 0;
};

}  // namespace pemaro::simulator
