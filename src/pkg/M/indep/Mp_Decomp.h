/// \file
/// The private entry point of decomposition.
#ifndef MP_DECOMP_H
#define MP_DECOMP_H

#include <cstdint>

#include "M_Matrix.h"

#pragma GCC visibility push(default)
extern "C" {

/// M_DecomposeMatrix4, or M_DecomposeMatrix4ZYX.
int32_t Mp_DecomposeMatrix4(const M_Matrix4* m, M_Matrix4Decomp* d, unsigned char* failed,
                            bool zyx);
}
#pragma GCC visibility pop

#endif  // MP_DECOMP_H
