#ifndef ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H
#define ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H

#include <string>

namespace orzavs_test {

// Captures everything written to standard output (file descriptor 1, so puts/printf from any
// thread included) between construction and text(). Only one capture may be active at a time
// in a process; the destructor ends a capture that text() did not collect.
class StdoutCapture {
 public:
  StdoutCapture();
  ~StdoutCapture();
  StdoutCapture(const StdoutCapture&) = delete;
  StdoutCapture& operator=(const StdoutCapture&) = delete;

  // Ends the capture (flushing stdio first) and returns what was written. Later calls return
  // the same text.
  const std::string& text();

 private:
  bool active_ = true;
  std::string text_;
};

// Number of times `line` (without its newline) occurs as a whole line of `text`.
int countLines(const std::string& text, const std::string& line);

}  // namespace orzavs_test

#endif
