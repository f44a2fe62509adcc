// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"
#include "pemaro/TouchCompanionClient.h"

namespace pemaro {

/// What the current and the older facade have in common, which is all but two operations each: a
/// client, null until init(). `Facade` is the interface, whose order of operations is not touched
/// by this.
template <typename Facade>
class TouchCompanionWrapperBase : public Facade {
  public:
    int init(TouchCompanionClient::DataCallback callback, void* context) override;
    int setRecordOutput(int output) override;
    int startRecord() override;
    int stopRecord() override;
    int getConfigParams(ISerializableParams4* params) override;
    int setConfigParams(ISerializableParams4* params) override;
    int getConfigParams(void* buffer, unsigned long* len) override;
    int setConfigParams(const void* data, unsigned long size) override;
    int getPacketSize() override;
    int inspect(unsigned int* value) override;

  protected:
    android::sp<TouchCompanionClient> mClient;
};

class TouchCompanionWrapper : public TouchCompanionWrapperBase<ITouchCompanionFacade> {
  public:
    int getClassID() override;
    int init(TouchCompanionClient::DataCallback callback, void* context) override;
    int setRecordFilter(unsigned int mask) override;
    int sendCommand(const char* command, char** result) override;
};

class TouchCompanionWrapperOld : public TouchCompanionWrapperBase<ITouchCompanionFacadeOld> {
  public:
    int getClassID() override;
    int getFormatDescription(std::string& first, std::string& second) override;
};

}  // namespace pemaro
