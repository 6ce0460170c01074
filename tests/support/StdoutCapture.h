#ifndef ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H
#define ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H

#include <string>

#include "types/Diagnostics.h"

namespace orzavs_test {

// Records every line the library prints (its diagnostic sink, any thread) plus a newline, as the
// default sink would write it, from construction until text() or destruction; one at a time.
class StdoutCapture {
 public:
  StdoutCapture() {
    OrzaVSMobile::setDiagnosticSink([](void* self, const char* line) {
      static_cast<StdoutCapture*>(self)->text_.append(line).push_back('\n');
    }, this);
  }
  ~StdoutCapture() { text(); }
  StdoutCapture(const StdoutCapture&) = delete;
  StdoutCapture& operator=(const StdoutCapture&) = delete;

  // Ends the recording and returns what was printed. Later calls return the same text.
  const std::string& text() {
    if (active_) OrzaVSMobile::setDiagnosticSink(nullptr, nullptr);
    active_ = false;
    return text_;
  }

 private:
  bool active_ = true;
  std::string text_;
};

}  // namespace orzavs_test

#endif
