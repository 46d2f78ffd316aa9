#pragma once

#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"

namespace QVSa::test {

// The failure that `body` throws; its number is 0 where it throws none.
template <class Body>
Failure thrownBy(Body body) {
  try {
    body();
  } catch (const Failure& failure) {
    return failure;
  }
  return Failure(0, "", "");
}

template <class Body>
Long failureOf(Body body) {
  return thrownBy(body).number();
}

}  // namespace QVSa::test
