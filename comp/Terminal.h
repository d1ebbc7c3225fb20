/// \file
/// What only a terminal gets to see.
#ifndef COMP_TERMINAL_H
#define COMP_TERMINAL_H

#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>

namespace comp {

/// Whether standard output is a terminal, and its user has nothing against colour (NO_COLOR).
bool TakesColor();

/// A sheet with its heads bold, and what is not exact in colour.
std::string Colored(const std::string& sheet);

/// Tells on standard error what is being done, if that is a terminal, once work takes longer than a
/// second; and wipes it out in the end.
class Progress {
 public:
  Progress();
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// A printable sentence about what comes now.
  void Say(const std::string& sentence);

 private:
  void Run();

  std::mutex mutex_;
  std::condition_variable ends_;
  std::string sentence_;
  bool isOver_ = false;
  std::thread thread_;
};

}  // namespace comp

#endif  // COMP_TERMINAL_H
