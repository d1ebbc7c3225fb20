#include "Terminal.h"

#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string_view>

#include "Text.h"

namespace comp {

bool TakesColor() {
  const char* const refused = std::getenv("NO_COLOR");
  return isatty(STDOUT_FILENO) && !(refused && *refused);
}

std::string Colored(const std::string& sheet) {
  constexpr std::string_view kBold = "\x1b[1m", kYellow = "\x1b[33m", kPlain = "\x1b[0m";
  std::string text;
  text.reserve(sheet.size() + sheet.size() / 8);
  for (size_t i = 0; i < sheet.size();) {
    const size_t end = std::min(sheet.find('\n', i), sheet.size());
    const std::string_view line = std::string_view(sheet).substr(i, end - i);
    if (!line.empty() && line[0] != ' ' && line[0] != '~') {
      text.append(kBold).append(line).append(kPlain);
    } else {
      // A number that is marked, up to its end.
      for (size_t at = 0; at < line.size();) {
        const size_t mark = std::min(line.find('~', at), line.size());
        text.append(line.substr(at, mark - at));
        at = std::min(line.find(' ', mark), line.size());
        if (at > mark) text.append(kYellow).append(line.substr(mark, at - mark)).append(kPlain);
      }
    }
    if (end < sheet.size()) text += '\n';
    i = end + 1;
  }
  return text;
}

Progress::Progress() {
  if (isatty(STDERR_FILENO)) thread_ = std::thread([this] { Run(); });
}

Progress::~Progress() {
  if (!thread_.joinable()) return;
  {
    const std::lock_guard lock(mutex_);
    isOver_ = true;
  }
  ends_.notify_one();
  thread_.join();
}

void Progress::Say(const std::string& sentence) {
  const std::lock_guard lock(mutex_);
  sentence_ = sentence;
}

void Progress::Run() {
  constexpr size_t kWidth = 79;
  std::unique_lock lock(mutex_);
  bool isShown = false;
  while (!ends_.wait_for(lock, std::chrono::seconds(1), [this] { return isOver_; })) {
    std::fprintf(stderr, "\r%s", PadRight(Shortened(sentence_, kWidth), kWidth).c_str());
    isShown = true;
  }
  if (isShown) std::fprintf(stderr, "\r%*s\r", static_cast<int>(kWidth), "");
}

}  // namespace comp
