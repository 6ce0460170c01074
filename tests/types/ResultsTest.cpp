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
constexpr bool allInt32() {
  return (std::is_same<typename std::underlying_type<E>::type, int32_t>::value && ...);
}
static_assert(allInt32<Tovra::ObjectModuleID, Tovra::ContentType, Tovra::ActionID, Tovra::StatusID,
                       Tovra::CameraStabilityIssue, Tovra::JudgeVerdictOnModule, Tovra::Server::ResponseStatus,
                       OrzaVSMobile::ImageFormat, Tovra::JobState>(), "");

TEST(ObjectInfoTest, DefaultsAndDeepCopies) {
  ObjectInfo info;
  EXPECT_EQ(6, info.srcObjectModule);
  EXPECT_EQ(11, info.contentType);
  EXPECT_TRUE(info.content.empty() && info.properties.empty());
  EXPECT_TRUE(info.subContents.empty() && info.location.empty());
  ObjectInfo qr(Tovra::QR_CODE);
  EXPECT_EQ(2, qr.contentType);
  EXPECT_EQ(6, qr.srcObjectModule);

  ObjectInfo grandchild(Tovra::BOUNDING_BOX_CONTENT_TYPE);
  grandchild.content = "grandchild";
  grandchild.location = {{5.0f, 6.0f}};
  ObjectInfo child(Tovra::SEARCH_TERMS), source(Tovra::PIDN), target(Tovra::QR_CODE);
  child.subContents = {grandchild};
  source.subContents = {child};
  target.subContents.resize(5);
  target = source;
  ASSERT_EQ(1u, target.subContents.size());
  ASSERT_EQ(1u, target.subContents[0].subContents.size());
  EXPECT_EQ("grandchild", target.subContents[0].subContents[0].content);
  EXPECT_EQ(6.0f, target.subContents[0].subContents[0].location.at(0).y);
  target.subContents[0].subContents[0].content = "changed";
  target.subContents[0].subContents.push_back(ObjectInfo());
  EXPECT_EQ("grandchild", source.subContents[0].subContents[0].content);
  EXPECT_EQ(1u, source.subContents[0].subContents.size());
}

TEST(ResultMetadataTest, ClearMakesItEqualToAFreshOne) {
  const ResultMetadata fresh;
  ResultMetadata metadata;
  metadata.isFinalAccumulation = true;
  metadata.queryID = "q";
  metadata.mobileDecorator = "TeskarMobileDecorator";
  for (int i = 0; i < 10; ++i) metadata.accumulatedQueries.push_back("q" + std::to_string(i));
  metadata.clear();
  EXPECT_FALSE(metadata.isFinalAccumulation);
  EXPECT_EQ(fresh.queryID, metadata.queryID);
  EXPECT_EQ(fresh.mobileDecorator, metadata.mobileDecorator);
  EXPECT_EQ(fresh.accumulatedQueries, metadata.accumulatedQueries);
  EXPECT_TRUE(fresh.queryID.empty() && fresh.accumulatedQueries.empty());
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
  // The unnamed slots 5 and 10, and the last values.
  EXPECT_EQ(0u, Tovra::ObjectModuleIDNames.count(static_cast<Tovra::ObjectModuleID>(5)));
  EXPECT_EQ("NUM_OBJECT_MODS", Tovra::ObjectModuleIDNames.at(static_cast<Tovra::ObjectModuleID>(7)));
  EXPECT_EQ(0u, Tovra::ContentTypeNames.count(static_cast<Tovra::ContentType>(10)));
  EXPECT_EQ("NUM_CONTENT_TYPES", Tovra::ContentTypeNames.at(static_cast<Tovra::ContentType>(12)));
}

namespace {

class DecodeOnly : public Tovra::EventDelegateBase {
 public:
  explicit DecodeOnly(bool* destroyed) : destroyed_(destroyed) {}
  ~DecodeOnly() override { *destroyed_ = true; }
  void didDecode(const std::vector<ObjectInfo>& objects, const ResultMetadata& metadata) override {
    decoded.push_back(std::to_string(objects.size()) + metadata.queryID);
  }
  std::vector<std::string> decoded;

 private:
  bool* destroyed_;
};

}  // namespace

TEST(EventDelegateBaseTest, BaseAbsorbsEveryCallAndAnOverrideSeesOnlyItsOwn) {
  bool destroyed = false;
  std::unique_ptr<Tovra::EventDelegateBase> owner(new DecodeOnly(&destroyed));
  auto* decodeOnly = static_cast<DecodeOnly*>(owner.get());
  Tovra::EventDelegateBase plain;
  ResultMetadata metadata;
  metadata.queryID = "q";
  for (Tovra::EventDelegateBase* delegate : {&plain, owner.get()}) {
    delegate->didReceiveEvent(Tovra::BARCODE_MOD, Tovra::QR_CODE, static_cast<Tovra::ActionID>(3),
                              static_cast<Tovra::StatusID>(4));
    delegate->didProcessFrame(Tovra::VISUAL_SEARCH_SERVICE_MOD, Tovra::FAILURE_STATUS, 1, -7);
    delegate->didDetect({});
    delegate->didDecode({}, metadata);
    delegate->didDetectInterestPoints({{1.0f, 2.0f}});
    delegate->didReceiveServerError(Tovra::VISUAL_SEARCH_SERVICE_MOD, Tovra::Server::RESPONSE_PARSE_ERROR, 200);
    delegate->suggestDarkScene();
    delegate->suggestBoringEvent();
    delegate->showMessage("");
    delegate->didProcessFrameDecision(static_cast<Tovra::CameraStabilityIssue>(2), 0.25);
    delegate->didProcessModuleDecision(Tovra::GIFTCARD_MOD, static_cast<Tovra::JudgeVerdictOnModule>(-3));
  }
  EXPECT_EQ(std::vector<std::string>{"0q"}, decodeOnly->decoded);  // an empty list keeps its metadata
  owner.reset();
  EXPECT_TRUE(destroyed);  // destroyed through the base pointer
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
