// comp: prints the sheet of a composition file.

#include <algorithm>
#include <charconv>
#include <clocale>
#include <cmath>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Utils.h"
#include "Otio.h"
#include "Picture.h"
#include "SheetText.h"
#include "TimelinePicture.h"
#include "TimelineText.h"
#include "U.h"
#include "Wording.h"

namespace {

constexpr int kBadInput = 2;

constexpr char kHelp[] = R"(Usage: comp [--json] [--drop-frame] FILE...
       comp --svg OUT [--time FRAME] [--hit X,Y] [--tolerance D] [--grid N] FILE

Prints the sheet of each composition file: its frame rate, start and duration,
and for every layer its in and out points as exact ratios in seconds and as
frames, also clipped to the composition, its stretch and the running sum of the
durations. For a composition with a size also where its layers lie: what kind of
matrix places each of them, its corners, the pixels it touches, those in the
frame and those above each layer below it; and for layers in space how they are
moved, scaled, sheared and turned, and where the camera sees them.

Of a timeline of OpenTimelineIO (.otio) it prints what is where in each track:
record and source times as timecode, and how long everything is, exactly.
A FILE of - is the standard input.

  --json        prints the sheet as JSON
  --drop-frame  timecode of 29.97 and 59.94 drops frames
  --help        prints this text

With --svg a timeline is drawn instead, its tracks as lanes; or a composition
with a size: the frame, the outline of
every layer, filled from back to front, with a dashed line around its part in
the frame, layers seen from the side as a line, and the hull of them all.

