#ifndef ORZAVS_TESTS_SUPPORT_DIAGNOSTICSRECORDER_H
#define ORZAVS_TESTS_SUPPORT_DIAGNOSTICSRECORDER_H

#include <string>

#include "types/Diagnostics.h"

namespace orzavs_test {

// Takes the library's diagnostic sink: records every line (from any thread) plus the newline the
// default sink would print, from construction until text() or destruction; one at a time.
class DiagnosticsRecorder {
 public:
  DiagnosticsRecorder() {
    OrzaVSMobile::setDiagnosticSink([](void* self, const char* line) {
      static_cast<DiagnosticsRecorder*>(self)->text_.append(line).push_back('\n');
    }, this);
  }
  ~DiagnosticsRecorder() { text(); }
  DiagnosticsRecorder(const DiagnosticsRecorder&) = delete;
  DiagnosticsRecorder& operator=(const DiagnosticsRecorder&) = delete;

  // Gives the sink back to the default one and returns the lines recorded; later calls return
  // the same text.
  const std::string& text() {
    OrzaVSMobile::setDiagnosticSink(nullptr, nullptr);
    return text_;
  }

 private:
  std::string text_;
};

}  // namespace orzavs_test

#endif
