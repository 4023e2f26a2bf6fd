/*
 * kvsvapi.h: the functions that Sorvel programs call to drive vehicle networks through the KVOR
 * driver. Plain C, usable from C and C++.
 *
 * Every function returns a status unless stated: 0 success, negative error, positive warning.
 * Errors made by this library have the form 0xBFF63xxx and are listed below; every other value is
 * the driver's and passes through unchanged (kvsvStatusToString gives its text).
 */
#ifndef KVSVAPI_H
#define KVSVAPI_H

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

#if defined(KVSVAPI_BUILDING)
#define KVSV_EXPORT __attribute__((visibility("default")))
#else
#define KVSV_EXPORT
#endif

typedef int32_t kvsvStatus;

/* Host data: a handle points to a master pointer, which points to a relocatable block. */
typedef void **SvHandle;

/* Counted string, the block of a host string handle. */
typedef struct SvStr {
  int32_t cnt;
  unsigned char str[1];
} SvStr;

/* Host time: fraction in units of 2^-64 s, then seconds since 1904-01-01 00:00:00. */
typedef struct SvTime {
  uint64_t fraction;
  int64_t seconds;
} SvTime;

/* Statuses made by this library. */
enum kvsvErrorCode {
  kvErrInternal = (int32_t)0xBFF63001,
  kvErrOutOfMemory = (int32_t)0xBFF63010,
  kvErrNullArgument = (int32_t)0xBFF63015,
  kvErrInvalidSession = (int32_t)0xBFF63020,
  kvErrSessionBusy = (int32_t)0xBFF63027,
  kvErrFlexRayTimeUnknown = (int32_t)0xBFF63080,
  kvErrSystemObjectNotFound = (int32_t)0xBFF6308A,
  kvErrDatabaseListChanged = (int32_t)0xBFF6308E,
  kvErrFrameCountTooSmall = (int32_t)0xBFF63090,
  kvErrSessionFile = (int32_t)0xBFF63092,
  kvErrSessionAlreadyOpen = (int32_t)0xBFF63093,
  kvErrManualSessionName = (int32_t)0xBFF6309C,
  kvErrPayloadTruncated = (int32_t)0xBFF6309F,
  kvErrInvalidTimeout = (int32_t)0xBFF630A0,
  kvErrDeviceNameEmpty = (int32_t)0xBFF630A5,
  kvErrPayloadMaxTooLarge = (int32_t)0xBFF630AF,
  kvErrOutputMemory = (int32_t)0xBFF630B0,
  kvErrNameTooLong = (int32_t)0xBFF630C0,
  kvErrFlexRayTimeInvalid = (int32_t)0xBFF630C1,
  kvErrDbObjectNotFound = (int32_t)0xBFF63131,
  kvErrDatabaseModeConflict = (int32_t)0xBFF6315E,
  kvErrElementCountMismatch = (int32_t)0xBFF63160,
  kvErrInterfaceTagMismatch = (int32_t)0xBFF63161,
  kvErrSessionNotInInterface = (int32_t)0xBFF63162,
  kvErrDbReferenceEmpty = (int32_t)0xBFF63163,
  kvErrDbReferenceSyntax = (int32_t)0xBFF63164,
  kvErrSessionNameEmpty = (int32_t)0xBFF63166,
  kvErrDbReferenceTooDeep = (int32_t)0xBFF63173,
  kvErrScheduleNumberInvalid = (int32_t)0xBFF6317D,
  kvErrScheduleNameUnknown = (int32_t)0xBFF6317E,
  kvErrSubIdNumberInvalid = (int32_t)0xBFF6317F,
  kvErrSubIdNameUnknown = (int32_t)0xBFF63180,
  kvErrEthernetFrameSize = (int32_t)0xBFF63253,
  kvErrBufferTooSmall = (int32_t)0xBFF63258,
  kvErrNullBuffer = (int32_t)0xBFF63259
};

/* ---- Status text ------------------------------------------------------------------------- */

/* Writes the driver's text for `status` into `text` (at most `size` bytes, NUL-terminated). */
KVSV_EXPORT void kvsvStatusToString(int32_t status, uint32_t size, char *text);

/* ---- Time conversions ---------------------------------------------------------------------
 * rawTime: 100 ns since 1601-01-01 (values up to 118653335999999999 are relative times);
 * 1 ns time: ns since 1970-01-01. Zero means "no time" and converts to zero both ways.
 * A null result pointer is ignored; a null SvTime reads as zero. */

KVSV_EXPORT void kvsvRawTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeToRawTime(uint64_t *result, const SvTime *value);
KVSV_EXPORT void kvsv100nsTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeTo100nsTime(uint64_t *result, const SvTime *value);
KVSV_EXPORT void kvsv1nsTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeTo1nsTime(uint64_t *result, const SvTime *value);

/* ---- Sessions ------------------------------------------------------------------------------ */

/* Non-zero while a project session is open (manual sessions do not count). */
KVSV_EXPORT int32_t kvsvGetIsProjectSessionOpen(void);

/* ---- Signals ------------------------------------------------------------------------------- */

/* Reads the latest value of every signal of `session` into the host double array `*values`
 * (count at byte 0, values from byte 8), creating or growing the handle as needed.
 * 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or closing.
 * 0xBFF630B0: the host could not grow the array. 0xBFF63015: `values` is null.
 * After a failure past the session checks the array's count is 0. */
KVSV_EXPORT kvsvStatus kvsvReadSignalSinglePoint(uint32_t session, SvHandle *values);

/* Writes one value per signal of `session` from the host double array `values`. */
KVSV_EXPORT kvsvStatus kvsvWriteSignalSinglePoint(uint32_t session, SvHandle values);

#ifdef __cplusplus
}
#endif

#endif
