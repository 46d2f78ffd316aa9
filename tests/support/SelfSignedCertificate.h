#pragma once

#include <filesystem>

namespace QVSa::test {

// Writes a certificate for 127.0.0.1 that signs itself, good for a day, and its key, both as PEM.
void writeSelfSignedCertificate(const std::filesystem::path& certificate, const std::filesystem::path& key);

}  // namespace QVSa::test
