#include "QVSa/maintenance/internal/RotatedKey.h"

#include <algorithm>

#include "QVSa/frame/Secrets.h"

namespace QVSa {

String rotatedKey(Integer start) {
  const auto& characters = deploymentSecrets().rotatedKeyCharacters;
  const auto first = characters.begin() + std::clamp<std::ptrdiff_t>(start, 0, std::ssize(characters) - 1);
  String key(first, characters.end());
  return key.append(characters.begin(), first);
}

}  // namespace QVSa
