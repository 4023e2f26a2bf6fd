// A program linked with refused_mutexes.cpp refuses priority inheritance to every mutex made while
// gRefuseMutexes is set, as it is from the start: the managers built at load then have no mutex.
#ifndef KVSVTEST_SUPPORT_REFUSED_MUTEXES_H
#define KVSVTEST_SUPPORT_REFUSED_MUTEXES_H

#include <atomic>

namespace kvsvtest {

extern std::atomic<bool> gRefuseMutexes;

}  // namespace kvsvtest

#endif
