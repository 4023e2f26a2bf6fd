/*
 * svsim.h: control of the Sorvel runtime stand-in (libsvhost.so), for tests and tools. The host
 * operations themselves (sv...) are declared in kvsvplatform.h; these calls set the stand-in up,
 * break it on purpose and read back what the library did to it.
 *
 * Every call is safe from any thread. Nothing here is reset by anything but svsimReset and the
 * calls that name what they reset.
 */
#ifndef SVSIM_H
#define SVSIM_H

#include <stddef.h>
#include <stdint.h>

#include "kvsvplatform.h"

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Results of the host operations -------------------------------------------------------
 * Memory, string, variant, path and clean-up operations that return a status give 0 on success or
 * one of these two: SVSIM_ERR_ARGUMENT for a null pointer or handle where one is needed (or a
 * text too long for a count), SVSIM_ERR_MEMORY for a failed allocation (a failed resize gives the
 * code set by svsimSetResizeError).
 * svStrPrintf gives the number of bytes written, or SVSIM_PRINTF_BAD_FORMAT or
 * SVSIM_PRINTF_NO_MEMORY. Reference operations give 0 on success or a negative SVSIM_REF_...
 * A handle that is not live (never made, already disposed, or its master pointer overwritten) is
 * never an error code: the process aborts with a message naming the operation. */
#define SVSIM_ERR_ARGUMENT 1
#define SVSIM_ERR_MEMORY 2
#define SVSIM_ERR_LOCK 3
#define SVSIM_PRINTF_BAD_FORMAT (-1)
#define SVSIM_PRINTF_NO_MEMORY (-2)
#define SVSIM_REF_NOT_FOUND (-1)
#define SVSIM_REF_BAD_ARGUMENT (-2)
#define SVSIM_REF_NO_MEMORY (-3)

/* ---- How the host operations behave here ---------------------------------------------------
 * svStrPrintf: directives %[flags -0+ #][width][.precision][h|l|ll]conversion with d i u x X c s
 *   and %%, plus %H whose argument is a string handle (null handle, block or count: ""); a length
 *   on c, s or H is malformed. It replaces the text and grows the handle only when the text does
 *   not fit. svStrFromPtr and svPathToString likewise.
 * svCopyHandle: makes the target, or resizes it to exactly the source's size.
 * svPathCText: the block holds the NUL-terminated characters themselves, no count.
 * svStringToPath: makes a path into a null *path, or sets the text of the one given.
 * svRegisterRefKind3: several references may share a name; each gets its own cookie. */

/* ---- Whole stand-in ------------------------------------------------------------------------ */

/* Puts the stand-in back to its defaults: counters to 0, faults disarmed, resize error code 2,
 * blocks resized in place, references and clean-up procedures forgotten (no close export and no
 * procedure is called), run-mode flags 0, application path the default. Joins an ended program's
 * thread that was not joined yet. Live handles, paths and variants stay as they are. Returns the
 * number of live handles. */
uint64_t svsimReset(void);

/* ---- Handles -------------------------------------------------------------------------------
 * Counts since the last reset (svsimReset or svsimResetCounters): handles made (by any operation
 * that makes one, including the helpers below), resizes done, handles disposed. Failed operations
 * are not counted. svsimHandleSizeQueries counts the calls of svGetHandleSize with a handle.
 * svsimLiveHandles is the number of handles alive now, whatever the resets. */
uint64_t svsimAllocCount(void);
uint64_t svsimResizeCount(void);
uint64_t svsimFreeCount(void);
uint64_t svsimHandleSizeQueries(void);
uint64_t svsimLiveHandles(void);
/* Zeroes the made, resized and disposed counts, the size queries and the injected fault count
 * only. */
void svsimResetCounters(void);

/* Non-zero: every resize moves the block (new block, contents copied, old block overwritten and
 * freed), so that a block pointer kept across a resize reads freed memory. Zero: blocks are
 * resized in place where the allocator can. */
void svsimSetMoveOnResize(int32_t on);

/* ---- Fault injection -----------------------------------------------------------------------
 * Allocations are the making of handles and of paths; resizes are handle resizes, including those
 * that svStrPrintf, svStrFromPtr, svCopyHandle and svPathToString do. */

/* The `n`th allocation from now fails (1: the next one), once. 0 disarms. */
void svsimFailAllocAt(uint32_t n);
/* The `n`th resize from now fails (1: the next one), once. 0 disarms. */
void svsimFailResizeAt(uint32_t n);
/* Non-zero: every allocation and resize fails until called with 0. */
void svsimFailAll(int32_t on);
/* The `n`th Lock, or Unlock, of a waveform array from now fails (1: the next one), once, with
 * SVSIM_ERR_LOCK. 0 disarms. svsimFailAll does not reach them: they are not allocations. A failed
 * Lock opens nothing; a failed Unlock still closes the array. */
