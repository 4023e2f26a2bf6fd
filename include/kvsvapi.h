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

/* Host path: the host's own record, reached only through its pointer. */
struct SvPathRecord;

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

/* Writes the text of `status`, the library's own codes included, into the caller's buffer `text`
 * of `size` bytes, cut to fit and NUL-terminated. The driver owns every text: the arguments go to
 * it unchanged, and what it makes of a null `text` or a `size` of 0 is its own. No status. */
KVSV_EXPORT void kvsvStatusToString(int32_t status, uint32_t size, char *text);

/* ---- Time conversions ---------------------------------------------------------------------
 * rawTime: 100 ns since 1601-01-01 (values up to 118653335999999999 are relative times);
 * 1 ns time: ns since 1970-01-01. Zero means "no time" and converts to zero both ways.
 * The 100 ns forms are the raw forms under a second name. Towards a count, the fraction rounds
 * to the nearest unit (an exact half rounds down); an SvTime with negative seconds gives raw
 * time 0, and before 1970 gives a 1 ns count that has wrapped. No status: a null result pointer
 * is ignored, a null SvTime reads as zero. */

KVSV_EXPORT void kvsvRawTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeToRawTime(uint64_t *result, const SvTime *value);
KVSV_EXPORT void kvsv100nsTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeTo100nsTime(uint64_t *result, const SvTime *value);
KVSV_EXPORT void kvsv1nsTimeToSvTime(SvTime *result, uint64_t value);
KVSV_EXPORT void kvsvSvTimeTo1nsTime(uint64_t *result, const SvTime *value);

/* ---- Sessions ------------------------------------------------------------------------------ */

/* Cookie of a reference registered with the host. */
typedef uint64_t kvsvRefnum;

/* A session handle reaches the library's record of the session by its low 16 bits alone, so that
 * no call waits on a lookup. A program must not use a handle after its session has ended: a later
 * session whose handle has the same low 16 bits would receive the call. */

/* 1 while a project session is open, else 0 (manual sessions do not count). Not a status. */
KVSV_EXPORT int32_t kvsvGetIsProjectSessionOpen(void);

/* Creates a session in the driver from its definition (`database`, `cluster`, the comma list
 * `list` of the session's objects, `interfaceName` and `mode`, all passed to the driver as they
 * are) and registers it with the host as "___kvorSesn#" plus its handle in eight hex digits; the
 * host's reference goes to *reference, which the program then holds and ends with
 * kvsvSessionClear. A session the driver refuses is registered all the same (handle 0) and the
 * driver's status returned, so that the reference stays usable and fails at its first use.
 * 0xBFF63010: out of memory (the name, the registration texts or the session's slot).
 * 0xBFF63001: the session table could not be set up, the project file's place could not be
 * worked out, or the host refused the registration. A session the driver had made is cleared
 * again when its name or registration fails. 0 on success (a driver warning is not passed on). */
KVSV_EXPORT kvsvStatus kvsvSessionManualCreate(const char *database, const char *cluster,
                                               const char *list, const char *interfaceName,
                                               uint32_t mode, kvsvRefnum *reference);

/* The host's open of a session reference: opens the project session named by the host string
 * *name, as defined in the project session file kvorSession.txt (beside the application in a
 * built application, else in the directory "eTemporarySessionTextFileDir"). The first open on an
 * interface also creates the sessions of the file that share its interface, database and
 * cluster; their opens then take what was made. *session gets the session, or, when the open
 * fails, an error session that gives the failure at its first use. `context` is not used.
 * 0, with nothing done for a null `session`; 0xBFF63001 only if the session table could not be
 * set up when the library was loaded. */
KVSV_EXPORT kvsvStatus kvsvSessionOpen(SvHandle *name, uint32_t *session, uint64_t context);

/* The open and close of the library's internal session reference: *session gets 0xDEADFAB4,
 * which stands for no driver session. Both 0. */
KVSV_EXPORT kvsvStatus kvsvSessionInternalOpen(SvHandle *name, uint32_t *session);
KVSV_EXPORT kvsvStatus kvsvSessionInternalClose(void);

/* Copies the host handle *source into *target (made or resized to fit, owned by the caller);
 * the reserved arguments are not read. 0xBFF63015: `source` is null. Otherwise the host's status
 * of the copy. */
KVSV_EXPORT kvsvStatus kvsvInternalHandleToRef(void *reserved1, SvHandle *source,
                                               void *reserved2, SvHandle *target);

/* The host's close of a session reference (any reference is accepted and sent to the close of its
 * class). Clears the session in the driver, waits for calls that use it, frees its slot; the
 * error handle of a failed device or interface open is cleared and forgotten. 0; 0xBFF63001 only
 * if the session table could not be set up when the library was loaded. */
KVSV_EXPORT kvsvStatus kvsvSessionClose(uint32_t session);

/* Removes the host reference `reference` (none for 0), then closes the session as
 * kvsvSessionClose does (none for 0). 0, or 0xBFF63001 when the host refused the removal (the
 * session is closed all the same) or the session table could not be set up; a host warning is
 * dropped. */
KVSV_EXPORT kvsvStatus kvsvSessionClear(uint32_t session, kvsvRefnum reference);

/* The clean-up that blocking calls register with the host, with the session handle in the low 32
 * bits of `session`: closes the session without any lock, even while a call is blocked on it,
 * and frees the call's guard. Every failure is dropped: always 0. */
KVSV_EXPORT kvsvStatus kvsvSessionAbort(uint64_t session);

/* Waits in the driver for `condition` with `parameter`, the driver writing its answer to
 * *parameterOut; all five arguments go to the driver as they are. A time limit other than 0.0
 * (NaN included) first registers kvsvSessionAbort as the program's clean-up, and it stays
 * registered. The driver's status. */
KVSV_EXPORT kvsvStatus kvsvSessionWait(uint32_t session, uint32_t condition, uint32_t parameter,
                                       uint32_t *parameterOut, double timeLimit);

/* Session and interface control: each forwards to the driver, arguments unchanged, and returns
 * its status. They take no lock and no guard of the session, so they run beside a read or write
 * on it; an unknown session is the driver's to report. Start and stop act on `scope`; the
 * terminal calls connect or disconnect the terminals named `source` and `destination`; the
 * FlexRay macrotick call gives the driver's timing source in *timingSource; blink sets the
 * identification light of the interface reference `interfaceRef` to `mode`. */
KVSV_EXPORT kvsvStatus kvsvSessionStart(uint32_t session, uint32_t scope);
KVSV_EXPORT kvsvStatus kvsvSessionStop(uint32_t session, uint32_t scope);
KVSV_EXPORT kvsvStatus kvsvSessionFlush(uint32_t session);
KVSV_EXPORT kvsvStatus kvsvSessionConnectTerminals(uint32_t session, const char *source,
                                                   const char *destination);
KVSV_EXPORT kvsvStatus kvsvSessionDisconnectTerminals(uint32_t session, const char *source,
                                                      const char *destination);
KVSV_EXPORT kvsvStatus kvsvSessionCreateSvTiming_FlexRayMacrotick(uint32_t session,
                                                                  uint64_t *timingSource);
KVSV_EXPORT kvsvStatus kvsvInterfaceBlink(uint32_t interfaceRef, uint32_t mode);

/* ---- System, devices, interfaces ----------------------------------------------------------- */

