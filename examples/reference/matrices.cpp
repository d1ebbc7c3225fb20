#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix4 camera;
  M_IdentityMatrix4(&camera);
  camera.Project(1000);
  M_Vector4T<double> p = {100, 50, 2000, 1};
  try {
    camera.TransformPointAndDivide(&p);
    std::printf("%g %g\n", p.x, p.y);  // -> 50 25
  } catch (int code) {                 // M_ERR_W_IS_ZERO: at the height of the eye
    return code;
  }
}
