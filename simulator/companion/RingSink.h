// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <utility>

#include "pemaro/RingWriter.h"
#include "simulator/companion/FrameSink.h"

namespace pemaro::simulator {

/// A recording into the memory that the client maps.
class RingSink : public FrameSink {
  public:
    explicit RingSink(std::unique_ptr<RingWriter> writer) : mWriter(std::move(writer)) {}

    const android::sp<android::IMemory>& memory() const { return mWriter->memory(); }

    bool put(const void* frame, size_t length) override { return mWriter->put(frame, length); }

    bool remind() override { return mWriter->remind(); }

  private:
    const std::unique_ptr<RingWriter> mWriter;
};

}  // namespace pemaro::simulator
