#ifndef ORZAVS_ENGINE_TOVRASTATEENGINEFACADE_H
#define ORZAVS_ENGINE_TOVRASTATEENGINEFACADE_H

#include <cstdint>
#include <map>
#include <string>

#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/FrameData.h"
#include "types/Identifiers.h"
#include "types/ImageBuffer.h"

namespace Tovra {

class TovraStateEngine;

// The one object a client creates to use the engine. Typical use:
//
//   TovraStateEngineFacade facade(&myEvents);
//   facade.addObjectModule(VISUAL_SEARCH_SERVICE_MOD, &myTransport);
//   facade.startEngine();
//   for each camera frame: facade.process(image, extra);
//   facade.stopEngine();
//
// The event delegate and the server delegate belong to the client and must outlive the facade.
// Every operation may be called from any thread; they serialise on the engine's lock.
class TovraStateEngineFacade {
 public:
  explicit TovraStateEngineFacade(EventDelegateBase* eventDelegate);
  virtual ~TovraStateEngineFacade();
  TovraStateEngineFacade(const TovraStateEngineFacade&) = delete;
  TovraStateEngineFacade& operator=(const TovraStateEngineFacade&) = delete;

  // minHeight 320, maxHeight 720, in any state.
  void getCameraResRequirement(CameraResRequirement& out);

  void startEngine();
  void stopEngine();
  void pauseEngine();
  void resumeEngine();

  // Registers the transport of the visual search module (other ids are ignored). Call it
  // before startEngine().
  void addObjectModule(ObjectModuleID id, Server::ServerDelegate* serverDelegate);
  void addObjectModule(ObjectModuleID id, Server::ServerDelegate* serverDelegate,
                       const std::string& props);
  void addObjectModule(ObjectModuleID id, const std::map<std::string, std::string>& props);

  // Lends the pixel memory of a free frame record (sized from buffer.format, height and
  // widthStep) and names it with frameKey; pass the key to process() once the frame is written.
  void requestImageBuffer(OrzaVSMobile::ImageBuffer& buffer, std::string& frameKey);
  // Continuous scanning: interest points at once, server queries now and then.
  void process(OrzaVSMobile::ImageBuffer& image, OrzaVSMobile::ExtraFrameData& extra);
  void process(const std::string& frameKey, OrzaVSMobile::ImageBuffer& image,
               OrzaVSMobile::ExtraFrameData& extra);
  // One still image, synchronously: returns once the server's reply has been handled, so the
  // reply must be pushed from another thread.
  void processSingleImage(OrzaVSMobile::ImageBuffer& image, OrzaVSMobile::ExtraFrameData& extra);

  // Accepted and without effect in this build.
  void readProps(const std::string& props);
  void enableSingleImageMode();
  void disableSingleImageMode();
  void readObjectModuleProps(ObjectModuleID id, const std::string& props);
  void readObjectModuleProps(const std::map<std::string, std::string>& props);
  void removeObjectModule(ObjectModuleID id);
  void removeAllObjectModules();
  void getAndClearMetrics(std::map<std::string, uint32_t>& counts,
                          std::map<std::string, double>& values);
  void enableEventLogging();
  void saveEventLog(const std::string& path);

 private:
  TovraStateEngine* engine_ = nullptr;  // owned
  EventDelegateBase* eventDelegate_ = nullptr;  // not owned
};

}  // namespace Tovra

#endif
