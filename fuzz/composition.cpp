// The reader of the example's compositions, and what is made of what it has read.

#include <sstream>

#include "Composition.h"
#include "Picture.h"
#include "Sheet.h"
#include "SheetText.h"
#include "U.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  // Reports are part of the game: nobody wants to read them.
  U_SetReportCallback([](void*, const U_Report*) {}, nullptr);
  std::istringstream stream(std::string(reinterpret_cast<const char*>(data), size));
  try {
    const comp::Composition composition = comp::ReadComposition(stream, "input");
    const comp::Sheet sheet = comp::MakeSheet(composition);
    comp::ToJson(sheet);
    if (composition.size) comp::Draw(composition, {});
  } catch (const comp::InputError&) {
  }
  return 0;
}
