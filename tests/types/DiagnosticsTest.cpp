#include <gtest/gtest.h>

#include <string>

#include "exec/TovraExecutionEngine.h"
#include "types/DiagnosticOutput.h"

namespace {

TEST(Diagnostics, DefaultSinkWritesEachLineAndANewlineToStandardOutput) {
  const std::string reply(300, 'x');  // past the formatting buffer of short lines
  testing::internal::CaptureStdout();
  Tovra::TovraExecutionEngine none(0);
  OrzaVSMobile::reportLinef("VSS SERVER ERROR: response: %s", reply.c_str());
  OrzaVSMobile::reportLinef("Skipped input frame: invalid image size %dx%d", -1, 0);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Initialized TovraExecutionEngine with invalid number of threads\n"
            "VSS SERVER ERROR: response: " + reply + "\n"
            "Skipped input frame: invalid image size -1x0\n");
}

}  // namespace