void svsimFailWaveformLockAt(uint32_t n);
void svsimFailWaveformUnlockAt(uint32_t n);
/* Status that svSetHandleSizeClr gives when a resize fails; SVSIM_ERR_MEMORY by default. A negative
 * code stands in for a host that reports memory failures as negative numbers. */
void svsimSetResizeError(int32_t code);
/* Number of operations failed by injection since the last reset. */
uint64_t svsimInjectedFaults(void);

/* ---- Run mode and application -------------------------------------------------------------- */

/* Values returned by svIsBoundApp, svIsRunTime and svIsFullFeatureRunTime. All 0 by default: a
 * development environment. */
void svsimSetRunMode(int32_t bound, int32_t runTime, int32_t fullFeature);

/* Text that svAppPath puts into a path. Null restores the default: the directory that holds the
 * running executable. The text is copied. */
void svsimSetAppPath(const char *path);

/* Number of paths made by svEmptyPath or svStringToPath and not yet destroyed. */
uint64_t svsimLivePaths(void);

/* ---- Variants -------------------------------------------------------------------------------
 * A variant lives in an 8-byte slot (an element of a host array of references): the slot holds a
 * pointer to a record owned by the host, made by the first svVariantSetStringAttr on a zeroed
 * slot. */

/* Copies the text of attribute `name` (a plain C string, e.g. "n") of the variant in the slot at
 * `variant` into `text` (at most `size` bytes, NUL-terminated, truncated if need be). Returns the
 * full length of the attribute's text, or -1 if the slot holds no variant or the variant has no
 * such attribute. */
int32_t svsimVariantGetStringAttr(const void *variant, const char *name, char *text, size_t size);
/* Frees the variant in the slot at `variant`, if any, and zeroes the slot. */
void svsimVariantFree(void *variant);
/* Frees the variant of every element of the array of references `array` (count at byte 0,
 * elements from byte 8), then disposes of the array handle. A null handle does nothing. */
void svsimDisposeVariantArray(SvHandle array);
/* Number of variants made and not freed. */
uint64_t svsimLiveVariants(void);

/* ---- References -----------------------------------------------------------------------------
 * What svRegisterRefKind3 recorded. Texts are NUL-terminated, cut to fit their field. */
typedef struct SvsimRefInfo {
  SvRefnum cookie;
  uint32_t handle;
  int32_t keep;
  char name[256];
  char kind[32];
  char className[64];
  char libraryPattern[64];
  char openName[64];
  char closeName[64];
} SvsimRefInfo;

/* Number of references registered now. */
int32_t svsimRefCount(void);
/* The first reference registered under `name` (exact text) into `info`. 1 if found, else 0. */
int32_t svsimFindRef(const char *name, SvsimRefInfo *info);
/* The `index`th reference registered now, in order of registration. 1 if it exists, else 0. */
int32_t svsimGetRef(int32_t index, SvsimRefInfo *info);
/* Forces the result of svRegisterRefKind3, svUnregisterRef and the by-name removal. Negative: the
 * call fails with it and changes nothing. Positive: the call does its work and returns it as a
 * warning. 0: normal results. */
void svsimSetRefStatus(int32_t status);
/* Removes every reference whose name, kind and class name equal the texts of the string handles
 * (`c21` must be 21). 0 if one or more went, SVSIM_REF_NOT_FOUND if none matched,
 * SVSIM_REF_BAD_ARGUMENT for a null handle or a wrong constant. svRegisterRefKind3 likewise gives
 * SVSIM_REF_BAD_ARGUMENT for a null pointer or handle or a protocol constant other than
 * 21, 8, 1, 0, 0, and records nothing; svUnregisterRef gives SVSIM_REF_NOT_FOUND for a cookie that
 * is not registered. This is the host's by-name removal;
 * libsvhostbyname.so exports it as svUnregisterRefByName. */
int32_t svsimUnregisterRefByName(SvHandle name, SvHandle kind, SvHandle className, int32_t c21);

/* The host's open of a reference by its text `text`: calls the export named `openName`, found
 * in the process, with a string handle of the text, the handle output and context 0, puts what
 * it gave into *handle, and registers the reference under the text with `className` and the two
 * export names, so that the end of the program calls `closeName` with the handle. The status of
 * the registration; SVSIM_REF_NOT_FOUND if no export of that name is in the process (nothing is
 * called), SVSIM_REF_BAD_ARGUMENT for a null argument. */
int32_t svsimOpenRefByText(const char *openName, const char *closeName, const char *className,
                           const char *text, uint32_t *handle);

/* ---- Clean-up procedures -------------------------------------------------------------------- */

/* Calls of svSetCleanupProc since the last reset, whatever ran since. */
int32_t svsimCleanupRegistrations(void);
/* Procedures registered and not yet run by an end of program. A registration of a procedure with
 * an argument already pending replaces the pending one (its mode taken anew), so it counts once. */
int32_t svsimPendingCleanups(void);
/* The last registration since the last reset into the non-null pointers. 1 if there was one. */
int32_t svsimLastCleanup(SvCleanupProc *procedure, uint64_t *argument, int32_t *mode);

