#ifndef ORZAVS_ORZAVSMOBILE_H
#define ORZAVS_ORZAVSMOBILE_H

// Everything a native client of the visual search engine uses.

#include "engine/TovraStateEngineFacade.h"
#include "server/ServerDelegate.h"
#include "server/ServerRequest.h"
#include "server/ServerResponse.h"
#include "types/ByteArray.h"
#include "types/Diagnostics.h"
#include "types/EnumNames.h"
#include "types/EventDelegateBase.h"
#include "types/FrameData.h"
#include "types/Identifiers.h"
#include "types/ImageBuffer.h"
#include "types/ImageFormat.h"
#include "types/ObjectInfo.h"
#include "types/Point.h"
#include "types/ResultMetadata.h"

#endif
