#ifndef ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H
#define ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H

#include <string>

#include "types/Diagnostics.h"

namespace orzavs_test {

// Records every line the library prints (its diagnostic sink, from any thread), each followed by
// a newline: the text the default sink would have written to standard output. Installed from
// construction until text() or the destructor, which put the default sink back; only one may be
// active at a time. Lines are delivered one at a time, and none after the sink was put back.
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
