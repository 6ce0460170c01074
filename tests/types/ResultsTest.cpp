#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "types/EnumNames.h"
#include "types/ObjectInfo.h"
#include "types/ResultMetadata.h"

using Tovra::ObjectInfo;
using Tovra::ResultMetadata;

namespace {

ObjectInfo makeTree() {
  ObjectInfo root(Tovra::PIDN);
  root.srcObjectModule = Tovra::VISUAL_SEARCH_SERVICE_MOD;
  root.content = "root";
  root.properties = "{\"k\":1}";
  root.location = {{1.0f, 2.0f}, {3.0f, 4.0f}};
  ObjectInfo child(Tovra::SEARCH_TERMS);
  child.content = "child";
  ObjectInfo grandchild(Tovra::BOUNDING_BOX_CONTENT_TYPE);
  grandchild.content = "grandchild";
  grandchild.location = {{5.0f, 6.0f}};
  child.subContents.push_back(grandchild);
  root.subContents.push_back(child);
  root.subContents.push_back(ObjectInfo(Tovra::EXTERNAL_RESULT));
  return root;
}

}  // namespace

TEST(ObjectInfoTest, ConstructorDefaults) {
  ObjectInfo info;
  EXPECT_EQ(6, info.srcObjectModule);
  EXPECT_EQ(11, info.contentType);
  EXPECT_TRUE(info.content.empty());
  EXPECT_TRUE(info.properties.empty());
  EXPECT_TRUE(info.subContents.empty());
  EXPECT_TRUE(info.location.empty());

  ObjectInfo qr(Tovra::QR_CODE);
  EXPECT_EQ(2, qr.contentType);
  EXPECT_EQ(Tovra::UNSPECIFIED_OBJECT_MOD, qr.srcObjectModule);
  EXPECT_EQ(10, Tovra::BOUNDING_BOX_CONTENT_TYPE);
}

TEST(ObjectInfoTest, AssignmentCopiesTheWholeTree) {
  const ObjectInfo source = makeTree();
  ObjectInfo target(Tovra::QR_CODE);
  target.content = "old";
  target.subContents.resize(5);
  target = source;

  EXPECT_EQ(Tovra::VISUAL_SEARCH_SERVICE_MOD, target.srcObjectModule);
  EXPECT_EQ(Tovra::PIDN, target.contentType);
  EXPECT_EQ("root", target.content);
  EXPECT_EQ("{\"k\":1}", target.properties);
  ASSERT_EQ(2u, target.location.size());
  EXPECT_EQ(3.0f, target.location[1].x);
  ASSERT_EQ(2u, target.subContents.size());
  ASSERT_EQ(1u, target.subContents[0].subContents.size());
  const ObjectInfo& grandchild = target.subContents[0].subContents[0];
  EXPECT_EQ("grandchild", grandchild.content);
  EXPECT_EQ(10, grandchild.contentType);
  ASSERT_EQ(1u, grandchild.location.size());
  EXPECT_EQ(6.0f, grandchild.location[0].y);
  EXPECT_EQ(Tovra::EXTERNAL_RESULT, target.subContents[1].contentType);

  // Changing the copy deep down leaves the source alone.
  target.subContents[0].subContents[0].content = "changed";
  target.subContents[0].subContents[0].location.clear();
  target.subContents[0].subContents.push_back(ObjectInfo());
  EXPECT_EQ("grandchild", source.subContents[0].subContents[0].content);
  EXPECT_EQ(1u, source.subContents[0].subContents.size());
  EXPECT_EQ(1u, source.subContents[0].subContents[0].location.size());

  ObjectInfo constructed(source);
  EXPECT_EQ("grandchild", constructed.subContents[0].subContents[0].content);

  ObjectInfo& alias = constructed;
  constructed = alias;
  EXPECT_EQ("root", constructed.content);
  EXPECT_EQ("grandchild", constructed.subContents[0].subContents[0].content);
}

