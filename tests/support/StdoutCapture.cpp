#include "support/StdoutCapture.h"

#include <gtest/gtest.h>

#include <cstdio>

namespace orzavs_test {

StdoutCapture::StdoutCapture() {
  std::fflush(stdout);
  testing::internal::CaptureStdout();
}

StdoutCapture::~StdoutCapture() { text(); }

const std::string& StdoutCapture::text() {
  if (active_) {
    std::fflush(stdout);
    text_ = testing::internal::GetCapturedStdout();
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
