// The readers of compositions and timelines, and what is made of what they have read.

#include "Composition.h"
#include "Otio.h"
#include "Picture.h"
#include "Sheet.h"
#include "SheetText.h"
#include "TimelinePicture.h"
#include "TimelineText.h"
#include "U.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  // Reports are part of the game: nobody wants to read them.
  U_SetReportCallback([](void*, const U_Report*) {}, nullptr);
  const std::string text(reinterpret_cast<const char*>(data), size);
  try {
    if (comp::IsOtio(text)) {
      const auto timelines = comp::ReadOtio(text, "input");
      comp::ToJson(timelines, true);
      comp::ToTable(timelines, false);
      comp::Draw(timelines[0], true);
      return 0;
    }
    const comp::Composition composition = comp::ReadComposition(text, "input");
    const comp::Sheet sheet = comp::MakeSheet(composition);
    comp::ToJson(sheet);
    comp::ToTable(sheet, true);
    if (composition.size) comp::Draw(composition, {});
  } catch (const comp::InputError&) {
  }
  return 0;
}
