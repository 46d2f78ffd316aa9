#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// What a client machine asks a server: which release it runs, and whether the program files here are those of it. Holds
// one connection to QVUpdate from `connect` to its end.
//   QVAgent agent;  agent.connect(server);  if (agent.newFiles() == 1) start the update program beside this one
class QVSA_EXPORT QVAgent : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // The release of the files.
  String release() const { return release_; }
  // The release of the database's layout.
  String DBrelease() const { return DBrelease_; }
  // Ids of the reports that the lock of a restored copy hides, joined with "."; empty without a lock.
  String hiddenReps() const { return hiddenReps_; }
  // Empty before release 8.1.
  String buildNo() const { return buildNo_; }

  // Opens the connection and reads the four texts; one that the server lacks keeps its value. Throws Failure.
  void connect(const String& server);
  // Compares the program's files beside the running one with those shipped: 0 they are current, 1 one is missing or
  // differs, -1 failure. With 1 the update program lies beside them, unless consoleNotDownloaded (0x80040A8D) tells
  // that it could not be written; it is not started.
  Integer newFiles();

 private:
  void openUpdates();
  Boolean isCurrent();
  void fetchUpdateProgram();

  Connection connection_;
  String release_;
  String DBrelease_;
  String hiddenReps_;
  String buildNo_;
};

}  // namespace QVSa
