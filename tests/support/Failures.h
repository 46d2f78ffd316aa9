#pragma once

#include <gtest/gtest.h>

#include "QVSa/frame/Failure.h"

namespace QVSa::test {

// The number of the failure that `body` throws; 0 where it throws none.
template <class Body>
Long failureOf(Body body) {
  try {
    body();
    return 0;
  } catch (const Failure& failure) {
    return failure.number();
  }
}

}  // namespace QVSa::test