  --time FRAME   as it is at a frame; else with every layer, at its first key
  --hit X,Y      marks a point, and prints the layers under it from front to back
                 with the distance of their nearest edge
  --tolerance D  pixels by which a hit may be beside a layer
  --grid N       draws N x N points in the colours of the layers they hit

A composition file is a JSON object:
  name       text
  frameRate  frames a second: "24000/1001", 25, or a decimal: 23.976, 29.97
             and their like stand for thousands over 1001
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

// A whole file; "-" is the standard input.
std::string ReadText(const std::string& fileName) {
  std::ostringstream text;
  std::ifstream file;
  if (fileName != "-") file.open(fileName);
  std::istream& in = fileName == "-" ? std::cin : file;
  if (!(text << in.rdbuf()) && !in.eof()) throw comp::InputError(fileName + ": cannot be read.");
  return text.str();
}

struct Arguments {
  bool asJson = false;
  bool mayDrop = false;  ///< Timecode of 29.97 and 59.94 drops frames.
  std::string svg;       ///< The file to draw to, if any.
  comp::PictureOptions picture;
  std::vector<std::string> fileNames;
};

// The sheets of all files, complete before anything is printed.
std::string MakeSheets(const Arguments& arguments) {
  std::string text;
  for (const std::string& fileName : arguments.fileNames) {
    const std::string file = ReadText(fileName);
    if (!arguments.asJson && !text.empty()) text += '\n';
    if (comp::IsOtio(file)) {
      const auto timelines = comp::ReadOtio(file, fileName);
      text += arguments.asJson ? comp::ToJson(timelines, arguments.mayDrop)
                               : comp::ToTable(timelines, arguments.mayDrop);
      continue;
    }
    std::istringstream stream(file);
    const comp::Sheet sheet = comp::MakeSheet(comp::ReadComposition(stream, fileName));
    text += arguments.asJson ? comp::ToJson(sheet) : comp::ToTable(sheet);
  }
  return text;
}

// One or more numbers with commas between them, and nothing else.
std::vector<double> ParseNumbers(const std::string& option, const std::string& text, size_t count) {
  std::vector<double> numbers;
  const char* at = text.data();
  const char* const end = at + text.size();
  while (numbers.size() < count) {
    double number;
    const auto [rest, error] = std::from_chars(at, end, number);
    if (error != std::errc() || !std::isfinite(number)) break;
    numbers.push_back(number);
    at = rest;
    if (numbers.size() == count || at == end || *at != ',') break;
    ++at;
  }
  if (numbers.size() != count || at != end) {
    throw comp::InputError(option + " takes " + (count == 1 ? "a number" : "two numbers") +
                           ", not " + text + ".");
  }
  return numbers;
}

Arguments ParseArguments(const std::vector<std::string>& words) {
  Arguments arguments;
  for (size_t i = 0; i < words.size(); ++i) {
    const std::string& word = words[i];
    const auto next = [&] {
      if (++i == words.size()) throw comp::InputError(word + " is not followed by a value.");
      return words[i];
    };
    const auto number = [&] { return ParseNumbers(word, next(), 1)[0]; };
    if (word == "--json") {
      arguments.asJson = true;
    } else if (word == "--svg") {
      arguments.svg = next();
    } else if (word == "--time") {
      arguments.picture.frame = number();
    } else if (word == "--hit") {
      const auto numbers = ParseNumbers(word, next(), 2);
      arguments.picture.point = {numbers[0], numbers[1]};
    } else if (word == "--tolerance") {
      arguments.picture.tolerance = number();
    } else if (word == "--grid") {
      const double points = number();
      if (!(points >= 1 && points <= 1000))
        throw comp::InputError("--grid takes 1 to 1000 points.");
      arguments.picture.grid = static_cast<int>(points);
    } else if (word == "--drop-frame") {
      arguments.mayDrop = true;
    } else if (word.starts_with("-") && word != "-") {
      throw comp::InputError(word + " is not an option; see comp --help.");
    } else {
      arguments.fileNames.push_back(word);
    }
  }
  if (arguments.fileNames.empty()) throw comp::InputError("no file is given; see comp --help.");
  if (!arguments.svg.empty() && arguments.fileNames.size() != 1) {
    throw comp::InputError("--svg draws one file.");
  }
  return arguments;
}

void WriteFile(const std::string& name, const std::string& text) {
  std::ofstream file(name);
  if (!(file << text << std::flush)) throw std::ios_base::failure(name + " cannot be written");
}

// Draws to a file; returns what is to be printed.
std::string MakePicture(const Arguments& arguments) {
  const std::string& fileName = arguments.fileNames[0];
  const std::string given = ReadText(fileName);
  if (comp::IsOtio(given)) {
    WriteFile(arguments.svg, comp::Draw(comp::ReadOtio(given, fileName)[0], arguments.mayDrop));
    return "";
  }
  std::istringstream stream(given);
  const comp::Composition composition = comp::ReadComposition(stream, fileName);
  if (!composition.size) {
    throw comp::InputError(fileName + ": composition has no \"size\" to be drawn in.");
  }
  const comp::Picture picture = comp::Draw(composition, arguments.picture);
  WriteFile(arguments.svg, picture.svg);
  for (const comp::Report& report : picture.reports) {
    std::cerr << "comp: layer \"" << report.layer << "\": " << report.text << '\n';
  }
  std::string text;
  for (const comp::Hit& hit : picture.hits) {
    text +=
        comp::Printable(hit.name) + ", " + comp::ToText(hit.distance) + " from its nearest edge\n";
  }
  if (arguments.picture.point && text.empty()) text = "nothing\n";
  return text;
}

}  // namespace

int main(int argc, char** argv) {
  std::setlocale(LC_ALL, "");
  // What machines read has points in its decimals, wherever it is made.
  std::setlocale(LC_NUMERIC, "C");
  const std::vector<std::string> words(argv + 1, argv + argc);
  if (std::find(words.begin(), words.end(), "--help") != words.end()) {
    std::cout << kHelp;
    return 0;
  }
  // Birth and death are logged; a command line tool has no use for that.
  U_SetLogCallback([](void*, int32_t, const char*, const char*, const char*) {}, nullptr);
  if (M_Birth(0, nullptr) != 0) return EXIT_FAILURE;
  int status = 0;
  try {
    const Arguments arguments = ParseArguments(words);
    const std::string text = arguments.svg.empty() ? MakeSheets(arguments) : MakePicture(arguments);
    if (!(std::cout << text << std::flush)) {
      std::cerr << "comp: the output cannot be written.\n";
      status = EXIT_FAILURE;
    }
  } catch (const comp::InputError& error) {
    std::cerr << "comp: " << error.what() << '\n';
    status = kBadInput;
  } catch (const std::ios_base::failure&) {
    std::cerr << "comp: the picture cannot be written.\n";
    status = EXIT_FAILURE;
  }
  M_Death();
  return status;
}
