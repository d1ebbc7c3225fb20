// comp: prints the sheet of a composition file.

#include <clocale>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Utils.h"
#include "SheetText.h"
#include "U.h"

namespace {

constexpr int kBadInput = 2;

constexpr char kHelp[] = R"(Usage: comp [--json] FILE...

Prints the sheet of each composition file: its frame rate, start and duration,
and for every layer its in and out points as exact ratios in seconds and as
frames, also clipped to the composition, its stretch and the running sum of the
durations. For a composition with a size also where its layers lie: what kind of
matrix places each of them, its corners, the pixels it touches, those in the
frame and those above each layer below it; and for layers in space how they are
moved, scaled, sheared and turned, and where the camera sees them.

  --json  prints the sheet as JSON
  --help  prints this text

A composition file is a JSON object:
  name       text
  frameRate  frames a second: "24000/1001", 25, or a decimal such as 23.976,
             which is approximated
  start      first frame
  duration   number of frames
  size       width and height of the frame in pixels, [1920, 1080]; may be left
             out, and so may all that follows from it
  camera     for layers in space; one that sees the frame as it is, if left out:
    eye, target  points [x, y, z]: right, down, and away from the viewer
    up           a direction, [0, -1, 0] if left out
    zoom         pixels; the width of the frame if left out
  layers     list of layers, the topmost first:
    name        text
    timeBase    seconds a unit, such as "1/600" or "1/48000", or instead
    sourceRate  frames a second, as frameRate
    in, out     first unit, and the unit behind the last
    stretch     seconds on screen a second of the source; 1 if left out
    size        width and height in pixels; left out for what is not seen
    anchor      the point of the layer that is placed; its centre if left out
    position    where in the frame; the centre if left out
    scale       about the anchor, [1, 1] if left out
    rotation    about the anchor, in degrees, clockwise; 0 if left out
    A position [x, y, z] puts the layer into space. Anchor and scale then have
    three numbers, too, and instead of a rotation it has
    orientation {"angles": [x, y, z]}, {"axis": [x, y, z], "angle": a} in
                degrees, or {"quaternion": [x, y, z, w]}
    keys        list of orientations with a "frame" each, between which it turns

Exit status: 0 if every sheet was printed, 1 if the output cannot be written, 2
if an argument or a file cannot be used. The library's own reports are part of
the sheet, in the language of the environment.
)";

comp::Composition ReadFile(const std::string& fileName) {
  std::ifstream file(fileName);
  if (!file) throw comp::InputError(fileName + ": cannot be read.");
  return comp::ReadComposition(file, fileName);
}

// The sheets of all files, complete before anything is printed.
std::string MakeSheets(const std::vector<std::string>& fileNames, bool asJson) {
  std::string text;
  for (const std::string& fileName : fileNames) {
    const comp::Sheet sheet = comp::MakeSheet(ReadFile(fileName));
    if (!asJson && !text.empty()) text += '\n';
    text += asJson ? comp::ToJson(sheet) : comp::ToTable(sheet);
  }
  return text;
}

}  // namespace

int main(int argc, char** argv) {
  std::setlocale(LC_ALL, "");
  bool asJson = false;
  std::vector<std::string> fileNames;
  for (int i = 1; i < argc; ++i) {
    const std::string argument = argv[i];
    if (argument == "--help") {
      std::cout << kHelp;
      return 0;
    }
    if (argument == "--json") {
      asJson = true;
    } else if (argument.starts_with("-")) {
      std::cerr << "comp: " << argument << " is not an option; see comp --help.\n";
      return kBadInput;
    } else {
      fileNames.push_back(argument);
    }
  }
  if (fileNames.empty()) {
    std::cerr << "comp: no file is given; see comp --help.\n";
    return kBadInput;
  }

  // Birth and death are logged; a command line tool has no use for that.
  U_SetLogCallback([](void*, int32_t, const char*, const char*, const char*) {}, nullptr);
  if (M_Birth(0, nullptr) != 0) return EXIT_FAILURE;
  int status = 0;
  try {
    if (!(std::cout << MakeSheets(fileNames, asJson) << std::flush)) {
      std::cerr << "comp: the output cannot be written.\n";
      status = EXIT_FAILURE;
    }
  } catch (const comp::InputError& error) {
    std::cerr << "comp: " << error.what() << '\n';
    status = kBadInput;
  }
  M_Death();
  return status;
}
