#ifndef ORZAVS_ENGINE_ENGINESTATE_H
#define ORZAVS_ENGINE_ENGINESTATE_H

#include <cstdint>

namespace Tovra {

// Run state of the engine. Frames are accepted only while RUNNING.
enum EngineState : int32_t {
  STOPPED = 0,
  RUNNING = 1,
  PAUSED = 2,
};

}  // namespace Tovra

#endif
