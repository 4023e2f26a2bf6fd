// Putting the whole stand-in back to its defaults between tests.
#include "cleanups.h"
#include "end_program.h"
#include "fault_plan.h"
#include "handle_store.h"
#include "paths.h"
#include "references.h"
#include "run_mode.h"
#include "svsim.h"
#include "waveform_arrays.h"

extern "C" {

uint64_t svsimReset(void) {
  // An end still running may register or close things: let it finish before forgetting them.
  svhost::JoinPendingEnd();
  svhost::FaultPlan::Instance().Reset();
  svhost::HandleStore::Instance().Reset();
  svhost::ResetReferences();
  svhost::ResetCleanups();
  svhost::ResetRunMode();
  svhost::ResetAppPath();
  svhost::ResetWaveformArrays();
  return svhost::HandleStore::Instance().Live();
}

void svsimResetCounters(void) {
  svhost::HandleStore::Instance().ResetCounters();
  svhost::FaultPlan::Instance().ResetCount();
}

}  // extern "C"