/* ---- End of a program ------------------------------------------------------------------------
 * The host stops the running program: on a thread of its own it runs every pending clean-up
 * procedure, in order of registration, then calls for every registered reference, in order of
 * registration, the close export named at registration, found in the process by its name, with
 * the reference's 32-bit handle. The procedures and references are taken from the registries when
 * the end starts, so what is registered meanwhile belongs to the next program. */
typedef struct SvsimEndReport {
  int32_t cleanupsRun;
  int32_t closesCalled;
  /* References whose close export is not in the process. */
  int32_t closesMissing;
} SvsimEndReport;

/* Starts the end on a new thread and returns at once. 0, or -1 if an end is already started and
 * its join is not over, or if the thread cannot be made (the taken procedures and references are
 * then dropped without being run). */
int32_t svsimEndProgramAsync(void);
/* Waits for the started end and fills `report` if not null. 0, or -1 if no end was started. */
int32_t svsimJoinEndProgram(SvsimEndReport *report);
/* svsimEndProgramAsync, then svsimJoinEndProgram. */
int32_t svsimEndProgram(SvsimEndReport *report);

/* ---- Waveform arrays -------------------------------------------------------------------------
 * The host's waveform array (SvWaveformArray of kvsvapi.h), with its table of operations. Only
 * positions 3 (GetCount), 6 (Resize), 11 (Lock) and 12 (Unlock) hold operations; the others are
 * null. Each waveform keeps its samples in a handle of the memory manager: Resize makes, resizes
 * (only waveforms whose sample count changes) and disposes of such handles, and these count and
 * fail as any handle operation does (its result is then that operation's code, with the waveforms
 * before the failing one already changed). Resize wants the constant 6 and counts that are not
 * negative, else SVSIM_ERR_ARGUMENT. A new waveform has t0 zero and dt 1.0.
 * Lock wants access 1 or 2, at most as many waveforms as there are and descriptors for them, else
 * SVSIM_ERR_ARGUMENT. It fills each descriptor (t0, dt, numSamples, samples; the rest zero) and
 * keeps the array locked until Unlock; a Lock of 0 waveforms opens nothing. Unlock keeps the t0
 * and dt of each descriptor. An Unlock of an array that is not locked (after a failed Lock) is
 * taken with 0 and counted (svsimStrayWaveformUnlocks). These stop the process with a message, as
 * a dead handle does: an operation on an array that is not live, a Lock of a locked array, an
 * Unlock of another number of waveforms than its Lock, and the disposal of a locked array. */

/* A live array of `count` waveforms of `numSamples` samples each, all zero; null if a handle
 * cannot be made. */
SvWaveformArray *svsimMakeWaveformArray(int32_t count, int32_t numSamples);
/* Disposes of the array and its sample handles. A null array does nothing. */
void svsimDisposeWaveformArray(SvWaveformArray *waveforms);
/* Number of waveforms. */
int32_t svsimWaveformCount(const SvWaveformArray *waveforms);
/* Copies up to `capacity` samples of waveform `index` into `samples` and its timing into the
 * non-null `t0` and `dt`. Returns its sample count, or -1 for an index that is not there. */
int32_t svsimWaveformRead(const SvWaveformArray *waveforms, int32_t index, double *samples,
                          int32_t capacity, SvTime *t0, double *dt);
/* Gives waveform `index` these `numSamples` samples (a resize of its handle if the count changes).
 * 0, the failed resize's code, or -1 for a bad index or count, or a locked array. */
int32_t svsimWaveformWrite(SvWaveformArray *waveforms, int32_t index, const double *samples,
                           int32_t numSamples);
/* 1 while a Lock of the array waits for its Unlock, else 0. */
int32_t svsimWaveformLocked(const SvWaveformArray *waveforms);
/* Calls of the operation at `position` of the table on this array since it was made. */
uint64_t svsimWaveformCalls(const SvWaveformArray *waveforms, int32_t position);
/* Unlocks of arrays that were not locked, since the last svsimReset. */
uint64_t svsimStrayWaveformUnlocks(void);
/* Waveform arrays made and not yet disposed of. */
uint64_t svsimLiveWaveformArrays(void);

/* ---- Host data for tests -------------------------------------------------------------------- */

/* A host double array: count at byte 0, values from byte 8. Null if the allocation fails. */
SvHandle svsimMakeDoubleArray(const double *values, int32_t count);
/* Copies up to `capacity` values of the host double array `array` into `values`. Returns the
 * array's count (0 for a null handle or block). */
int32_t svsimReadDoubleArray(SvHandle array, double *values, int32_t capacity);
/* A string handle holding `text` (copied without its NUL). Null if the allocation fails. */
SvHandle svsimMakeString(const char *text);
/* Copies the text of string handle `string` into `text` (at most `size` bytes, NUL-terminated,
 * truncated if need be). Returns the full length; a null handle, block or count reads as "". */
int32_t svsimReadString(SvHandle string, char *text, size_t size);

#ifdef __cplusplus
}
#endif

#endif
