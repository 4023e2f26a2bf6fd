// A program linked with sleep_recorder.cpp never sleeps in nanosleep: each request is recorded and
// returns at once, so that a test sees when, and for how long, the library waits for another
// thread.
#ifndef KVSVAPI_TESTS_SLEEP_RECORDER_H
#define KVSVAPI_TESTS_SLEEP_RECORDER_H

#include <ctime>
#include <vector>

namespace kvsvtest {

// The next request is cut short as if by a signal, with `remainingNs` left.
void InterruptNextSleep(long remainingNs);
// Blocks until `count` requests have been made since the program started.
void WaitForSleeps(size_t count);
std::vector<timespec> Sleeps();

}  // namespace kvsvtest

#endif
