#pragma once

#include <cstdio>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <sys/wait.h>

#include "console/Answer.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

using console::Json;

struct Outcome {
  int exitCode = -1;
  Json document;
  String said;  // on the standard error
  String error() const { return document["error"]["number"].get<String>(); }
};

// The program itself, run on an installation of its own that `qvsa init` made: Admin's password is Adm1n-first.
class Program : public testing::Test {
 protected:
  void SetUp() override { ASSERT_EQ(run("init", "Adm1n-first\nSa-first\n").exitCode, 0); }

  String server() const { return "file:" + (folder_.path() / name_).string(); }

  // Runs the program with --json and `input` on its standard input.
  Outcome run(const String& arguments, const String& input = "") {
    const auto inputFile = folder_.path() / "input";
    const auto errorFile = folder_.path() / "error";
    std::ofstream(inputFile) << input;
    const String command = String(QVSA_CONSOLE) + " --json --server '" + server() + "' " + arguments + " <'" +
                           inputFile.string() + "' 2>'" + errorFile.string() + "'";
    FILE* pipe = popen(command.c_str(), "r");
    String output;
    char buffer[4096];
    for (std::size_t count; (count = fread(buffer, 1, sizeof buffer, pipe)) > 0;) output.append(buffer, count);
    const int status = pclose(pipe);
    std::stringstream said;
    said << std::ifstream(errorFile).rdbuf();
    return {WEXITSTATUS(status), Json::parse(output, nullptr, false), said.str()};
  }

  // What a terminal shows.
  String shown(const String& arguments) {
    FILE* pipe = popen((String(QVSA_CONSOLE) + " --server '" + server() + "' " + arguments).c_str(), "r");
    char buffer[4096] = {};
    const std::size_t count = fread(buffer, 1, sizeof buffer - 1, pipe);
    pclose(pipe);
    return String(buffer, count);
  }

  void execute(const String& statement, const String& database = "QVSys") {
    PlainSession(server(), database).run(statement);
  }
  String value(const String& query, const String& database = "QVSys") {
    return PlainSession(server(), database).rows(query).at(0);
  }

  TestFolder folder_;
  String name_ = "installation";
};

}  // namespace QVSa::test
