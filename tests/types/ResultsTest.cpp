#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <string>
#include <type_traits>
#include <vector>

#include "exec/Job.h"
#include "exec/TovraExecutionEngine.h"
#include "types/DiagnosticOutput.h"
#include "types/EnumNames.h"
#include "types/EventDelegateBase.h"
#include "types/ImageFormat.h"
#include "types/ObjectInfo.h"
#include "types/ResultMetadata.h"

using Tovra::ObjectInfo;
using Tovra::ResultMetadata;

// Every enumeration that crosses JNI has a fixed 32-bit underlying type, so any integer that
// arrives from Java is a valid value of the type.
template <typename... E>
constexpr bool allInt32 = (std::is_same<typename std::underlying_type<E>::type, int32_t>::value && ...);
static_assert(allInt32<Tovra::ObjectModuleID, Tovra::ContentType, Tovra::ActionID, Tovra::StatusID,
                       Tovra::CameraStabilityIssue, Tovra::JudgeVerdictOnModule, Tovra::Server::ResponseStatus,
                       OrzaVSMobile::ImageFormat, Tovra::JobState>, "");

TEST(ResultsTest, DefaultsAndAMetadataClearThatEqualsAFreshOne) {
  const ObjectInfo info, qr(Tovra::QR_CODE);
  EXPECT_EQ(6, info.srcObjectModule);
  EXPECT_EQ(11, info.contentType);
  EXPECT_TRUE(info.content.empty() && info.properties.empty() && info.subContents.empty() && info.location.empty());
  EXPECT_EQ(2, qr.contentType);
  EXPECT_EQ(6, qr.srcObjectModule);
  ResultMetadata metadata;
  metadata.isFinalAccumulation = true;
  metadata.queryID = "q";
  metadata.mobileDecorator = "TeskarMobileDecorator";
  metadata.accumulatedQueries.assign(10, "q");
  metadata.clear();
  EXPECT_FALSE(metadata.isFinalAccumulation);
  EXPECT_TRUE(metadata.queryID.empty() && metadata.mobileDecorator.empty() && metadata.accumulatedQueries.empty());
  const ResultMetadata fresh;
  EXPECT_TRUE(!fresh.isFinalAccumulation && fresh.queryID.empty() && fresh.accumulatedQueries.empty());
}

TEST(EnumNamesTest, TablesHoldExactlyTheNamedEnumerators) {
#define ORZAVS_NAMED(e) {Tovra::e, #e}
  const std::map<Tovra::ObjectModuleID, std::string> modules = {
      ORZAVS_NAMED(BARCODE_MOD), ORZAVS_NAMED(VISUAL_SEARCH_SERVICE_MOD), ORZAVS_NAMED(TWOD_BARCODE_MOD),
      ORZAVS_NAMED(PACKAGE_LABEL_MOD), ORZAVS_NAMED(GIFTCARD_MOD), ORZAVS_NAMED(UNSPECIFIED_OBJECT_MOD),
      ORZAVS_NAMED(NUM_OBJECT_MODS)};
  const std::map<Tovra::ContentType, std::string> contents = {
      ORZAVS_NAMED(BARCODE_UPC_EAN), ORZAVS_NAMED(BARCODE_128), ORZAVS_NAMED(QR_CODE), ORZAVS_NAMED(DATA_MATRIX),
      ORZAVS_NAMED(PDF_417), ORZAVS_NAMED(GIFT_CARD), ORZAVS_NAMED(PIDN), ORZAVS_NAMED(SEARCH_TERMS),
      ORZAVS_NAMED(DIRECTED_RESULT), ORZAVS_NAMED(EXTERNAL_RESULT), ORZAVS_NAMED(UNSPECIFIED_CONTENT_TYPE),
      ORZAVS_NAMED(NUM_CONTENT_TYPES)};
#undef ORZAVS_NAMED
  EXPECT_EQ(modules, Tovra::ObjectModuleIDNames);
  EXPECT_EQ(contents, Tovra::ContentTypeNames);
}

// The base absorbs every callback, so a client overrides only what it wants; it is destroyed
// through a base pointer.
TEST(EventDelegateBaseTest, BaseAbsorbsEveryCallback) {
  struct Counting : Tovra::EventDelegateBase {
    explicit Counting(int* flag) : destroyed(flag) {}
    ~Counting() override { ++*destroyed; }
    int* destroyed;
  };
  int destroyed = 0;
  std::unique_ptr<Tovra::EventDelegateBase> delegate(new Counting(&destroyed));
  delegate->didReceiveEvent(Tovra::BARCODE_MOD, Tovra::QR_CODE, static_cast<Tovra::ActionID>(3),
                            static_cast<Tovra::StatusID>(4));
  delegate->didProcessFrame(Tovra::VISUAL_SEARCH_SERVICE_MOD, Tovra::FAILURE_STATUS, 1, -7);
  delegate->didDetect({});
  delegate->didDecode({}, ResultMetadata());
  delegate->didDetectInterestPoints({{1.0f, 2.0f}});
  delegate->didReceiveServerError(Tovra::VISUAL_SEARCH_SERVICE_MOD, Tovra::Server::RESPONSE_PARSE_ERROR, 200);
  delegate->suggestDarkScene();
  delegate->suggestBoringEvent();
  delegate->showMessage("");
  delegate->didProcessFrameDecision(static_cast<Tovra::CameraStabilityIssue>(2), 0.25);
  delegate->didProcessModuleDecision(Tovra::GIFTCARD_MOD, static_cast<Tovra::JudgeVerdictOnModule>(-3));
  delegate.reset();
  EXPECT_EQ(destroyed, 1);
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
