#include "vsearch/VisualSearchRequest.h"

#include <climits>
#include <ctime>
#include <regex>
#include <set>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Tovra::Server::ServerRequest;
using Tovra::VisualSearchRequestInfo;

std::set<std::string> keysOf(const ServerRequest::ParamMap& map) {
  std::set<std::string> keys;
  for (const auto& entry : map) keys.insert(entry.first);
  return keys;
}

TEST(VisualSearchRequest, ParameterDocumentIsTheExactCompactText) {
  const std::string text = Tovra::visualSearchParamsJson(90);
  EXPECT_EQ(text, "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
  EXPECT_EQ(text.size(), 73u);
  EXPECT_EQ(Tovra::visualSearchParamsJson(-90),
            "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"-90\"}}}");
}

TEST(VisualSearchRequest, RotationKeepsTheSignOfTheDividendAndNeverOverflows) {
  EXPECT_EQ(Tovra::visualSearchRotation(0), 90);
  EXPECT_EQ(Tovra::visualSearchRotation(90), 180);
  EXPECT_EQ(Tovra::visualSearchRotation(270), 0);
  EXPECT_EQ(Tovra::visualSearchRotation(-90), 0);
  EXPECT_EQ(Tovra::visualSearchRotation(-180), -90);
  EXPECT_EQ(Tovra::visualSearchRotation(-450), -0);
  EXPECT_EQ(Tovra::visualSearchRotation(INT32_MAX), static_cast<int32_t>((int64_t{INT32_MAX} + 90) % 360));
  EXPECT_EQ(Tovra::visualSearchRotation(INT32_MIN), static_cast<int32_t>((int64_t{INT32_MIN} + 90) % 360));
}

TEST(VisualSearchRequest, IdIsPrefixSecondsAndFrameIdInPlainDecimal) {
  EXPECT_EQ(Tovra::visualSearchRequestId(1700000000, 17), "TovraStateEngine-1700000000-17");
  EXPECT_EQ(Tovra::visualSearchRequestId(0, UINT64_MAX), "TovraStateEngine-0-18446744073709551615");
}

TEST(VisualSearchRequest, FirstRequestCarriesBodyIdParamsAndExactlyTheBaseMetadata) {
  std::vector<uint8_t> jpeg = {0xFF, 0xD8, 0x01, 0x02};
  VisualSearchRequestInfo info;
  info.rotation = Tovra::visualSearchRotation(0);
  info.width = 640;
  info.height = 480;
  info.jpegData = OrzaVSMobile::ByteArray(jpeg.data(), static_cast<int32_t>(jpeg.size()));
  ServerRequest request;
  const std::time_t before = std::time(nullptr);
  Tovra::buildVisualSearchRequest(request, info, 42, "", -1.0);
  const std::time_t after = std::time(nullptr);

  EXPECT_EQ(request.data.data, jpeg.data());
  EXPECT_EQ(request.data.length, 4);
  std::smatch match;
  ASSERT_TRUE(std::regex_match(request.id, match, std::regex("TovraStateEngine-([0-9]+)-42")));
  const long long seconds = std::stoll(match[1]);
  EXPECT_GE(seconds, static_cast<long long>(before));
  EXPECT_LE(seconds, static_cast<long long>(after));

  ASSERT_EQ(request.params.size(), 1u);
  EXPECT_EQ(request.params.at("vsearch_params_json"), Tovra::visualSearchParamsJson(90));
  EXPECT_EQ(keysOf(request.metadata),
            (std::set<std::string>{"version", "intentId", "intentScore", "orientation", "height",
                                   "width", "extra"}));
  EXPECT_EQ(request.metadata.at("version"), "0.6");
  EXPECT_EQ(request.metadata.at("intentId"), "0");
  EXPECT_EQ(request.metadata.at("intentScore"), "0");
  EXPECT_EQ(request.metadata.at("orientation"), "90");
  EXPECT_EQ(request.metadata.at("height"), "480");
  EXPECT_EQ(request.metadata.at("width"), "640");
  EXPECT_EQ(request.metadata.at("extra"), "0");
  EXPECT_EQ(request.responseHandler, nullptr);
}

TEST(VisualSearchRequest, ReusedRequestKeepsFirstParamsAndLastQueryEntries) {
  std::vector<uint8_t> jpeg(10, 7);
  VisualSearchRequestInfo info;
  info.jpegData = OrzaVSMobile::ByteArray(jpeg.data(), 10);
  info.width = 320;
  info.height = 240;
  ServerRequest request;

  info.rotation = Tovra::visualSearchRotation(0);
  Tovra::buildVisualSearchRequest(request, info, 1, "", -1.0);
  info.rotation = Tovra::visualSearchRotation(90);
  info.extraFlag = true;
  info.intentScore = 0.25;
  Tovra::buildVisualSearchRequest(request, info, 2, "query-1", 1234.5678);
  // The parameter document stays the first frame's; the metadata follows every frame.
  EXPECT_EQ(request.params.at("vsearch_params_json"), Tovra::visualSearchParamsJson(90));
  EXPECT_EQ(request.metadata.at("orientation"), "180");
  EXPECT_EQ(request.metadata.at("extra"), "1");
  EXPECT_EQ(request.metadata.at("intentScore"), "0.25");
  EXPECT_EQ(request.metadata.at("lastQueryId"), "query-1");
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "1234.57");
  EXPECT_NE(request.id.find("-2"), std::string::npos);

  // An empty last query id leaves the previous entries in place; -1 is written as "-1".
  Tovra::buildVisualSearchRequest(request, info, 3, "", 5.0);
  EXPECT_EQ(request.metadata.at("lastQueryId"), "query-1");
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "1234.57");
  Tovra::buildVisualSearchRequest(request, info, 4, "query-2", -1.0);
  EXPECT_EQ(request.metadata.at("lastQueryId"), "query-2");
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "-1");
  Tovra::buildVisualSearchRequest(request, info, 5, "query-3", 0.0);
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "0");
  EXPECT_EQ(request.params.size(), 1u);
}

}  // namespace
