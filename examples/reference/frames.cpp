#include <iostream>

#include "M_Ops.h"

int main() {
  // Two hours, counted in samples of sound; and the frame of video that is shown then.
  constexpr M_Ratio ntsc = {30000, 1001}, film = {24, 1};
  constexpr M_Ratio time = {7200 * 44100, 44100};
  std::cout << M_FrameAt(time, ntsc) << '\n';                       // -> 215784
  std::cout << M_FrameAt(time, ntsc, M_Rounding::Nearest) << '\n';  // -> 215784
  std::cout << M_FrameAt(time, ntsc, M_Rounding::Ceiling) << '\n';  // -> 215785
  std::cout << M_FrameAt({-1, 3}, film) << '\n';                    // -> -8
  // When it begins: exactly, and so that it may be added to others.
  std::cout << M_TimeOfFrame(215784, ntsc) << '\n';       // -> 8999991/1250
  std::cout << time - M_SnapToFrame(time, ntsc) << '\n';  // -> 9/1250
  // Whether a time is the beginning of a frame.
  std::cout << (M_SnapToFrame(time, film) == time) << '\n';  // -> 1
}
