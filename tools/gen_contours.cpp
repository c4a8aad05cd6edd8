// gen_contours: writes a synthetic contour information file.
//   gen_contours <out.inf> <levels> <pockets> <islands> <points-per-contour> [seed [rings]]
#include <cstdio>
#include <cstdlib>

#include "synthetic/synthetic_part.h"

int main(int argc, char** argv) {
  if (argc < 6) {
    std::fprintf(stderr, "usage: %s <out.inf> <levels> <pockets> <islands> <points-per-contour> [seed [rings]]\n", argv[0]);
    return 2;
  }
  pc::synthetic::PartShape shape;
  shape.levels = std::atoi(argv[2]);
  shape.pockets = std::atoi(argv[3]);
  shape.islands = std::atoi(argv[4]);
  shape.pointsPerContour = std::atoi(argv[5]);
  if (argc > 6) shape.seed = static_cast<unsigned>(std::strtoul(argv[6], nullptr, 10));
  if (argc > 7) shape.rings = std::atoi(argv[7]);
  if (shape.levels < 1 || shape.pockets < 1 || shape.islands < 0 || shape.pointsPerContour < 4 ||
      shape.rings < 1) {
    std::fprintf(stderr, "%s: levels and pockets and rings must be >= 1, islands >= 0, points >= 4\n", argv[0]);
    return 2;
  }
  if (!pc::synthetic::writeSyntheticPart(shape, argv[1])) {
    std::fprintf(stderr, "%s: cannot write %s\n", argv[0], argv[1]);
    return 1;
  }
  std::printf("%s: %lld points\n", argv[1], static_cast<long long>(pc::synthetic::pointCount(shape)));
  return 0;
}
