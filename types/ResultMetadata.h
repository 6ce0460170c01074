#ifndef ORZAVS_TYPES_RESULTMETADATA_H
#define ORZAVS_TYPES_RESULTMETADATA_H

#include <string>
#include <vector>

namespace Tovra {

// Facts about one batch of decode results.
struct ResultMetadata {
  bool isFinalAccumulation;
  std::string queryID;
  std::string mobileDecorator;
  std::vector<std::string> accumulatedQueries;

  ResultMetadata() { clear(); }

  // Back to the freshly constructed state; string and vector capacity is kept.
  void clear() {
    isFinalAccumulation = false;
    queryID.clear();
    mobileDecorator.clear();
    accumulatedQueries.clear();
  }
};

}  // namespace Tovra

#endif
