#ifndef ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H
#define ORZAVS_TESTS_SUPPORT_STDOUTCAPTURE_H

#include <string>

namespace orzavs_test {

// Records every line the library prints (its diagnostic sink, from any thread), each followed by
// a newline: the text the default sink would have written to standard output. Installed from
// construction until text() or the destructor, which put the default sink back; only one may be
// active at a time.
class StdoutCapture {
 public:
  StdoutCapture();
  ~StdoutCapture();
  StdoutCapture(const StdoutCapture&) = delete;
  StdoutCapture& operator=(const StdoutCapture&) = delete;

  // Ends the recording and returns what was printed. Later calls return the same text.
  const std::string& text();

 private:
  static void record(void* self, const char* line);

  bool active_ = true;
  std::string text_;
};

// Number of times `line` (without its newline) occurs as a whole line of `text`.
int countLines(const std::string& text, const std::string& line);

}  // namespace orzavs_test

#endif
