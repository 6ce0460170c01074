#ifndef ORZAVS_TYPES_IDENTIFIERS_H
#define ORZAVS_TYPES_IDENTIFIERS_H

#include <cstdint>

// Every enumeration has a fixed 32-bit underlying type: values arrive from Java as plain
// integers, and any int32 is then a valid (if unnamed) value of the type.

namespace Tovra {

enum ObjectModuleID : int32_t {
  BARCODE_MOD = 0,
  VISUAL_SEARCH_SERVICE_MOD = 1,
  TWOD_BARCODE_MOD = 2,
  PACKAGE_LABEL_MOD = 3,
  GIFTCARD_MOD = 4,
  // 5 is a module slot kept without a name.
  UNSPECIFIED_OBJECT_MOD = 6,
  NUM_OBJECT_MODS = 7,
};

enum ContentType : int32_t {
  BARCODE_UPC_EAN = 0,
  BARCODE_128 = 1,
  QR_CODE = 2,
  DATA_MATRIX = 3,
  PDF_417 = 4,
  GIFT_CARD = 5,
  PIDN = 6,
  SEARCH_TERMS = 7,
  DIRECTED_RESULT = 8,
  EXTERNAL_RESULT = 9,
  // 10 has no name; the visual search reply uses it for "BoundingBox" results.
  UNSPECIFIED_CONTENT_TYPE = 11,
  NUM_CONTENT_TYPES = 12,
};

// The value the reply parser gives to "BoundingBox" results.
constexpr ContentType BOUNDING_BOX_CONTENT_TYPE = static_cast<ContentType>(10);

// The engine of this build emits none of the following through its delegate; they carry
// whatever integer a caller passes. The named values are the ones an app is expected to meet.
enum ActionID : int32_t {
  NO_ACTION = 0,
};

enum StatusID : int32_t {
  SUCCESS_STATUS = 0,
  FAILURE_STATUS = 1,
};

enum CameraStabilityIssue : int32_t {
  NO_STABILITY_ISSUE = 0,
};

enum JudgeVerdictOnModule : int32_t {
  NO_VERDICT = 0,
};

namespace Server {

// Passed to EventDelegateBase::didReceiveServerError together with the response code.
enum ResponseStatus : int32_t {
  RESPONSE_SUCCESS = 0,        // never reported
  RESPONSE_SERVER_ERROR = 1,   // responseCode was not 200
  RESPONSE_PARSE_ERROR = 2,    // code 200 but the body could not be read
};

}  // namespace Server
}  // namespace Tovra

#endif
