#ifndef ORZAVS_TYPES_ENUMNAMES_H
#define ORZAVS_TYPES_ENUMNAMES_H

#include <map>
#include <string>

#include "types/Identifiers.h"

namespace Tovra {

// Value-to-name tables of the named enumerators, built during static initialisation and
// read-only afterwards (safe to read from any thread). The unnamed values (module 5, content
// type 10) are absent: a lookup finds nothing and the caller supplies its own fallback.
extern const std::map<ObjectModuleID, std::string> ObjectModuleIDNames;
extern const std::map<ContentType, std::string> ContentTypeNames;

}  // namespace Tovra

#endif