/* Each system, device and interface reference that is open holds one count on the driver's
 * system; the last release closes it. These exports report 0xBFF63001 when the library's system
 * table could not be set up at load.
 *
 * Opens the driver's system (counted); *system gets its handle, or an error handle standing for
 * a failed open (the count then stays 0, so that the next open asks the driver again). `name` is
 * not read. 0; 0xBFF63001: `system` is null. */
KVSV_EXPORT kvsvStatus kvsvSystemOpen(SvHandle *name, uint32_t *system);

/* Releases a system reference; the last one closes the driver's system. A reference of another
 * class goes to the close of its class. 0. */
KVSV_EXPORT kvsvStatus kvsvSystemClose(uint32_t system);

/* Closes the system whatever its count, removing every device and interface reference from the
 * host. Both outputs, where not null, are set to 0. 0 when no system is open, else the driver's
 * status of the close. */
KVSV_EXPORT kvsvStatus kvsvSystemManualClose(uint64_t *reserved1, uint64_t *reserved2);

/* Number of counts held on the driver's system (see above). Not a status. */
KVSV_EXPORT uint32_t kvsvGetSystemRefCount(void);

/* Opens the device named by the host string *name ("___kvorDev#" plus the complement of its
 * serial number in eight hex digits; case does not matter) into *device, taking a count on the
 * system. A name not found, or a driver failure in the search, gives status 0 and an error handle
 * whose first use fails. A second open of the same name drops the host reference of the first.
 * 0xBFF630A5: null or empty name (nothing is opened). 0xBFF63001: `device` is null. When the
 * bookkeeping runs out of memory the count is given back and the status is 0xBFF63010, or the
 * search's failure if it had failed. Otherwise 0 or the driver's warning of the search.
 * The close releases the device and its count, as kvsvSystemClose does for the system; a
 * reference of another class goes to the close of its class. 0. */
KVSV_EXPORT kvsvStatus kvsvDeviceOpen(SvHandle *name, uint32_t *device);
KVSV_EXPORT kvsvStatus kvsvDeviceClose(uint32_t device);

/* Opens the interface named by *name (case does not matter; an Ethernet interface also answers to
 * its name plus "/monitor") into *interfaceRef; otherwise as for devices, but 0xBFF6308A for a
 * null or empty name. The close as for devices. */
KVSV_EXPORT kvsvStatus kvsvInterfaceOpen(SvHandle *name, uint32_t *interfaceRef);
KVSV_EXPORT kvsvStatus kvsvInterfaceClose(uint32_t interfaceRef);

/* ---- Paths ---------------------------------------------------------------------------------
 * The directories of the driver's files, selected by name: "eDatabaseEditorSettingsIniDir",
 * "eErrorLogDir", "eTemporarySessionTextFileDir", "eDatabaseCacheDir", "eAliasFileDir" or
 * "eDatabaseConfigDir" (exact case). The text is in the multibyte encoding of the process locale.
 * Each call computes the directory afresh; the two database configuration names also create it.
 * 0xBFF63001: unknown or empty name, buffer too small, conversion or file system failure, or a
 * host string that could not be stored. 0xBFF63010: out of memory. 0xBFF63015: a null pointer
 * where a name of non-zero length, the size or the buffer is required. */

/* Bytes that the directory named by the first `nameLength` bytes of `name` takes, its NUL
 * included, into *size. */
KVSV_EXPORT kvsvStatus kvsvPathGetMultibyteStringSizeInBytes(const char *name, uint64_t nameLength,
                                                             uint64_t *size);

/* Copies the directory with its NUL into `buffer`, filling the rest of `bufferSize` bytes with
 * NUL; a buffer too small is left untouched. */
KVSV_EXPORT kvsvStatus kvsvPathGetMultibyteString(const char *name, uint64_t nameLength,
                                                  uint64_t bufferSize, char *buffer);

/* Stores the directory named by the host string `name` in the host string `text` (a null handle
 * or block reads as an empty name). `text` is the caller's existing handle, which the host resizes
 * to the counted text (no NUL); it should not be null, as a handle that the host had to make
 * anew would not reach the caller. */
KVSV_EXPORT kvsvStatus kvsvGetPathMultibyteStringAsSvStr(SvHandle name, SvHandle text);

/* ---- Frame writes -------------------------------------------------------------------------- */

/* Sends the frames of the host array `frames` (count at byte 0, 32-byte CAN, 32-byte LIN or
 * 40-byte FlexRay clusters from byte 8) in one driver call, as records in the form the session
 * wants. An empty array goes to the driver with no look at the session. `timeout` goes to the
 * driver; any value but 0.0 lets the host abort the session if the program stops meanwhile.
 * 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or closing.
 * 0xBFF6309F: a payload is longer than the session allows; none of the frames is sent.
 * 0xBFF63010: no memory for the records. Otherwise the driver's status. */
KVSV_EXPORT kvsvStatus kvsvWriteFrameCAN(uint32_t session, SvHandle frames, double timeout);
KVSV_EXPORT kvsvStatus kvsvWriteFrameLIN(uint32_t session, SvHandle frames, double timeout);
KVSV_EXPORT kvsvStatus kvsvWriteFrameFlexRay(uint32_t session, SvHandle frames, double timeout);

/* Sends the payloads of the host array of 56-byte Ethernet clusters `frames`; the driver reads
 * them in place. 0xBFF63001: `frames` is null. 0xBFF63253: a cluster's Reserved field is not 0;
 * nothing is sent. Otherwise as kvsvWriteFrameCAN, the empty array included. */
KVSV_EXPORT kvsvStatus kvsvWriteFrameEthernet(uint32_t session, SvHandle frames, double timeout);

/* Hands the bytes of the host byte array `data` (count at byte 0, bytes from byte 4), records
 * that the program built itself, to the driver as they are; a null handle or block sends none.
 * No slot or guard is taken, so the driver alone judges the session. `timeout` as for
 * kvsvWriteFrameCAN. The driver's status. */
KVSV_EXPORT kvsvStatus kvsvWriteFrameRaw(uint32_t session, SvHandle data, double timeout);

/* ---- Frame reads ---------------------------------------------------------------------------
 * Each read takes at most `numFrames` frames from the driver into the host array `*frames`
 * (count at byte 0, clusters from byte 8: 32-byte CAN, 32-byte LIN, 40-byte FlexRay or 56-byte
 * Ethernet), whose Payload elements are host byte arrays (count at byte 0, bytes from byte 4).
 * `*spareHandles` (count at byte 0, handles from byte 8) keeps the payload handles that the last
 * read did not fill, for the next one: keep both arrays between calls and a steady read makes no
 * allocation. Either handle may be null at first; both are created or grown, never shrunk.
 * A negative `numFrames` asks for every frame the session holds and needs a `timeout` of 0.0.
 * Any `timeout` but 0.0 (NaN included) lets the host abort the session if the program stops
 * while the call waits; it goes to the driver as it is.
 * 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or closing.
 * 0xBFF630A0: a negative `numFrames` with a `timeout` other than 0.0. 0xBFF630B0: the host could
 * not grow an array or make a payload handle. 0xBFF63010: a payload handle could not be resized.
 * 0xBFF6309F: a payload longer than the session's limit was delivered cut to it.
 * 0xBFF63015: `frames` or `spareHandles` is null. Otherwise the driver's status, with the frames
 * it delivered. The Ex forms return 0 at once, touching nothing, when `*skip` is non-zero.
 * The arrays may go to several sessions in turn and may hold handles of the program's own: a
 * payload handle too small for the frame it gets is grown first. A handle is taken to hold at
 * least the bytes its count claims, as every host array does: a read asks the host for a handle's
 * size only when the frame is longer. A program must not put one handle in two places of the
 * arrays, nor give a payload handle a count larger than its block, nor touch the arrays or their
 * handles while a read runs. */

