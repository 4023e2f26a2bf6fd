// The end of the running program: its clean-up procedures and the closes of its references, run
// on a thread of the host's own.
#ifndef SVHOST_END_PROGRAM_H
#define SVHOST_END_PROGRAM_H

namespace svhost {

// Joins an end that was started and not joined, if any, dropping its report.
void JoinPendingEnd();

}  // namespace svhost

#endif
