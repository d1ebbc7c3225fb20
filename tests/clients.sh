#!/bin/sh
# Whether clients of all kinds compile without a warning: every header alone and together, with both compilers, in three
# standards; what the templates refuse; and a project that M is part of.
# Usage: clients.sh SOURCE_FOLDER LIBRARY_FOLDER
set -eu
source=$1
library=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
compilers=g++
if command -v clang++ >/dev/null; then compilers='g++ clang++'; fi
flags="-Wall -Wextra -Wpedantic -Wconversion -Wsign-conversion -Wshadow -Wold-style-cast -Werror -I$source/include -I$source/host/include"

fail() {
  echo "$*"
  exit 1
}

echo '#include "M_Ops.h"' >"$work/ops.cpp"
for header in M_Utils.h M_Rect.h M_Matrix.h M_CMatrixImpl.h U.h XLOG.h qelcore/geom/PointT.h; do
  echo "#include \"$header\"" | tee -a "$work/all.cpp" | g++ -std=c++17 $flags -fsyntax-only -xc++ - || fail "$header alone"
done
cat >>"$work/all.cpp" <<'END'
struct Layer : M_TransformPoly3D {};
struct Named : M_Vector2T<double> {
  int id;
};
int main() {
  const double row[] = {0, 4, 4, 0};
  std::vector<M_Vector2T<double>> v = {{0, 0}, {4, 0}, {4, 4}, {1, 1}, {0, 4}}, hull;
  M_Vector2T<double> a[5] = {v[0], v[1], v[2], v[3], v[4]};
  M_ComputeConvexHull(v.begin(), v.end(), hull);
  unsigned char inside = 0;
  Named p = {{row[0] + 3, 1}, 7};
  std::vector<M_Vector2T<double>> same;
  M_ComputeConvexHull(a, a + 5, same);
  bool ok = hull.size() == 4 && same.size() == 4;
  M_ComputeConvexHull(v.cbegin(), v.end(), same);
  ok = ok && same.size() == 4 && !M_IsConvex(v.begin(), v.end()) && !M_IsConvex(v.begin(), v.cend()) &&
       !M_IsConvex(a, a + 5) && M_IsConvex(hull.begin(), hull.end());
  ok = ok && M_IsFloatPointInConcavePoly(&p, a, 5, 0, &inside) == 0 && inside == 1;
  Layer layer;
  for (M_Vector3T<double>& corner : layer.points) corner = {1, 1, 1};
  M_Vector4T<double> direction = {0, 0, 2, 0};
  direction.Normalize();
  std::vector<qelcore::geom::PointT<float>> few(3), floats;
  M_ComputeConvexHull(few.begin(), few.end(), floats);
  ok = ok && M_GetMinimumEdgeDistance(&p, layer) == 2 && direction.z < 1.5 && floats.size() == 3;
#ifdef BAD
  BAD;
#endif
  return ok ? 0 : 1;
}
END
# What is to be refused in a sentence that begins with the name.
cat >"$work/calls" <<'END'
  M_IsConvex(row, row + 4);
  M_IsConvex(&p, &p);
  M_IsConvex(few.begin(), few.end());
  M_ComputeConvexHull(1, 2, hull);
  M_ComputeConvexHull(v.begin(), v.end(), floats);
  M_ComputeConvexHull(a, v.end(), hull);
  M_IsFloatPointInConcavePoly(&v[0], &p, 1, 0.0, &inside);
  M_IsFloatPointInConcavePoly(v.begin(), v.begin(), 4, 0.0, &inside);
  M_GetMinimumEdgeDistance(&p, p);
  M_Vector4T<float>().Normalize();  // Only ...
END
sed -E 's/^  (M_Vector4T.*|M_[A-Za-z0-9]+).*/\1/; s/.*Only.*/Only/' "$work/calls" >"$work/names"
for compiler in $compilers; do
  $compiler -std=c++20 $flags -fsyntax-only "$work/ops.cpp" || fail "$compiler: M_Ops.h alone"
  for standard in c++17 c++20 c++2b 'c++17 -fno-exceptions -fno-rtti'; do
    $compiler -std=$standard $flags "$work/all.cpp" -o "$work/all" -L"$library" -Wl,-rpath,"$library" -lM -lMHost ||
      fail "$compiler -std=$standard"
    "$work/all" || fail "$compiler -std=$standard: a wrong result"
  done
  sed -e "/^  BAD;/r $work/calls" -e '/^  BAD;/d' "$work/all.cpp" >"$work/bad.cpp"
  ! $compiler -std=c++17 -DBAD $flags -fsyntax-only "$work/bad.cpp" 2>"$work/err" || fail "$compiler refuses nothing"
  for name in M_IsConvex M_ComputeConvexHull M_IsFloatPointInConcavePoly M_GetMinimumEdgeDistance Only; do
    [ "$(grep -c "error: static.*$name" "$work/err")" = "$(grep -c "$name" "$work/names")" ] || fail "$compiler does not refuse each $name: $(cat "$work/err")"
  done
done

# A project with M inside keeps its own defaults, names and installation.
mkdir "$work/parent"
cat >"$work/parent/CMakeLists.txt" <<END
cmake_minimum_required(VERSION 3.25)
project(Parent LANGUAGES CXX)
add_library(own own.cpp)
add_subdirectory("$source" M)
add_library(Host own.cpp)
add_library(comp own.cpp)
add_custom_target(catalogues)
add_executable(app "$source/examples/minimal/main.cpp")
target_link_libraries(app PRIVATE M::M)
install(TARGETS app)
foreach(name own Host)
  get_target_property(type \${name} TYPE)
  if(NOT type STREQUAL STATIC_LIBRARY OR DEFINED BUILD_SHARED_LIBS OR CMAKE_BUILD_TYPE)
    message(FATAL_ERROR "\${name} is a \${type}: something of M has reached its parent")
  endif()
endforeach()
END
echo 'int own() { return 1; }' >"$work/parent/own.cpp"
cmake -S "$work/parent" -B "$work/build" -G Ninja -DCMAKE_CXX_COMPILER="${compilers#* }" \
  -DCMAKE_CXX_FLAGS="-Wall -Wextra -Wpedantic -Werror" >"$work/log" 2>&1 &&
  cmake --build "$work/build" -j 2 >>"$work/log" 2>&1 && cmake --install "$work/build" --prefix "$work/prefix" >>"$work/log" ||
  fail "$(cat "$work/log")"
"$work/build/app" | grep -qx 5/6 || fail "the program of the parent project does not add"
[ "$(cd "$work/prefix" && find . -type f)" = ./bin/app ] || fail "M has installed something with its parent project"