/* CAN frames, in the session's form: classic, CAN FD up to its payload limit, or J1939 messages
 * of up to 1785 bytes. 0xBFF63090: a single-point session read for fewer frames than its list. */
KVSV_EXPORT kvsvStatus kvsvReadFrameCAN(uint32_t session, int32_t numFrames, SvHandle *frames,
                                        SvHandle *spareHandles, double timeout);
KVSV_EXPORT kvsvStatus kvsvReadFrameCANEx(uint32_t session, int32_t numFrames, SvHandle *frames,
                                          SvHandle *spareHandles, const uint8_t *skip,
                                          double timeout);

/* LIN frames. */
KVSV_EXPORT kvsvStatus kvsvReadFrameLIN(uint32_t session, int32_t numFrames, SvHandle *frames,
                                        SvHandle *spareHandles, double timeout);
KVSV_EXPORT kvsvStatus kvsvReadFrameLINEx(uint32_t session, int32_t numFrames, SvHandle *frames,
                                          SvHandle *spareHandles, const uint8_t *skip,
                                          double timeout);

/* FlexRay frames. A session whose payload limit cannot be read returns the driver's status and
 * answers 0xBFF63027 from then on, until it is aborted or closed. */
KVSV_EXPORT kvsvStatus kvsvReadFrameFlexRay(uint32_t session, int32_t numFrames,
                                            SvHandle *frames, SvHandle *spareHandles,
                                            double timeout);
KVSV_EXPORT kvsvStatus kvsvReadFrameFlexRayEx(uint32_t session, int32_t numFrames,
                                              SvHandle *frames, SvHandle *spareHandles,
                                              const uint8_t *skip, double timeout);

/* Ethernet frames, written by the driver straight into the payload handles. A negative
 * `numFrames` reads the frames pending now. 0xBFF63001 (instead of 0xBFF63015): `frames` or
 * `spareHandles` is null. */
KVSV_EXPORT kvsvStatus kvsvReadFrameEthernet(uint32_t session, int32_t numFrames,
                                             SvHandle *frames, SvHandle *spareHandles,
                                             double timeout);
KVSV_EXPORT kvsvStatus kvsvReadFrameEthernetEx(uint32_t session, int32_t numFrames,
                                               SvHandle *frames, SvHandle *spareHandles,
                                               const uint8_t *skip, double timeout);

/* At most `numBytes` bytes of the driver's packed frame records, as they are, into the host byte
 * array `*data` (count at byte 0, bytes from byte 4), created or grown as needed, never shrunk.
 * A negative `numBytes` asks for the session's whole capacity (its list's records at the payload
 * limit in a single-point session, else its queue size) and needs a `timeout` of 0.0 (else
 * 0xBFF630A0). `timeout` as for the other reads. The count is the bytes the driver gave, 0 if it
 * was not called. 0xBFF63015: `data` is null. 0xBFF63020, 0xBFF63027 as for the other reads.
 * 0xBFF630B0: the host could not grow the array. Otherwise the driver's status.
 * A program must not mix this read with the decoded reads above on one session: both keep their
 * sizes in the same place of the session's cache, in different units, so that the amounts then
 * asked of the driver are wrong (the array's real size is still checked before every copy). */
KVSV_EXPORT kvsvStatus kvsvReadFrameRaw(uint32_t session, int32_t numBytes, SvHandle *data,
                                        double timeout);

/* ---- Conversions --------------------------------------------------------------------------- */

