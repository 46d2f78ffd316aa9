#include "platform/RandomBytes.h"

#include <unistd.h>

#include "QVSa/values/Failure.h"

namespace QVSa::platform {

void fillRandom(std::span<std::uint8_t> bytes) {
  if (::getentropy(bytes.data(), bytes.size()) != 0) throw runtimeFailure(number::internal);
}

}  // namespace QVSa::platform
