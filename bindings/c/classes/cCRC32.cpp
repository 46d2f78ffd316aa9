#include "QVSa/maintenance/cCRC32.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<cCRC32>& crc) {
  crc.operation("GetByteArrayCrc32", {"bytes"}, &cCRC32::GetByteArrayCrc32)
      .operation("GetFileCrc32", {"path"}, &cCRC32::GetFileCrc32);
}

}  // namespace QVSa::binding
