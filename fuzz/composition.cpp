// The reader of the example's compositions, and what is made of what it has read.

#include <sstream>

#include "Composition.h"
#include "Input.h"
#include "Picture.h"
#include "Sheet.h"
#include "SheetText.h"

void Run(Input& input) {
  std::istringstream stream(input.Text());
  try {
    const comp::Composition composition = comp::ReadComposition(stream, "input");
    const comp::Sheet sheet = comp::MakeSheet(composition);
    comp::ToJson(sheet);
    if (composition.size) comp::Draw(composition, {});
  } catch (const comp::InputError&) {
  }
}
