#include "support/StdoutCapture.h"

#include "types/Diagnostics.h"

namespace orzavs_test {

StdoutCapture::StdoutCapture() { OrzaVSMobile::setDiagnosticSink(&StdoutCapture::record, this); }

StdoutCapture::~StdoutCapture() { text(); }

void StdoutCapture::record(void* self, const char* line) {
  // Lines are delivered one at a time, and none after text() has put the default sink back.
  std::string& text = static_cast<StdoutCapture*>(self)->text_;
  text += line;
  text += '\n';
}

const std::string& StdoutCapture::text() {
  if (active_) {
    OrzaVSMobile::setDiagnosticSink(nullptr, nullptr);
    active_ = false;
  }
  return text_;
}

int countLines(const std::string& text, const std::string& line) {
  int count = 0;
  size_t start = 0;
  while (start < text.size()) {
    size_t end = text.find('\n', start);
    if (end == std::string::npos) end = text.size();
    if (text.compare(start, end - start, line) == 0 && end - start == line.size()) ++count;
    start = end + 1;
  }
  return count;
}

}  // namespace orzavs_test
