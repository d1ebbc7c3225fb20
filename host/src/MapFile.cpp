// How Emscripten's gettext gets at a catalogue. Its own function is a stub whose failure gettext
// does not notice.

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstddef>

extern "C" const unsigned char* __map_file(const char* path, size_t* size) {
  const int file = open(path, O_RDONLY);
  if (file < 0) return nullptr;
  struct stat status;
  void* map = MAP_FAILED;
  if (fstat(file, &status) == 0) {
    *size = static_cast<size_t>(status.st_size);
    map = mmap(nullptr, *size, PROT_READ, MAP_PRIVATE, file, 0);
  }
  close(file);
  return map == MAP_FAILED ? nullptr : static_cast<const unsigned char*>(map);
}
