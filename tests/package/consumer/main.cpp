// A native client: includes only the umbrella header and links only OrzaVSMobile::orzavs.
#include <OrzaVSMobile.h>

#include <cstdio>
#include <string>
#include <vector>

namespace {

class Transport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest&) override {
    return false;  // this client never reaches a server
  }
};

// Keeps the last diagnostic line the library printed.
void keepLine(void* lastLine, const char* line) { *static_cast<std::string*>(lastLine) = line; }

}  // namespace

int main() {
  Tovra::EventDelegateBase events;
  Transport transport;
  Tovra::CameraResRequirement requirement;
  OrzaVSMobile::ImageBuffer buffer;
  const std::vector<uint8_t> pixels(64, 128);
  buffer.allocateBuffer(64);
  const int32_t filled = buffer.fillBuffer(pixels.data(), 64);
  std::string lastLine;
  OrzaVSMobile::setDiagnosticSink(&keepLine, &lastLine);
  {
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.getCameraResRequirement(requirement);
    OrzaVSMobile::ExtraFrameData extra;
    facade.process(buffer, extra);  // not started: refused with a line
  }
  OrzaVSMobile::setDiagnosticSink(nullptr, nullptr);
  std::printf("camera %d-%d, filled %d, module %s, line '%s'\n", requirement.minHeight, requirement.maxHeight,
              filled, Tovra::ObjectModuleIDNames.at(Tovra::VISUAL_SEARCH_SERVICE_MOD).c_str(), lastLine.c_str());
  return filled == 64 ? 0 : 1;
}
