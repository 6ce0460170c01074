#include "engine/TovraStateEngineFacade.h"

#include "engine/TovraStateEngine.h"

namespace Tovra {

TovraStateEngineFacade::TovraStateEngineFacade(EventDelegateBase* eventDelegate)
    : eventDelegate_(eventDelegate) {
  engine_ = new TovraStateEngine();
  engine_->setEventDelegate(eventDelegate_);
}

TovraStateEngineFacade::~TovraStateEngineFacade() {
  delete engine_;
  engine_ = nullptr;
}

void TovraStateEngineFacade::getCameraResRequirement(CameraResRequirement& out) {
  if (engine_ != nullptr) engine_->getCameraResRequirement(out);
}

void TovraStateEngineFacade::startEngine() {
  if (engine_ != nullptr) engine_->startEngine();
}

void TovraStateEngineFacade::stopEngine() {
  if (engine_ != nullptr) engine_->stopEngine();
}

void TovraStateEngineFacade::pauseEngine() {
  if (engine_ != nullptr) engine_->pauseEngine();
}

void TovraStateEngineFacade::resumeEngine() {
  if (engine_ != nullptr) engine_->resumeEngine();
}

void TovraStateEngineFacade::addObjectModule(ObjectModuleID id,
                                             Server::ServerDelegate* serverDelegate) {
  if (engine_ != nullptr) engine_->addObjectModule(id, serverDelegate);
}

void TovraStateEngineFacade::addObjectModule(ObjectModuleID id,
                                             Server::ServerDelegate* serverDelegate,
                                             const std::string& props) {
  (void)props;  // module properties are not read in this build
  if (engine_ != nullptr) engine_->addObjectModule(id, serverDelegate);
}

void TovraStateEngineFacade::addObjectModule(ObjectModuleID id,
                                             const std::map<std::string, std::string>& props) {
  (void)id, (void)props;  // a module without a transport: nothing to add in this build
}

void TovraStateEngineFacade::requestImageBuffer(OrzaVSMobile::ImageBuffer& buffer,
                                                std::string& frameKey) {
  if (engine_ != nullptr) engine_->requestImageBuffer(buffer, frameKey);
}

void TovraStateEngineFacade::process(OrzaVSMobile::ImageBuffer& image,
                                     OrzaVSMobile::ExtraFrameData& extra) {
  if (engine_ != nullptr) engine_->process(std::string(), image, extra);
}

void TovraStateEngineFacade::process(const std::string& frameKey,
                                     OrzaVSMobile::ImageBuffer& image,
                                     OrzaVSMobile::ExtraFrameData& extra) {
  if (engine_ != nullptr) engine_->process(frameKey, image, extra);
}

void TovraStateEngineFacade::processSingleImage(OrzaVSMobile::ImageBuffer& image,
                                                OrzaVSMobile::ExtraFrameData& extra) {
  if (engine_ != nullptr) engine_->processSingleImage(image, extra);
}

// The operations below are part of the interface (the binding exposes them) and are accepted
// in any state without effect: this build has no properties, metrics, event log, or modules
// other than the visual search job, and single-image processing is always available.

void TovraStateEngineFacade::readProps(const std::string& props) { (void)props; }

void TovraStateEngineFacade::enableSingleImageMode() {}

void TovraStateEngineFacade::disableSingleImageMode() {}

void TovraStateEngineFacade::readObjectModuleProps(ObjectModuleID id, const std::string& props) {
  (void)id, (void)props;
}

void TovraStateEngineFacade::readObjectModuleProps(
    const std::map<std::string, std::string>& props) {
  (void)props;
}

void TovraStateEngineFacade::removeObjectModule(ObjectModuleID id) { (void)id; }

void TovraStateEngineFacade::removeAllObjectModules() {}

void TovraStateEngineFacade::getAndClearMetrics(std::map<std::string, uint32_t>& counts,
                                                std::map<std::string, double>& values) {
  (void)counts, (void)values;  // both maps are left exactly as passed
}

void TovraStateEngineFacade::enableEventLogging() {}

void TovraStateEngineFacade::saveEventLog(const std::string& path) { (void)path; }

}  // namespace Tovra