TEST(ResultMetadataTest, ClearMakesItEqualToAFreshOneAndKeepsCapacity) {
  const ResultMetadata fresh;
  EXPECT_FALSE(fresh.isFinalAccumulation);
  EXPECT_TRUE(fresh.queryID.empty());
  EXPECT_TRUE(fresh.mobileDecorator.empty());
  EXPECT_TRUE(fresh.accumulatedQueries.empty());

  ResultMetadata metadata;
  metadata.isFinalAccumulation = true;
  metadata.queryID = "a query id that is long enough to live on the heap";
  metadata.mobileDecorator = "TeskarMobileDecorator";
  for (int i = 0; i < 10; ++i) metadata.accumulatedQueries.push_back("q" + std::to_string(i));
  metadata.clear();

  EXPECT_EQ(fresh.isFinalAccumulation, metadata.isFinalAccumulation);
  EXPECT_EQ(fresh.queryID, metadata.queryID);
  EXPECT_EQ(fresh.mobileDecorator, metadata.mobileDecorator);
  EXPECT_EQ(fresh.accumulatedQueries, metadata.accumulatedQueries);
  EXPECT_GE(metadata.accumulatedQueries.capacity(), 10u);
  EXPECT_GE(metadata.queryID.capacity(), 40u);
}

TEST(EnumNamesTest, TablesHoldExactlyTheNamedEnumerators) {
  const std::map<Tovra::ObjectModuleID, std::string> modules = {
      {Tovra::BARCODE_MOD, "BARCODE_MOD"},
      {Tovra::VISUAL_SEARCH_SERVICE_MOD, "VISUAL_SEARCH_SERVICE_MOD"},
      {Tovra::TWOD_BARCODE_MOD, "TWOD_BARCODE_MOD"},
      {Tovra::PACKAGE_LABEL_MOD, "PACKAGE_LABEL_MOD"},
      {Tovra::GIFTCARD_MOD, "GIFTCARD_MOD"},
      {Tovra::UNSPECIFIED_OBJECT_MOD, "UNSPECIFIED_OBJECT_MOD"},
      {Tovra::NUM_OBJECT_MODS, "NUM_OBJECT_MODS"},
  };
  EXPECT_EQ(modules, Tovra::ObjectModuleIDNames);
  EXPECT_EQ(7u, Tovra::ObjectModuleIDNames.size());
  EXPECT_EQ(0u, Tovra::ObjectModuleIDNames.count(static_cast<Tovra::ObjectModuleID>(5)));
  EXPECT_EQ("NUM_OBJECT_MODS", Tovra::ObjectModuleIDNames.at(static_cast<Tovra::ObjectModuleID>(7)));
  EXPECT_EQ(6, Tovra::UNSPECIFIED_OBJECT_MOD);

  const std::map<Tovra::ContentType, std::string> contents = {
      {Tovra::BARCODE_UPC_EAN, "BARCODE_UPC_EAN"},
      {Tovra::BARCODE_128, "BARCODE_128"},
      {Tovra::QR_CODE, "QR_CODE"},
      {Tovra::DATA_MATRIX, "DATA_MATRIX"},
      {Tovra::PDF_417, "PDF_417"},
      {Tovra::GIFT_CARD, "GIFT_CARD"},
      {Tovra::PIDN, "PIDN"},
      {Tovra::SEARCH_TERMS, "SEARCH_TERMS"},
      {Tovra::DIRECTED_RESULT, "DIRECTED_RESULT"},
      {Tovra::EXTERNAL_RESULT, "EXTERNAL_RESULT"},
      {Tovra::UNSPECIFIED_CONTENT_TYPE, "UNSPECIFIED_CONTENT_TYPE"},
      {Tovra::NUM_CONTENT_TYPES, "NUM_CONTENT_TYPES"},
  };
  EXPECT_EQ(contents, Tovra::ContentTypeNames);
  EXPECT_EQ(12u, Tovra::ContentTypeNames.size());
  EXPECT_EQ(Tovra::ContentTypeNames.end(),
            Tovra::ContentTypeNames.find(static_cast<Tovra::ContentType>(10)));
  EXPECT_EQ("NUM_CONTENT_TYPES", Tovra::ContentTypeNames.at(static_cast<Tovra::ContentType>(12)));
  EXPECT_EQ(11, Tovra::UNSPECIFIED_CONTENT_TYPE);

  for (int32_t outside : {-1, 8, 13, 1000}) {
    EXPECT_EQ(0u, Tovra::ObjectModuleIDNames.count(static_cast<Tovra::ObjectModuleID>(outside)));
  }
  for (int32_t outside : {-1, 13, 1000}) {
    EXPECT_EQ(0u, Tovra::ContentTypeNames.count(static_cast<Tovra::ContentType>(outside)));
  }
}
