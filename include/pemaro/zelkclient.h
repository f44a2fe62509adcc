// SPDX-License-Identifier: Apache-2.0
#pragma once

/// All of libzelkclient's exported headers.

#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BnTouchCompanionService.h"
#include "pemaro/BpTouchCompanionClient.h"
#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/ISerializableParams3.h"
#include "pemaro/ISerializableParams4.h"
#include "pemaro/ITouchCompanionClient.h"
#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"
#include "pemaro/ITouchCompanionService.h"
#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/SerializableValue.h"
#include "pemaro/Status.h"
#include "pemaro/TextReader.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/TouchCompanionFactory.h"
#include "pemaro/TouchCompanionSharedCblk.h"
