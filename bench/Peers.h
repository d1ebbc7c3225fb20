/// \file
/// The peers' side of the benchmarks of points, rectangles and matrices: the same work with each
/// library's own types, in loops of the peer's own, so that everything is inlined. It is built
/// twice as a module, as a distribution builds (-O2) and for this machine (-O3 -march=native).
#ifndef BENCH_PEERS_H
#define BENCH_PEERS_H

#include <vector>

#include "M_Matrix.h"
#include "M_Rect.h"

namespace bench {

/// `groups` x `count` points in place, all by one matrix. `matrix` is an M_Matrix3 or M_Matrix4.
/// False if one is out of range, where that is looked at.
struct PeerTransform {
  const char* what;
  const char* peer;
  bool (*run)(const void* matrix, int groups, int count, void* points);
};

/// out[i] := f(a[i], b[i]) for `count` operands; unary operations take a only. The operands are
/// M's records.
struct PeerOperation {
  const char* what;
  const char* peer;
  void (*run)(int count, const void* a, const void* b, void* out);
};

struct Peers {
  std::vector<PeerTransform> transforms;
  std::vector<PeerOperation> operations;
};

}  // namespace bench

extern "C" const bench::Peers* BenchPeers();

#endif  // BENCH_PEERS_H
