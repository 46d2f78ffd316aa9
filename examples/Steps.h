#pragma once

#include <cstdio>
#include <exception>

#include "QVSa/values/Values.h"

// A row of steps on one installation, each shown with what the library returned; whether all went as they should is the
// program's exit code.
class Steps {
 protected:
  explicit Steps(QVSa::String server) : server_(std::move(server)) {}

  void title(const char* text) { std::printf("\n%2d  %s\n", ++step_, text); }

  void line(const QVSa::String& call, const QVSa::String& returned, bool expected) {
    asExpected_ = asExpected_ && expected;
    std::printf("      %-58s %s%s\n", call.c_str(), returned.c_str(), expected ? "" : "   <- unexpected");
  }

  template <class Object>
  Object connected() {
    Object object;
    if (!object.connect(server_, "QVApp")) line("connect", object.errDescription(), false);
    return object;
  }

  int finish(const char* sentence) const {
    std::printf("\n%s\n", asExpected_ ? sentence : "NOT EVERY STEP WENT AS IT SHOULD.");
    return asExpected_ ? 0 : 1;
  }

  const QVSa::String server_;

 private:
  int step_ = 0;
  bool asExpected_ = true;
};

// The main function of a program called with SERVER and LOGIN.
template <class Walk>
int walkAs(const char* program, int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: %s SERVER LOGIN\n", program);
    return 2;
  }
  try {
    return Walk(argv[1], argv[2]).walk();
  } catch (const std::exception& error) {
    std::fprintf(stderr, "%s: %s\n", program, error.what());
    return 1;
  }
}
