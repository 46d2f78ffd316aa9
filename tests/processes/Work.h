#pragma once

#include <string>
#include <vector>

namespace QVSa::test {

// What a worker does. All begin when their standard input ends, live on 7 March 2024, and write lines:
//   sign-on SERVER LOGIN COUNT      signs the user on with the right password so many times, as a host of people does;
//                                   a line for each refusal, then "done"
//   guess SERVER COUNT WAY          signs Ann on with a wrong password by User or by SignOn; a line for each other
//                                   answer than the two right ones, then "told" and how often it was not the lock
//   issue SERVER RULE COUNT         asks for numbers until it has so many: a line for each, one with "collisions" and
//                                   their count at the end, and one for each failure that is no clean collision
//   restore SERVER SYS APP PASSWORD restores the two files; "done", or the failure's number and text
//   back-up SERVER SYS APP [SIZE]   backs up into the two files, on a disk that takes none above so many bytes; "done",
//                                   or the failure's number and text
//   write SERVER                    adds 1 to both rows of the table pair in one transaction, signs Ann on, and so on
//                                   without end; "writing" after the first time, and a line for each failure
//   call-last SERVER                signs Ann on, and once more from a static that is destroyed after all others, which
//                                   changes her password and ends that session: "done", or the failure's number and
//                                   text
// Gives the exit code.
int doWork(const std::vector<std::string>& words);

}  // namespace QVSa::test
