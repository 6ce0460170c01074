// Runs the FAST-9 detector (detection with suppression at the engine's threshold, 50) a given
// number of times on one benchmark frame, through the vector path or the scalar one, so that an
// instruction counter (qemu plugin, callgrind) can weigh the two paths:
//   fast9_insn_driver <frame name filter> <best|scalar> <calls>
// The instructions of one call are (count(k + n calls) - count(k calls)) / n: frame generation
// and start-up cancel out. Prints the path's name and the corners found, so that a run whose
// answer differs between the paths shows at once.
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "bench/BenchFrames.h"
#include "features/Fast9.h"

int main(int argc, char** argv) {
  if (argc != 4) {
    std::fprintf(stderr, "usage: %s <frame filter> <best|scalar> <calls>\n", argv[0]);
    return 2;
  }
  const auto frames = orzavs_bench::selectFrames(argv[1]);
  if (frames.size() != 1) {
    std::fprintf(stderr, "the filter must select exactly one frame (it selects %zu)\n", frames.size());
    return 2;
  }
  const bool scalar = std::strcmp(argv[2], "scalar") == 0;
  const OrzaVSMobile::Fast9Path path = scalar ? OrzaVSMobile::Fast9Path::Scalar : OrzaVSMobile::Fast9Path::Best;
  const int calls = std::atoi(argv[3]);

  const orzavs_bench::BenchFrame& f = *frames[0];
  std::vector<OrzaVSMobile::Fast9Corner> kept;
  std::vector<int> scores;
  kept.reserve(static_cast<size_t>(f.width) * f.height / 4);
  scores.reserve(kept.capacity());
  for (int i = 0; i < calls; ++i) {
    OrzaVSMobile::fast9DetectNonmax(f.luma(), f.width, f.height, f.width, 50, kept, scores, path);
  }
  std::printf("%s %s: %zu corners\n", f.name.c_str(), scalar ? "scalar" : OrzaVSMobile::fast9BestPathName(),
              kept.size());
  return 0;
}
