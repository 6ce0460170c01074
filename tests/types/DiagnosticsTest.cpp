#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "exec/TovraExecutionEngine.h"
#include "types/DiagnosticOutput.h"
#include "types/Diagnostics.h"

namespace {

using Lines = std::vector<std::pair<void*, std::string>>;

void recordInto(void* context, const char* line) {
  static_cast<Lines*>(context)->emplace_back(context, line);
}

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

TEST(Diagnostics, AnInstalledSinkReceivesTheLinesUntilTheDefaultIsRestored) {
  Lines lines;
  OrzaVSMobile::setDiagnosticSink(&recordInto, &lines);
  testing::internal::CaptureStdout();
  Tovra::TovraExecutionEngine none(0);
  OrzaVSMobile::setDiagnosticSink(nullptr, &lines);
  OrzaVSMobile::reportLine("after");
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "after\n");
  EXPECT_EQ(lines, (Lines{{&lines, "Initialized TovraExecutionEngine with invalid number of threads"}}));
}

}  // namespace
