#include "providers/embedded/storage/CatalogueMark.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/FileDescriptor.h"
#include "providers/embedded/storage/OpeningFailure.h"

namespace QVSa::embedded {

namespace {

constexpr std::size_t size = sizeof(std::uint64_t);

void* mapped(const std::filesystem::path& path) {
  const platform::FileDescriptor file(::open(path.c_str(), O_RDWR | O_CLOEXEC));
  struct stat known {};
  if (!file.isOpen() || ::fstat(file.get(), &known) != 0) return MAP_FAILED;
  // Two that find the file empty make it equally long.
  if (known.st_size < static_cast<off_t>(size) && ::ftruncate(file.get(), size) != 0) return MAP_FAILED;
  return ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_SHARED, file.get(), 0);
}

}  // namespace

CatalogueMark::CatalogueMark(const std::filesystem::path& file) {
  void* const memory = mapped(file);
  if (memory == MAP_FAILED) throw cannotOpenLockFile(file);
  place_ = static_cast<std::uint64_t*>(memory);
}

CatalogueMark::~CatalogueMark() { ::munmap(place_, size); }

CatalogueChange::CatalogueChange(const CatalogueMark& mark) : mark_(mark) { mark_.number().fetch_or(1); }

// Others may be at it, too: whoever ends makes a number that was not there before.
CatalogueChange::~CatalogueChange() {
  std::uint64_t now = mark_.value();
  while (!mark_.number().compare_exchange_weak(now, (now | 1) + 1)) continue;
}

}  // namespace QVSa::embedded
