#pragma once

#include <stdexcept>

#include "QVSa/values/Values.h"
#include "bindings/c/qvsa.h"

namespace QVSa::binding {

// Why a call could not be made: a negative code of qvsa.h, and a text for the programmer who made it.
class CallFailure : public std::runtime_error {
 public:
  CallFailure(qvsa_code code, const String& text) : std::runtime_error(text), code_(code) {}
  qvsa_code code() const { return code_; }

 private:
  qvsa_code code_;
};

}  // namespace QVSa::binding
