#include "types/EnumNames.h"

#include <initializer_list>
#include <utility>

namespace Tovra {

namespace {

// Built by insert-if-absent in ascending key order, so a repeated key would keep its first name.
template <typename Key>
std::map<Key, std::string> buildTable(std::initializer_list<std::pair<Key, const char*>> pairs) {
  std::map<Key, std::string> table;
  for (const auto& entry : pairs) table.emplace(entry.first, entry.second);
  return table;
}

}  // namespace

const std::map<ObjectModuleID, std::string> ObjectModuleIDNames = buildTable<ObjectModuleID>({
    {BARCODE_MOD, "BARCODE_MOD"},
    {VISUAL_SEARCH_SERVICE_MOD, "VISUAL_SEARCH_SERVICE_MOD"},
    {TWOD_BARCODE_MOD, "TWOD_BARCODE_MOD"},
    {PACKAGE_LABEL_MOD, "PACKAGE_LABEL_MOD"},
    {GIFTCARD_MOD, "GIFTCARD_MOD"},
    {UNSPECIFIED_OBJECT_MOD, "UNSPECIFIED_OBJECT_MOD"},
    {NUM_OBJECT_MODS, "NUM_OBJECT_MODS"},
});

const std::map<ContentType, std::string> ContentTypeNames = buildTable<ContentType>({
    {BARCODE_UPC_EAN, "BARCODE_UPC_EAN"},
    {BARCODE_128, "BARCODE_128"},
    {QR_CODE, "QR_CODE"},
    {DATA_MATRIX, "DATA_MATRIX"},
    {PDF_417, "PDF_417"},
    {GIFT_CARD, "GIFT_CARD"},
    {PIDN, "PIDN"},
    {SEARCH_TERMS, "SEARCH_TERMS"},
    {DIRECTED_RESULT, "DIRECTED_RESULT"},
    {EXTERNAL_RESULT, "EXTERNAL_RESULT"},
    {UNSPECIFIED_CONTENT_TYPE, "UNSPECIFIED_CONTENT_TYPE"},
    {NUM_CONTENT_TYPES, "NUM_CONTENT_TYPES"},
});

}  // namespace Tovra
