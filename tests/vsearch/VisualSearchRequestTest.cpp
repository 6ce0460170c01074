#include "vsearch/VisualSearchRequest.h"

#include <climits>
#include <ctime>
#include <regex>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Tovra::Server::ServerRequest;

TEST(VisualSearchRequest, FixedPartsAreExact) {
  EXPECT_EQ(Tovra::visualSearchParamsJson(90),
            "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
  EXPECT_EQ(Tovra::visualSearchParamsJson(90).size(), 73u);
  EXPECT_EQ(Tovra::visualSearchRequestId(1700000000, 17), "TovraStateEngine-1700000000-17");
  EXPECT_EQ(Tovra::visualSearchRequestId(0, UINT64_MAX), "TovraStateEngine-0-18446744073709551615");
  // (orientation + 90) % 360 with the sign of the dividend, without overflow.
  const int32_t orientations[] = {0, 90, 270, -90, -180, INT32_MAX, INT32_MIN};
  const int32_t rotations[] = {90, 180, 0, 0, -90, static_cast<int32_t>((int64_t{INT32_MAX} + 90) % 360),
                               static_cast<int32_t>((int64_t{INT32_MIN} + 90) % 360)};
  for (size_t i = 0; i < 7; ++i) EXPECT_EQ(Tovra::visualSearchRotation(orientations[i]), rotations[i]);
}

TEST(VisualSearchRequest, ReusedRequestKeepsFirstParamsAndLastQueryEntries) {
  std::vector<uint8_t> jpeg = {0xFF, 0xD8, 1, 2};
  Tovra::VisualSearchRequestInfo info;
  info.rotation = Tovra::visualSearchRotation(0);
  info.width = 640;
  info.height = 480;
  info.jpegData = OrzaVSMobile::ByteArray(jpeg.data(), 4);
  ServerRequest request;
  const std::time_t before = std::time(nullptr);
  Tovra::buildVisualSearchRequest(request, info, 42, "", -1.0);
  std::smatch m;
  ASSERT_TRUE(std::regex_match(request.id, m, std::regex("TovraStateEngine-([0-9]+)-42")));
  EXPECT_GE(std::stoll(m[1]), static_cast<long long>(before));
  EXPECT_LE(std::stoll(m[1]), static_cast<long long>(std::time(nullptr)));
  EXPECT_EQ(request.data.data, jpeg.data());
  EXPECT_EQ(request.data.length, 4);
  EXPECT_EQ(request.params, (ServerRequest::ParamMap{{"vsearch_params_json", Tovra::visualSearchParamsJson(90)}}));
  EXPECT_EQ(request.metadata, (ServerRequest::ParamMap{{"version", "0.6"}, {"intentId", "0"}, {"intentScore", "0"},
                                                       {"orientation", "90"}, {"height", "480"},
                                                       {"width", "640"}, {"extra", "0"}}));

  info.rotation = Tovra::visualSearchRotation(90);
  info.extraFlag = true;
  info.intentScore = 0.25;
  Tovra::buildVisualSearchRequest(request, info, 2, "query-1", 1234.5678);
  EXPECT_EQ(request.params.at("vsearch_params_json"), Tovra::visualSearchParamsJson(90));  // first frame's
  EXPECT_EQ(request.metadata.at("orientation"), "180");
  EXPECT_EQ(request.metadata.at("extra"), "1");
  EXPECT_EQ(request.metadata.at("intentScore"), "0.25");
  EXPECT_EQ(request.metadata.at("lastQueryId"), "query-1");
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "1234.57");
  // An empty last query id leaves the entries written before; -1 and 0 print plainly.
  Tovra::buildVisualSearchRequest(request, info, 3, "", 5.0);
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "1234.57");
  Tovra::buildVisualSearchRequest(request, info, 4, "query-2", -1.0);
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "-1");
  Tovra::buildVisualSearchRequest(request, info, 5, "query-3", 0.0);
  EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), "0");
  EXPECT_EQ(request.metadata.size(), 9u);
}

}  // namespace
