#include "QVSa/frame/FieldFile.h"

#include "QVSa/values/Failure.h"
#include "platform/Files.h"
#include "platform/Services.h"

namespace QVSa {

namespace {

constexpr std::size_t chunkSize = 4096;

// The chunks of `length` bytes, the odd one first.
template <class Transfer>
void inChunks(std::size_t length, Transfer transfer) {
  const std::size_t odd = length % chunkSize;
  if (odd != 0) transfer(std::size_t{0}, odd);
  for (std::size_t at = odd; at < length; at += chunkSize) transfer(at, chunkSize);
}

template <class Body>
Boolean reported(String& errText, Body body) {
  try {
    body();
    return true;
  } catch (const std::bad_alloc&) {
    throw;
  } catch (...) {
    errText = currentFailure().description();
    platform::services().eventLog(errText);
    return false;
  }
}

}  // namespace

Boolean fileToField(Field field, const String& path, String& errText) {
  return reported(errText, [&] {
    const Bytes content = platform::readFile(path);
    inChunks(content.size(), [&](std::size_t at, std::size_t size) {
      const auto begin = content.begin() + static_cast<std::ptrdiff_t>(at);
      field.AppendChunk(Bytes(begin, begin + static_cast<std::ptrdiff_t>(size)));
    });
  });
}

Boolean fieldToFile(Field field, const String& path, String& errText) {
  return reported(errText, [&] {
    if (field.isNull()) return;
    Bytes content;
    inChunks(static_cast<std::size_t>(field.ActualSize()), [&](std::size_t, std::size_t size) {
      const Bytes chunk = field.GetChunk(static_cast<Long>(size));
      content.insert(content.end(), chunk.begin(), chunk.end());
    });
    platform::writeFile(path, content);
  });
}

}  // namespace QVSa