/* A conversion session (mode 12) packs signals into frames and back with no bus. Towards frames,
 * `values` is the host double array of one value per signal, or `bytes` a host byte array (count
 * at byte 0, bytes from byte 4) holding the signals' image; the frames go into `*frames` as into a
 * frame read, with the payload handles that no frame takes kept in `*spareHandles` for later
 * calls, or as records into the byte array `*rawFrames`. The first call sizes every host object
 * for the session's frames; later calls only overwrite them.
 * 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or closing.
 * 0xBFF63160: `values` or `bytes` is null; the frames then go to the spares. 0xBFF630AF: the
 * session's payload limit is beyond its protocol (CAN 64, J1939 1785, LIN 8). 0xBFF630B0: the
 * host could not give an array or a handle. 0xBFF6309F: a frame longer than the session's limit
 * was delivered cut to it. 0xBFF63001: no payload handle was left for a frame. 0xBFF63015: an
 * array pointer is null. Otherwise the driver's status. The Ex forms return 0 at once, touching
 * nothing, when `*skip` is non-zero. */
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameRaw(uint32_t session, SvHandle *values,
                                                              SvHandle *rawFrames);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameCAN(uint32_t session, SvHandle *values,
                                                              SvHandle *frames,
                                                              SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameLIN(uint32_t session, SvHandle *values,
                                                              SvHandle *frames,
                                                              SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameFlexRay(uint32_t session,
                                                                  SvHandle *values,
                                                                  SvHandle *frames,
                                                                  SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameCANEx(uint32_t session,
                                                                SvHandle *values,
                                                                SvHandle *frames,
                                                                SvHandle *spareHandles,
                                                                const uint8_t *skip);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameLINEx(uint32_t session,
                                                                SvHandle *values,
                                                                SvHandle *frames,
                                                                SvHandle *spareHandles,
                                                                const uint8_t *skip);
KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameFlexRayEx(uint32_t session,
                                                                    SvHandle *values,
                                                                    SvHandle *frames,
                                                                    SvHandle *spareHandles,
                                                                    const uint8_t *skip);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameRaw(uint32_t session,
                                                                 SvHandle *bytes,
                                                                 SvHandle *rawFrames);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameCAN(uint32_t session,
                                                                 SvHandle *bytes,
                                                                 SvHandle *frames,
                                                                 SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameLIN(uint32_t session,
                                                                 SvHandle *bytes,
                                                                 SvHandle *frames,
                                                                 SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameFlexRay(uint32_t session,
                                                                     SvHandle *bytes,
                                                                     SvHandle *frames,
                                                                     SvHandle *spareHandles);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameCANEx(uint32_t session,
                                                                   SvHandle *bytes,
                                                                   SvHandle *frames,
                                                                   SvHandle *spareHandles,
                                                                   const uint8_t *skip);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameLINEx(uint32_t session,
                                                                   SvHandle *bytes,
                                                                   SvHandle *frames,
                                                                   SvHandle *spareHandles,
                                                                   const uint8_t *skip);
KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameFlexRayEx(uint32_t session,
                                                                       SvHandle *bytes,
                                                                       SvHandle *frames,
                                                                       SvHandle *spareHandles,
                                                                       const uint8_t *skip);

/* Away from frames: the host's clusters in `*frames` (or records in the byte array `*rawFrames`)
 * go to the driver, which extracts one value per signal into `*values`, or the signals' image
 * into `*bytes`, created or grown as needed. No frames is status 0 with nothing touched, on any
 * session. After success the count is the session's number of signals, or its image size in
 * bytes; after a failure past the session checks it is 0.
 * 0xBFF6309F: a frame longer than the session's limit; nothing goes to the driver. 0xBFF630AF,
 * 0xBFF630B0, 0xBFF63020, 0xBFF63027, 0xBFF63015 as towards frames; 0xBFF63010: no memory for
 * the records. Otherwise the driver's status. */
KVSV_EXPORT kvsvStatus kvsvConvertFrameRawToSignalSinglePoint(uint32_t session,
                                                              SvHandle *rawFrames,
                                                              SvHandle *values);
KVSV_EXPORT kvsvStatus kvsvConvertFrameCANToSignalSinglePoint(uint32_t session, SvHandle *frames,
                                                              SvHandle *values);
KVSV_EXPORT kvsvStatus kvsvConvertFrameLINToSignalSinglePoint(uint32_t session, SvHandle *frames,
                                                              SvHandle *values);
KVSV_EXPORT kvsvStatus kvsvConvertFrameFlexRayToSignalSinglePoint(uint32_t session,
                                                                  SvHandle *frames,
                                                                  SvHandle *values);
KVSV_EXPORT kvsvStatus kvsvConvertFrameRawToByteArraySinglePoint(uint32_t session,
                                                                 SvHandle *rawFrames,
                                                                 SvHandle *bytes);
KVSV_EXPORT kvsvStatus kvsvConvertFrameCANToByteArraySinglePoint(uint32_t session,
                                                                 SvHandle *frames,
                                                                 SvHandle *bytes);
KVSV_EXPORT kvsvStatus kvsvConvertFrameLINToByteArraySinglePoint(uint32_t session,
                                                                 SvHandle *frames,
                                                                 SvHandle *bytes);
KVSV_EXPORT kvsvStatus kvsvConvertFrameFlexRayToByteArraySinglePoint(uint32_t session,
                                                                     SvHandle *frames,
                                                                     SvHandle *bytes);

/* ---- Signals ------------------------------------------------------------------------------- */

/* Reads the latest value of every signal of `session` into the host double array `*values`
 * (count at byte 0, values from byte 8), creating or growing the handle as needed.
 * 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or closing.
 * 0xBFF630B0: the host could not grow the array. 0xBFF63015: `values` is null.
 * After a failure past the session checks the array's count is 0. */
KVSV_EXPORT kvsvStatus kvsvReadSignalSinglePoint(uint32_t session, SvHandle *values);

/* Writes the values of the host double array `values` (count at byte 0, values from byte 8),
 * one per signal of `session`, to the driver as they are; a null handle or block sends none. No
 * slot or guard is taken, so the driver alone judges the session and the number of values. The
 * driver's status. */
KVSV_EXPORT kvsvStatus kvsvWriteSignalSinglePoint(uint32_t session, SvHandle values);

/* A waveform of the host's waveform array, as Lock describes it (80 bytes). */
typedef struct SvWaveformDescriptor {
  SvTime t0;                    /* time of the first sample */
  double dt;                    /* seconds between samples */
  uint8_t reserved24[8];
  uint32_t numSamples;
  uint8_t reserved36[12];
  double *samples;              /* the waveform's own sample storage */
  uint8_t reserved56[24];
} SvWaveformDescriptor;

typedef struct SvWaveformArray SvWaveformArray;

/* The host's table of operations of a waveform array. The library calls only the four named
 * ones, at their fixed positions; each returns 0 on success. */
typedef struct SvWaveformArrayOps {
  void (*reserved0[3])(void);
  /* 3: the number of waveforms into *count. */
  int32_t (*GetCount)(SvWaveformArray *self, int32_t *count);
  void (*reserved4[2])(void);
  /* 6: makes the array `count` waveforms of `numSamples` samples; `kind` is always 6. */
  int32_t (*Resize)(SvWaveformArray *self, int32_t kind, int32_t count, int32_t numSamples);
  void (*reserved7[4])(void);
  /* 11: opens the first `count` waveforms, `access` 2 to fill them or 1 to take their samples,
   * and describes each in descriptors[i]. */
  int32_t (*Lock)(SvWaveformArray *self, int32_t access, int32_t count,
                  SvWaveformDescriptor *descriptors);
  /* 12: closes them again, keeping the t0 and dt written into the descriptors. Called also after
   * a Lock that failed. */
  int32_t (*Unlock)(SvWaveformArray *self, int32_t count, SvWaveformDescriptor *descriptors);
} SvWaveformArrayOps;

/* The host's waveform array: an object that starts with its table of operations. */
struct SvWaveformArray {
  const SvWaveformArrayOps *ops;
};

/* Reads `numSamples` evenly spaced samples of every signal of `session` straight into the
 * waveforms of `waveforms`, which is resized to one waveform per signal when the number of
 * signals or of samples changed. All waveforms get the driver's start time and interval; a read
 * that comes back short cuts the waveforms to what the driver had. A negative `numSamples` asks
 * for up to 10000 samples and needs a timeout of 0.0. A timeout other than 0.0 (seconds; NaN
 * too) registers kvsvSessionAbort as the program's clean-up before the driver may block.
 * 0xBFF63020, 0xBFF63027: as for kvsvReadSignalSinglePoint, array untouched. 0xBFF630A0: negative
 * `numSamples` with a timeout. 0xBFF630B0: the host refused to resize or lock the array.
 * 0xBFF63015: `waveforms` is null. After a failure before the driver call the array is empty.
 * Another array, or one that another session used, may be passed: waveforms shorter than the read
 * are resized first. A program must not resize or dispose of the array while a read runs. */
KVSV_EXPORT kvsvStatus kvsvReadSignalWaveform(uint32_t session, int32_t numSamples,
                                              SvWaveformArray *waveforms, double timeout);

/* Writes the samples of `waveforms`, one waveform per signal of `session`, every waveform cut to
 * the shortest; the driver reads them from the waveforms' own storage. `timeout` goes to the
 * driver, any value but 0.0 (NaN included) first registering kvsvSessionAbort as the program's
 * clean-up. 0xBFF63020: no such session. 0xBFF63027: the session is in use by another call or
 * closing. 0xBFF63160: the array does not hold one waveform per signal. 0xBFF63010: out of
 * memory, or the host refused to lock the array. 0xBFF63015: `waveforms` is null. 0xBFF63001:
 * the host refused to unlock the array after the write. Otherwise the driver's status, that of
 * the signal count read included. */
KVSV_EXPORT kvsvStatus kvsvWriteSignalWaveform(uint32_t session, SvWaveformArray *waveforms,
                                               double timeout);

/* Reads value and timestamp pairs of every signal of `session` into `*clusters`, an array of one
 * cluster per signal (count at byte 0; from byte 8, per signal, the handle of its timestamp array
 * of SvTime, then the handle of its value array of doubles), made or grown as needed. At most
 * `numSamples` pairs per signal; a negative `numSamples` stands for the session's queue size. In
 * a signal input XY session a non-null `timeLimit` whose seconds are not 0 is passed to the
 * driver, after kvsvSessionAbort has been registered as the program's clean-up; any other
 * session reads the latest value of each signal with its time.
 * 0xBFF63020, 0xBFF63027: nothing touched. 0xBFF630B0: the host refused to grow an array, or no
 * scratch memory: the array is then empty. 0xBFF63015: `clusters` is null. A failed driver read
 * leaves the arrays as the driver's buffers gave them. */
KVSV_EXPORT kvsvStatus kvsvReadSignalXY(uint32_t session, int32_t numSamples,
                                        const SvTime *timeLimit, SvHandle *clusters);

/* kvsvReadSignalXY, unless *skip is non-zero: then 0, and nothing is touched. */
KVSV_EXPORT kvsvStatus kvsvReadSignalXYEx(uint32_t session, int32_t numSamples,
                                          const SvTime *timeLimit, SvHandle *clusters,
                                          const uint8_t *skip);

/* Writes the pairs of `clusters`, laid out as kvsvReadSignalXY fills them, one cluster per signal
 * of `session`. If any timestamp array is not empty, each signal sends as many pairs as it has
 * both values and timestamps for; otherwise it sends its values and the driver stamps them.
 * `timeout` goes to the driver, any value but 0.0 (NaN included) first registering
 * kvsvSessionAbort as the program's clean-up. 0xBFF63020: no such session. 0xBFF63027: the
 * session is in use by another call or closing. 0xBFF63160: null handle or block, or not one
 * cluster per signal. 0xBFF63010: out of memory. Otherwise the driver's status, that of the
 * signal count read included. */
KVSV_EXPORT kvsvStatus kvsvWriteSignalXY(uint32_t session, SvHandle clusters, double timeout);

/* ---- Session properties --------------------------------------------------------------------
 * Properties of a session, system, device or interface, one pair of functions per shape of the
 * value. Arguments: `session` the handle; `subId` (Ex forms only) a host string handle, or null,
 * naming the entry of the session's list that a sub-indexed property is written for: a decimal
 * index, or a name of the list (a name before its first '.', blanks and anything behind a
 * blank or line feed ignored), null or empty meaning entry 0; only sub-indexed writes read it;
 * `id` the property identifier; `value` the destination of a read or the source of a write, or
 * for arrays and strings a pointer to the host handle, which reads create or resize; `info` a
 * host string handle pointer, or null: on any status but 0, warnings included, a new handle
 * naming the property is stored there (what it held before stays the caller's to dispose).
 * The plain forms are the Ex forms with a null `subId`.
 * A system-class property given the handle of the first system ever opened goes to the system
 * open now, so that a reference kept from before a close and reopen still works.
 * Statuses: the driver's, or 0xBFF63010 out of memory, 0xBFF63015 a null `value` where the
 * library itself reads or writes through it, and, for sub-indexed writes, 0xBFF6317F an index
 * that is not a number (up to 2^31 - 1), 0xBFF63180 a name that is not in the list, 0xBFF63020
 * no such session and 0xBFF63027 a session busy looking up a name or closing. */

/* Single values: U8 (1 byte; a write sends 4 bytes from `value`; the J1939 address and fill
 * byte go through a 32-bit word both ways), U32, U64, F64, Bool (1 byte). Sub-indexed writes:
 * the U32 per-frame skip, queue update and corrupted-checksum counts and the hidden frame
 * setting, the F64 start time offset and transmit time. Writing the hidden U32 switch
 * 0x0011FFF1 turns the report of implicit closes on or off and reaches no driver. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU8(uint32_t session, SvHandle *subId, uint32_t id,
                                              uint8_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropU8(uint32_t session, uint32_t id, uint8_t *value,
                                            SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU8(uint32_t session, SvHandle *subId, uint32_t id,
                                              const uint8_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropU8(uint32_t session, uint32_t id, const uint8_t *value,
                                            SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU32(uint32_t session, SvHandle *subId, uint32_t id,
                                               uint32_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropU32(uint32_t session, uint32_t id, uint32_t *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU32(uint32_t session, SvHandle *subId, uint32_t id,
                                               const uint32_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropU32(uint32_t session, uint32_t id,
                                             const uint32_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU64(uint32_t session, SvHandle *subId, uint32_t id,
                                               uint64_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropU64(uint32_t session, uint32_t id, uint64_t *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU64(uint32_t session, SvHandle *subId, uint32_t id,
                                               const uint64_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropU64(uint32_t session, uint32_t id,
                                             const uint64_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExF64(uint32_t session, SvHandle *subId, uint32_t id,
                                               double *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropF64(uint32_t session, uint32_t id, double *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExF64(uint32_t session, SvHandle *subId, uint32_t id,
                                               const double *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropF64(uint32_t session, uint32_t id, const double *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExBool(uint32_t session, SvHandle *subId, uint32_t id,
                                                uint8_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropBool(uint32_t session, uint32_t id, uint8_t *value,
                                              SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExBool(uint32_t session, SvHandle *subId, uint32_t id,
                                                const uint8_t *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropBool(uint32_t session, uint32_t id,
                                              const uint8_t *value, SvHandle *info);

/* Times: the driver's 8-byte time, converted to SvTime whatever the read returned (0 stays the
 * zero time). There is no time setter: the Set forms report an internal error, 0xBFF63001. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExTime(uint32_t session, SvHandle *subId, uint32_t id,
                                                SvTime *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropTime(uint32_t session, uint32_t id, SvTime *value,
                                              SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExTime(uint32_t session, SvHandle *subId, uint32_t id,
                                                const SvTime *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropTime(uint32_t session, uint32_t id, const SvTime *value,
                                              SvHandle *info);

/* Number arrays (count at byte 0, elements from byte 4). A read sizes the array to what the
 * driver has and stores that count even if the read itself fails; a failed size query leaves the
 * array as it was. A write sends the elements in place; a null or empty array is sent as empty.
 * Sub-indexed writes: the custom code data. U8_1D and U16_1D have Ex forms only. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU8_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                 SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU8_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                 SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU16_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU16_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU32_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropU32_1D(uint32_t session, uint32_t id, SvHandle *value,
                                                SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU32_1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropU32_1D(uint32_t session, uint32_t id, SvHandle *value,
                                                SvHandle *info);

/* Text. The cluster name reads as "database.cluster". A write sends a NUL-terminated copy; a
 * null or empty string is sent as a single NUL. Sub-indexed writes: the J1939 address filter. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExString(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropString(uint32_t session, uint32_t id, SvHandle *value,
                                                SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExString(uint32_t session, SvHandle *subId, uint32_t id,
                                                  SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropString(uint32_t session, uint32_t id, SvHandle *value,
                                                SvHandle *info);

/* Arrays of strings, cut from the driver's comma list; `*value` is replaced by a new array. The
 * session's list is answered in modes 0 to 5 only, the LIN schedule names in any mode, and the
 * hidden frame list 0x0410FFFF (the list of a session of mode 7, 8, 10 or 11) in those modes
 * only; in other modes these return the status of the mode's read and leave `*value` as it was.
 * Their entries read "entry\ndatabase.cluster", each a reference to its object. There is no
 * setter: the Set forms report an internal error, 0xBFF63001. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExString1D(uint32_t session, SvHandle *subId,
                                                    uint32_t id, SvHandle *value,
                                                    SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropString1D(uint32_t session, uint32_t id, SvHandle *value,
                                                  SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExString1D(uint32_t session, SvHandle *subId,
                                                    uint32_t id, SvHandle *value,
                                                    SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropString1D(uint32_t session, uint32_t id, SvHandle *value,
                                                  SvHandle *info);

/* References: what a property refers to, as the host holds it. A device is named "___kvorDev#" and
 * the complement of its serial number in eight lower-case hex digits, an interface by its name, a
 * database object by its reference text ("name\ndatabase.cluster", the cluster left out when it
 * is named "Cluster").
 * Get Ref: a text property (type 0x03) reads as the String form does; the interface's device
 * (kvPropIntf_DevRef) as the device's name, empty if its serial cannot be read. Any other
 * identifier is an internal error, 0xBFF63001. *value is replaced by a new string.
 * Set Ref: kvPropSession_J1939ECU only (any other is an internal error), from the reference text
 * of an ECU: 0xBFF63163 for a null or empty text, 0xBFF63164 for one without a database,
 * 0xBFF63173 for a name with a dot, else the driver's status of the find or the write.
 * Get Ref1D: a comma list (type 0x04) reads as the String1D form does; the device list of the
 * system and the interface lists of the system and of a device as arrays of names. Any other
 * identifier is an internal error. *value is replaced by a new array of strings, each its own; a
 * list that is empty or cannot be read leaves *value as it was.
 * Set Ref1D: a list of frames from an array of their reference texts; a null or empty array is
 * written as empty. The first text that does not resolve ends the write, which then sends
 * nothing. The host must not change the array during the call. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExRef(uint32_t session, SvHandle *subId, uint32_t id,
                                               SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropRef(uint32_t session, uint32_t id, SvHandle *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExRef(uint32_t session, SvHandle *subId, uint32_t id,
                                               SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropRef(uint32_t session, uint32_t id, SvHandle *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExRef1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                 SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionGetPropRef1D(uint32_t session, uint32_t id, SvHandle *value,
                                               SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExRef1D(uint32_t session, SvHandle *subId, uint32_t id,
                                                 SvHandle *value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropRef1D(uint32_t session, uint32_t id, SvHandle *value,
                                               SvHandle *info);

/* Paths: a text property that names a file, as a host path (the host's SvPath). Get sets the
 * text of *value, or makes the path into a null *value; a path the host cannot make is an
 * internal error, 0xBFF63001. Set sends the path's text, "" for a null or empty path. Ex forms only. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExPath(uint32_t session, SvHandle *subId, uint32_t id,
                                                struct SvPathRecord **value, SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExPath(uint32_t session, SvHandle *subId, uint32_t id,
                                                struct SvPathRecord **value, SvHandle *info);

/* The Ethernet receive filter (kvPropSession_IntfEnetEptReceiveFilter only; any other identifier
 * is an internal error, 0xBFF63001): a host array, count at byte 0, from byte 8 elements of 16
 * bytes: a boolean at 0 with the 16-bit value at 2, a boolean at 4 with the 8-bit value at 5, a
 * boolean at 6 with the filter name, a string handle, at 8. Each boolean says whether its field is
 * in force.
 * Get replaces *value, its names disposed of, with a new array and new names; a failed read
 * leaves it as it was.
 * Set: a null or empty array writes nothing and returns 0. A name of more than 18 characters
 * fails the whole write with 0xBFF630C0 and nothing is sent. Ex forms only. */
KVSV_EXPORT kvsvStatus kvsvSessionGetPropExCluster1D(uint32_t session, SvHandle *subId,
                                                     uint32_t id, SvHandle *value,
                                                     SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvSessionSetPropExCluster1D(uint32_t session, SvHandle *subId,
                                                     uint32_t id, SvHandle *value,
                                                     SvHandle *info);

/* ---- State writes and triggers ------------------------------------------------------------ */

/* Selects the LIN schedule of `session` by the host string *schedule. A null or empty string is
 * schedule 0. A text that starts with a digit is the schedule's index in decimal (0xBFF6317D if
 * it is not a number below 2^31), needing no slot. Any other text is the name of a schedule among
 * the session's schedule names, read from the driver once per slot and kept; blanks around the
 * name do not count, and a name may leave out what follows its first '.' (0xBFF6317E for no
 * match). A name lookup holds the slot's list guard: 0xBFF63020 for no slot, 0xBFF63027 if
 * another lookup holds it or the session is closing, the driver's status if the names cannot be
 * read, 0xBFF63010 for no memory. On any of these nothing is written; otherwise the driver's
 * status of the write. */
KVSV_EXPORT kvsvStatus kvsvWriteStateLINScheduleChange(uint32_t session, SvHandle *schedule);

/* Writes the 32-bit `value` to the driver's state `stateId` of `session`, with no check. The
 * driver's status. */
KVSV_EXPORT kvsvStatus kvsvWriteStateU32(uint32_t session, uint32_t stateId, uint32_t value);

/* Arms the driver's trigger of `session` at *when, passing `option` on. The time goes to the
 * driver in 1 ns units since 1970 for an Ethernet session, in 100 ns units since 1601 otherwise,
 * so the session's protocol is read first: its failure is returned and arms nothing. 0xBFF63015
 * for a null `when`; otherwise the driver's status. */
KVSV_EXPORT kvsvStatus kvsvFutureTimeTrigger(uint32_t session, const SvTime *when,
                                             uint32_t option);

/* ---- State reads ---------------------------------------------------------------------------
 * The driver's state of a session. None but kvsvReadStateFlexRayTime uses the session's slot:
 * they run beside any read or write on the session, and an unknown session is the driver's to
 * report. */

/* Communication state, unpacked into the host cluster at `cluster`. Every form writes the
 * driver's fault word at byte 0 (32 bits) and at byte 4 a 1 if it is not 0, else 0, then bit
 * fields of the driver's packed state (w, x: its 32-bit words; bytes not listed are left alone):
 *   CAN:     5 w bits 0-3, 6 w bits 8-11, 7 w bits 24-31, 8 w bits 16-23, 9 w bit 4, 10 w bit 5
 *   LIN:     5 w bits 2-3, 6 w bits 4-7, 7 w bits 8-15, 8 w bits 16-23, 9 w bits 24-29,
 *            10 w bit 1, 11 w bit 31, 12 x bits 0-7
 *   FlexRay: 5 w bits 0-3, 6 w bits 4-7, 7 w bits 8-12, 8 w bit 13, 9 w bit 14
 *   J1939:   8 to 15 the first 8 bytes of the driver's 16-byte record, as they are
 * The cluster is unpacked whatever the driver's status, which is returned: after a failure it
 * holds what the driver left, so look at the status first. 0xBFF63015: `cluster` is null. */
KVSV_EXPORT kvsvStatus kvsvReadStateCANComm(uint32_t session, void *cluster);
KVSV_EXPORT kvsvStatus kvsvReadStateLINComm(uint32_t session, void *cluster);
KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayComm(uint32_t session, void *cluster);
KVSV_EXPORT kvsvStatus kvsvReadStateJ1939Comm(uint32_t session, void *cluster);

/* The driver's 24 bytes of FlexRay statistics, straight into `statistics`. The driver's status. */
KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayStats(uint32_t session, void *statistics);

/* The 32-bit state `stateId`, straight into *value. The driver's status. */
KVSV_EXPORT kvsvStatus kvsvReadStateU32(uint32_t session, uint32_t stateId, uint32_t *value);

/* The 8-byte time state `stateId` (raw time) into *time, converted whatever the driver's status,
 * which is returned. 0xBFF63001: `time` is null, nothing read. */
KVSV_EXPORT kvsvStatus kvsvReadStateTime(uint32_t session, uint32_t stateId, SvTime *time);

/* Time state `stateId` with its second time and flag. An Ethernet session reads the 24-byte time
 * record of 1 ns times as asked; any other reads the 8-byte raw time, a record identifier asking
 * for its 8-byte state, and gives a second time of zero and a flag of 0. 0xBFF63001: a null
 * pointer, nothing read. A failure of the driver, in reading the session's protocol or the
 * state, clears the three outputs and is returned; otherwise the driver's status, a warning
 * included. */
KVSV_EXPORT kvsvStatus kvsvReadStateTime2(uint32_t session, uint32_t stateId, SvTime *first,
                                          SvTime *second, uint8_t *flag);

/* Waits in the driver for the session's time trigger, up to `timeout` seconds (negative: no
 * limit), and gives the two times and the flag of its 24-byte record, 1 ns times for an Ethernet
 * session and raw times for any other. A timeout other than 0.0 (NaN too) first registers
 * kvsvSessionAbort as the program's clean-up. 0xBFF63001: a null pointer, nothing read. A failed
 * protocol read is returned with the outputs as they were; a failure of the wait clears them. */
KVSV_EXPORT kvsvStatus kvsvReadStateTimeTrigger(uint32_t session, SvTime *first, SvTime *second,
                                                uint8_t *flag, double timeout);

/* The current FlexRay cycle (0 to 63) into *cycle and the nearest macrotick within it into
 * *macrotick, worked out from the driver's current time and bus start time. The bus's timing is
 * read from the driver once per start of the bus and kept in the session's slot; while the start
 * time stays the same, a call costs two state reads. Both outputs are 0 on any failure:
 * 0xBFF63015 a null pointer (nothing touched); 0xBFF63020 no such session; 0xBFF63027 the session
 * is in use by another call or closing; 0xBFF630C1 the bus has not started, or its timing is 0 or
 * does not give a macrotick of at least one time unit; 0xBFF63080 the driver has no FlexRay
 * timing for the session; 0xBFF63010 out of memory; otherwise the driver's status, the first
 * warning of its calls included. */
KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayTime(uint32_t session, uint8_t *cycle,
                                                uint16_t *macrotick);

/* ---- Database editing ----------------------------------------------------------------------
 * Operations on whole databases and their files, handed to the driver as they are: the status is
 * the driver's. A merge copies the cluster `source` into the cluster `target` of another
 * database (copyMode 0 replaces objects of the same name, 1 keeps the target's, 2 refuses a
 * clash); save and export write the database of `database` to `filePath` (null or empty: its own
 * file); an alias names a database file for later opens and outlives the program; deploy copies
 * the file of an alias to the target at `ipAddress`. */
KVSV_EXPORT kvsvStatus kvsvdbMerge(uint32_t target, uint32_t source, uint32_t copyMode,
                                   const char *prefix, uint32_t waitForComplete,
                                   uint32_t *percentComplete);
KVSV_EXPORT kvsvStatus kvsvdbSave(uint32_t database, const char *filePath);
KVSV_EXPORT kvsvStatus kvsvdbExport(uint32_t database, const char *filePath);
KVSV_EXPORT kvsvStatus kvsvdbAddAlias(const char *alias, const char *filePath,
                                      uint32_t defaultBaudRate);
KVSV_EXPORT kvsvStatus kvsvdbAddAlias64(const char *alias, const char *filePath,
                                        uint64_t defaultBaudRate);
KVSV_EXPORT kvsvStatus kvsvdbRemoveAlias(const char *alias);
KVSV_EXPORT kvsvStatus kvsvdbDeploy(const char *ipAddress, const char *alias,
                                    uint32_t waitForComplete, uint32_t *percentComplete);
KVSV_EXPORT kvsvStatus kvsvdbUndeploy(const char *ipAddress, const char *alias);

/* The aliases known to `target` (0: this machine; else the address of a target's IP address
 * text) and their files, as two arrays of strings in the same order. Both arrays are replaced,
 * their old strings disposed of; with no alias at all both stay as they were. A list that changes
 * while it is read is read again, up to eleven times in all; after that the status is
 * 0xBFF6308E. 0xBFF63015 for a null pointer; 0xBFF63010 out of memory. */
KVSV_EXPORT kvsvStatus kvsvdbGetDatabaseList(uint64_t target, SvHandle *aliases,
                                             SvHandle *filePaths);
/* An attribute of the database file that `object` came from, as text, into the string `*value`
 * (made if null). `mode` 0 the value of attribute `name` (`*isDefault` 1 when only its
 * definition's default applies), 1 the texts of an enumeration attribute, 2 the names of the
 * attributes of the object's class, comma-separated. A failed read leaves the string's count as it
 * was, or 0 if the string had to shrink below it. 0xBFF63015 for a null `value`; 0xBFF63010 out of memory. */
KVSV_EXPORT kvsvStatus kvsvdbGetDBCAttribute(uint32_t object, uint32_t mode, const char *name,
                                             SvHandle *value, uint32_t *isDefault);

/* ---- Databases -----------------------------------------------------------------------------
 * A database object is named by a reference text: a database by its name or alias; a cluster by
 * "database.cluster", or the database alone for its cluster of empty name; any other object by
 * its name, one or more blanks or line feeds, then "database.cluster", or the database alone when
 * the cluster is named "Cluster". Frame, ECU, LIN schedule and PDU names hold no dot; signal,
 * subframe and LIN schedule entry names ("frame.signal") at most one. Classes: 0 database,
 * 0x10000 cluster, 0x20000 frame, 0x30000 signal, 0x40000 subframe, 0x50000 ECU, 0x60000 LIN
 * schedule, 0x70000 LIN schedule entry, 0x80000 PDU. The statuses of a malformed text:
 * 0xBFF63163 empty or null, 0xBFF63164 no database part, 0xBFF63173 too many dots in the name.
 * One database is opened either by a program (the Manual functions) or by the host's references
 * (the Open and Close functions below), never both: 0xBFF6315E, and the object is not kept. */

/* A program's open of the object of class `objectClass` named by the host string `name`. The
 * reference registered with the host goes to *reference; the program ends it with
 * kvsvdbManualClose, or the host ends it when the program stops. A text opened already gives the
 * same object and no further holder. A failed open is registered all the same, as an object that
 * gives the failure at its first use, and its status returned. 0xBFF63001: the host refused the
 * registration (the object is closed again); 0xBFF63010: out of memory. */
KVSV_EXPORT kvsvStatus kvsvdbManualOpen(uint32_t objectClass, SvHandle name,
                                        kvsvRefnum *reference);

/* A program's close of `handle`, opened as the host string `name` under `reference`.
 * `closeAll` 0: one holder of the text; the driver's close and the end of the reference come with
 * the last. Otherwise the whole database of `handle`: every reference of its texts ends and the
 * driver closes all of it. *reserved1 and *reserved2 (either may be null) are set to 0. The first
 * failure of the driver's close, the host's removal of the reference, the account's release
 * (0xBFF63131: a handle no open gave), in that order; else the driver's status. Do not use the
 * handle afterwards. */
KVSV_EXPORT kvsvStatus kvsvdbManualClose(uint32_t handle, SvHandle name, kvsvRefnum reference,
                                         int32_t closeAll, uint64_t *reserved1,
                                         uint64_t *reserved2);

/* Ends the references of every object of the database of `handle` but the database's own, and
 * forgets them; the driver closes nothing. 0xBFF63131 for a handle no open gave, else the first
 * failure of the host's removals. */
KVSV_EXPORT kvsvStatus kvsvhdndbManualCloseChildren(uint32_t handle);

/* Ends the host's reference `reference` and nothing else: no close reaches the driver. 0 for
 * reference 0; 0xBFF63001 if the host refuses. */
KVSV_EXPORT kvsvStatus kvsvdbUnregisterWithSV(kvsvRefnum reference);

/* Number of databases that hold objects opened through this library. Not a status. */
KVSV_EXPORT uint32_t kvsvGetNumOpenDatabases(void);

/* The host's open of the object of class `objectClass` named by the host string *name:
 * *handleOut gets the object, or, when the open fails, an object that gives the failure at its
 * first use; the failure is also returned. A text opened already gives the same object, and the
 * first close ends it for all. `context` is not used. 0xBFF63015 for a null `handleOut`. */
KVSV_EXPORT kvsvStatus kvsvdbAutoOpenDbObject(SvHandle *name, uint32_t objectClass,
                                              uint32_t *handleOut, uint64_t context);

/* The host's close of `handle`: one holder given back, and the driver's close with the last (or
 * for a handle no open gave). The driver's status, or 0 while holders remain. */
KVSV_EXPORT kvsvStatus kvsvdbAutoCloseDbObject(uint32_t handle);

/* The exports that the host calls by name to open (by the host string *name) and close a
 * reference of each class; they always return 0: a failed open gives an object that fails at its
 * first use. A close given a handle of another class closes it as that class. */
KVSV_EXPORT kvsvStatus kvsvdbDatabaseOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbDatabaseClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbClusterOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbClusterClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbFrameOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbFrameClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbSignalOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbSignalClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbSubframeOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbSubframeClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbEcuOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbEcuClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbLINSchedOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbLINSchedClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbLINSchedEntryOpen(SvHandle *name, uint32_t *handleOut,
                                               uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbLINSchedEntryClose(uint32_t handle);
KVSV_EXPORT kvsvStatus kvsvdbPDUOpen(SvHandle *name, uint32_t *handleOut, uint64_t context);
KVSV_EXPORT kvsvStatus kvsvdbPDUClose(uint32_t handle);

/* Creates an object of `objectClass` named `name` under `parent` and registers it with the host
 * under its reference text, into *reference. The host always gets a reference: when the create
 * fails, it is named "___kvorInvalid__" and `name`, stands for no object, and the failure is
 * returned. 0xBFF63001: the host refused the registration (a created object is deleted again). */
KVSV_EXPORT kvsvStatus kvsvdbCreateObject(uint32_t parent, uint32_t objectClass, const char *name,
                                          kvsvRefnum *reference);

/* Deletes the object `handle` with all its holders and ends the host's `reference`. The first
 * failure of the driver's delete, the host's removal, the driver's close, in that order; else the
 * delete's status. An object with more than 100 holders is logged as an internal error and
 * deleted all the same. */
KVSV_EXPORT kvsvStatus kvsvdbDeleteObject(uint32_t handle, kvsvRefnum reference);

/* ---- Database properties -------------------------------------------------------------------
 * Properties of database objects by their identifiers. A failure other than 0 stores a new
 * string naming the property through `info` (may be null); the host owns what it held before. */

/* The object (Ref), or the objects (Ref1D), that property `id` of `object` refers to, as the
 * reference texts by which a host opens them: the name, a line feed and "database.cluster" (the
 * database alone for the cluster named "Cluster"). Ref replaces the string `*value`, Ref1D the
 * array of strings `*value` with its strings. A text property, or one that refers to nothing,
 * gives the internal error. 0xBFF63015 for a null `value`. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropRef(uint32_t object, uint32_t id, SvHandle *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbGetPropRef1D(uint32_t object, uint32_t id, SvHandle *value,
                                          SvHandle *info);

/* Sets property `id` of `object` to the object named by the reference text `*value`. Only a LIN
 * schedule entry's collision-resolving schedule (0x05070001) can be set so; a null or empty text
 * clears any reference property. A text property or any other identifier gives the internal
 * error; a text that names no LIN schedule gives 0xBFF63163, 0xBFF63164, 0xBFF63173 or the
 * driver's status. The database that the text opens stays open. */
KVSV_EXPORT kvsvStatus kvsvdbSetPropRef(uint32_t object, uint32_t id, SvHandle *value,
                                        SvHandle *info);
/* Sets the list property `id` of `object` to the objects named by the array of reference texts
 * `*value`: PDUs for a frame's PDU list (0x06020060), frames for an ECU's received and sent frames
 * and a LIN schedule entry's frames. A null or empty array clears the list. The first text that
 * cannot be resolved ends the walk and nothing is set; the host's strings are only read. */
KVSV_EXPORT kvsvStatus kvsvdbSetPropRef1D(uint32_t object, uint32_t id, SvHandle *value,
                                          SvHandle *info);

/* Single values: U32, U64, F64, Bool (1 byte), read into and written from *value. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropU32(uint32_t object, uint32_t id, uint32_t *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropU32(uint32_t object, uint32_t id, const uint32_t *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbGetPropU64(uint32_t object, uint32_t id, uint64_t *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropU64(uint32_t object, uint32_t id, const uint64_t *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbGetPropF64(uint32_t object, uint32_t id, double *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropF64(uint32_t object, uint32_t id, const double *value,
                                        SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbGetPropBool(uint32_t object, uint32_t id, uint8_t *value,
                                         SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropBool(uint32_t object, uint32_t id, const uint8_t *value,
                                         SvHandle *info);

/* Number arrays of 1 and 4 bytes (count at byte 0, elements from byte 4), as the session family
 * has them: a read sizes `*value` to what the driver has and stores that count even if the read
 * fails; a failed size query leaves it as it was. A null or empty array is written as empty. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropU8_1D(uint32_t object, uint32_t id, SvHandle *value,
                                          SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropU8_1D(uint32_t object, uint32_t id, SvHandle *value,
                                          SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbGetPropU32_1D(uint32_t object, uint32_t id, SvHandle *value,
                                           SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropU32_1D(uint32_t object, uint32_t id, SvHandle *value,
                                           SvHandle *info);

/* Text. A read counts the driver's size less its NUL, also when the read fails (the contents are
 * then not to be used). A write sends a NUL-terminated copy; a null or empty string is sent as a
 * single NUL. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropString(uint32_t object, uint32_t id, SvHandle *value,
                                           SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropString(uint32_t object, uint32_t id, SvHandle *value,
                                           SvHandle *info);
/* A comma list as a new array of strings; `*value` is disposed of with its strings and replaced.
 * There is no setter: the Set form reports an internal error, 0xBFF63001. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropString1D(uint32_t object, uint32_t id, SvHandle *value,
                                             SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropString1D(uint32_t object, uint32_t id, SvHandle *value,
                                             SvHandle *info);

/* A frame's PDUs (`id` must be kvPropFrm_PDU_Mapping, 0x0802FFFC; any other gives the internal
 * error and no information) as an array of 16-byte clusters from byte 8: the PDU's reference text,
 * its start bit, its update bit. A read gives as many elements as the shortest of the three lists
 * at the driver; each element owns its string, which a later read into the same array reuses. A
 * write of a null or empty array clears the three lists; otherwise the strings stay the host's.
 * A null string in an element gives 0xBFF63163 and sets nothing. */
KVSV_EXPORT kvsvStatus kvsvdbGetPropPDU_Mapping(uint32_t object, uint32_t id, SvHandle *value,
                                                SvHandle *info);
KVSV_EXPORT kvsvStatus kvsvdbSetPropPDU_Mapping(uint32_t object, uint32_t id, SvHandle *value,
                                                SvHandle *info);

#ifdef __cplusplus
}
#endif

#endif
