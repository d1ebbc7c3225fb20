// comp: prints the sheet of a composition file.

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <clocale>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <new>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "Composition.h"
#include "Language.h"
#include "M_Utils.h"
#include "Otio.h"
#include "Picture.h"
#include "Rates.h"
#include "SheetText.h"
#include "Terminal.h"
#include "Text.h"
#include "TimelinePicture.h"
#include "TimelineText.h"
#include "U.h"
#include "Wording.h"

namespace {

using comp::Later;
using comp::Tr;

constexpr int kBadInput = 2;

constexpr const char* kAbout = Later(
    R"(Prints the sheet of each FILE; - is the standard input.

Of a composition: when each layer is there, in exact seconds, frames and
timecode, also held to the composition. With a size also where its layers lie:
their corners and pixels, and for layers in space how they are moved, scaled,
sheared and turned, and where the camera sees them.

Of a timeline of OpenTimelineIO (.otio): what is where in each track, record and
source times as timecode, and how long everything is.

With --svg the file is drawn instead: a timeline's tracks as lanes; a
composition as a viewer shows it, its layers filled from back to front, those
seen from the side as lines, with a dashed line around what is in the frame, and
the hull of them all.)");

constexpr const char* kFormat = Later(R"(A composition file is a JSON object:
  name       text
  frameRate  frames a second: "24000/1001", 25, or a decimal: 23.976, 29.97
             and their like stand for thousands over 1001
  start      first frame, or its timecode, "01:00:00:00"
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
if an argument or a file cannot be used. What the library reports is part of the
sheet. A terminal gets colours, unless NO_COLOR is set.
)");

void Say(const std::string& sentence) {
  std::cerr << "comp: " << comp::Printable(sentence) << '\n';
}

// A whole file; "-" is the standard input.
std::string ReadText(const std::string& fileName) {
  std::ifstream file;
  if (fileName != "-") file.open(fileName);
  std::istream& in = fileName == "-" ? std::cin : file;
  try {
    if (in) return {std::istreambuf_iterator<char>(in), {}};
  } catch (const std::ios_base::failure&) {
    // A folder, or a file that is gone.
  }
  throw comp::InputError(Tr("{0}: cannot be read.", {fileName}));
}

struct Arguments {
  bool asJson = false;
  bool asCsv = false;  ///< Timelines only.
  bool withOverlaps = false;
  bool mayDrop = false;  ///< Timecode of 29.97 and 59.94 drops frames.
  std::string svg;       ///< The file to draw to, if any.
  comp::PictureOptions picture;
  std::vector<std::string> fileNames;
};

// The sheets of all files, complete before anything is printed. As JSON one document: all timelines
// together, and an array where there is more than that.
std::string MakeSheets(const Arguments& arguments, comp::Progress* progress) {
  std::vector<std::string> documents;
  std::vector<comp::Timeline> timelines;
  const bool areTogether = arguments.asJson || arguments.asCsv;
  size_t number = 0;
  for (const std::string& fileName : arguments.fileNames) {
    progress->Say(Tr("{0} ({1} of {2})", {comp::Printable(fileName), std::to_string(++number),
                                          std::to_string(arguments.fileNames.size())}));
    const std::string file = ReadText(fileName);
    if (comp::IsOtio(file)) {
      const auto read = comp::ReadOtio(file, fileName);
      timelines.insert(timelines.end(), read.begin(), read.end());
      if (!areTogether) documents.push_back(comp::ToTable(read, arguments.mayDrop));
      continue;
    }
    if (arguments.asCsv) throw comp::InputError(Tr("{0}: --csv is for timelines.", {fileName}));
    const comp::Sheet sheet =
        comp::MakeSheet(comp::ReadComposition(file, fileName), arguments.withOverlaps);
    documents.push_back(arguments.asJson ? comp::ToJson(sheet)
                                         : comp::ToTable(sheet, arguments.mayDrop));
  }
  if (arguments.asJson && !timelines.empty()) {
    documents.push_back(comp::ToJson(timelines, arguments.mayDrop));
  }
  if (arguments.asCsv) documents.push_back(comp::ToCsv(timelines, arguments.mayDrop));
  if (documents.size() == 1) return std::move(documents[0]);
  const bool isArray = arguments.asJson && documents.size() > 1;
  std::string text = isArray ? "[\n" : "";
  for (const std::string& document : documents) {
    if (&document != &documents[0]) text += isArray ? ",\n" : "\n";
    text += document;
  }
  return isArray ? text + "]\n" : text;
}

// Tells the parser what there is. What it finds goes to `arguments`, which has to stay.
void AddOptions(CLI::App* app, Arguments* arguments) {
  const CLI::Validator finite(
      [](std::string& text) {
        const auto number = comp::ToDouble(text);
        return number && std::isfinite(*number) ? std::string() : Tr("{0} is not a number", {text});
      },
      "");
  comp::PictureOptions& picture = arguments->picture;
  app->set_help_flag("-h,--help", Tr("prints this help and exits"));
  app->set_version_flag("--version", COMP_VERSION, Tr("prints the version and exits"));
  for (const char* label :
       {Later("Usage"), Later("OPTIONS"), Later("Positionals"), Later("Options"), Later("REQUIRED"),
        Later("Needs"), Later("Excludes")}) {
    app->get_formatter()->label(label, Tr(label));
  }
  app->add_option("FILE", arguments->fileNames, Tr("compositions and timelines"))->required();
  auto* const json = app->add_flag("--json", arguments->asJson, Tr("prints sheets as JSON"));
  auto* const csv =
      app->add_flag("--csv", arguments->asCsv, Tr("prints timelines as comma-separated values"))
          ->excludes(json);
  app->add_flag("--overlaps", arguments->withOverlaps, Tr("also what layers have in common"));
  app->add_flag("--drop-frame", arguments->mayDrop, Tr("timecode of 29.97 and 59.94 drops frames"));
  auto* const svg =
      app->add_option("--svg", arguments->svg, Tr("the file to draw to"))->excludes(json, csv);
  app->add_option("--time", picture.frame,
                  Tr("as it is at a frame; else with every layer, at its first key"))
      ->needs(svg)
      ->check(finite);
  app->add_option_function<std::array<double, 2>>(
         "--hit",
         [&](const auto& point) {
           picture.point = {point[0], point[1]};
         },
         Tr("marks a point X,Y, and prints the layers under it from front to back with the "
            "distance of their nearest edge"))
      ->delimiter(',')
      ->needs(svg)
      ->check(finite);
  app->add_option("--tolerance", picture.tolerance,
                  Tr("pixels by which a hit may be beside a layer"))
      ->needs(svg)
      ->check(finite)
      ->check(CLI::NonNegativeNumber);
  app->add_option("--grid", picture.grid,
                  Tr("draws N x N points in the colours of the layers they hit"))
      ->needs(svg)
      ->check(CLI::Range(1, 1000));
  app->footer(Tr(kFormat));
}

void WriteFile(const std::string& name, const std::string& text) {
  std::ofstream file(name);
  if (!(file << text << std::flush)) throw std::ios_base::failure(name + " cannot be written");
}

// Draws to a file; returns what is to be printed.
std::string MakePicture(const Arguments& arguments, comp::Progress* progress) {
  const std::string& fileName = arguments.fileNames[0];
  progress->Say(comp::Printable(fileName));
  const std::string given = ReadText(fileName);
  if (comp::IsOtio(given)) {
    const comp::PictureOptions& picture = arguments.picture;
    if (picture.frame || picture.point || picture.grid > 0) {
      throw comp::InputError(Tr("{0}: --time, --hit and --grid are for compositions.", {fileName}));
    }
    const auto timelines = comp::ReadOtio(given, fileName);
    WriteFile(arguments.svg, comp::Draw(timelines[0], arguments.mayDrop));
    if (timelines.size() > 1) Say(Tr("{0}: only the first timeline is drawn.", {fileName}));
    return "";
  }
  const comp::Composition composition = comp::ReadComposition(given, fileName);
  if (!composition.size) {
    throw comp::InputError(Tr("{0}: composition has no \"size\" to be drawn in.", {fileName}));
  }
  const comp::Picture picture = comp::Draw(composition, arguments.picture);
  WriteFile(arguments.svg, picture.svg);
  for (const comp::Report& report : picture.reports) {
    std::cerr << "comp: " << Tr("layer \"{0}\": {1}", {comp::Printable(report.layer), report.text})
              << '\n';
  }
  std::string text;
  for (const comp::Hit& hit : picture.hits) {
    text += Tr("{0}, {1} from its nearest edge",
               {comp::Printable(hit.name), comp::ToText(hit.distance)}) +
            '\n';
  }
  if (arguments.picture.point && text.empty()) text = std::string(Tr("nothing")) + "\n";
  return text;
}

int Run(int argc, char** argv) {
  Arguments arguments;
  CLI::App app(Tr(kAbout), "comp");
  AddOptions(&app, &arguments);
  try {
    app.parse(argc, argv);
    if (!arguments.svg.empty() && arguments.fileNames.size() != 1) {
      throw CLI::ValidationError(Tr("--svg draws one file"));
    }
  } catch (const CLI::Success& asked) {
    return app.exit(asked);
  } catch (const CLI::ParseError& error) {
    const bool isMissing = error.get_name() == "RequiredError";
    Say(Tr("{0}; see comp --help.", {isMissing ? Tr("FILE is required") : error.what()}));
    return kBadInput;
  }
  // Birth and death are logged; a command line tool has no use for that.
  U_SetLogCallback([](void*, int32_t, const char*, const char*, const char*) {}, nullptr);
  if (M_Birth(0, nullptr) != 0) return EXIT_FAILURE;
  int status = 0;
  try {
    std::string text;
    {
      comp::Progress progress;
      text = arguments.svg.empty() ? MakeSheets(arguments, &progress)
                                   : MakePicture(arguments, &progress);
    }
    const bool isForPeople = arguments.svg.empty() && !arguments.asJson && !arguments.asCsv;
    if (isForPeople && comp::TakesColor()) text = comp::Colored(text);
    if (!(std::cout << text << std::flush)) {
      Say(Tr("The output cannot be written."));
      status = EXIT_FAILURE;
    }
  } catch (const comp::InputError& error) {
    Say(error.what());
    status = kBadInput;
  } catch (const std::ios_base::failure&) {
    Say(Tr("The picture cannot be written."));
    status = EXIT_FAILURE;
  }
  M_Death();
  return status;
}

}  // namespace

int main(int argc, char** argv) {
  std::setlocale(LC_ALL, "");
  // What machines read has points in its decimals, wherever it is made.
  std::setlocale(LC_NUMERIC, "C");
  // At once, since a tree of JSON needs memory even to be given up.
  static const char* const outOfMemory = Tr("There is not enough memory.");
  std::set_new_handler([] {
    std::fprintf(stderr, "comp: %s\n", outOfMemory);
    std::_Exit(EXIT_FAILURE);
  });
  try {
    return Run(argc, argv);
  } catch (const std::exception& error) {
    Say(error.what());
  }
  return EXIT_FAILURE;
}
