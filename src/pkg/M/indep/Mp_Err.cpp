#include "Mp_Err.h"

#include <cstdio>

#include "M_Utils.h"
#include "U.h"

namespace {

struct Message {
  int16_t index;
  bool hasDetail;
};

// M_ERR_ZERO_VECTOR and M_ERR_W_IS_ZERO are reported where they are thrown, never through here.
Message MessageOf(int32_t code) {
  switch (code) {
    case M_ERR_OVERFLOW:
      return {Mp_STR_OVERFLOW, true};
    case M_ERR_UNDERFLOW:
      return {Mp_STR_UNDERFLOW, true};
    case M_ERR_DIVIDE_BY_ZERO:
      return {Mp_STR_DIVIDE_BY_ZERO, true};
    case M_ERR_UNREQUESTED_SERVICE:
      return {Mp_STR_UNREQUESTED_SERVICE, true};
    case M_ERR_ZERO_DENOMINATOR:
      return {Mp_STR_ZERO_DENOMINATOR, true};
    case M_ERR_NOT_INVERTIBLE:
      return {Mp_STR_NOT_INVERTIBLE, false};
    case M_ERR_NOT_DECOMPOSABLE:
      return {Mp_STR_NOT_DECOMPOSABLE, false};
    case M_ERR_NO_NORMAL:
      return {Mp_STR_NO_NORMAL, false};
    case M_ERR_NO_PLANE_INTERSECTION:
      return {Mp_STR_NO_PLANE_INTERSECTION, false};
    default:
      return {Mp_STR_UNKNOWN_ERROR, false};
  }
}

}  // namespace

extern "C" int32_t Mp_ReportErr(int16_t place, int32_t code, int16_t detail) {
  if (code == 0) return 0;
  Up_SetThreadLastError(0);
  char* const buffer = Up_GetThreadLoggingBuffer();
  const Message message = MessageOf(code);
  const char* const format = Mp::Text(message.index);
  // The buffer's size is the host's business: it hands out the texts as well as the buffer.
  if (message.index == Mp_STR_UNKNOWN_ERROR) {
    std::sprintf(buffer, format, static_cast<int>(code));
  } else {
    // A message without "%s" leaves its argument unused.
    std::sprintf(buffer, format, message.hasDetail ? Mp::Text(detail) : "");
  }
  Up_ReportError(Mp_ID_BASE | static_cast<uint16_t>(place),
                 code == M_ERR_UNDERFLOW ? Mp_SEVERITY_WARNING : Mp_SEVERITY_ERROR);
  return code;
}
