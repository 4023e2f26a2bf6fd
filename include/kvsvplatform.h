/*
 * kvsvplatform.h: the operations that the library calls. The host's (sv...) are resolved from the
 * process that loads the library; the driver's (kv..., kvdb..., kvhdn...) come from libkvor.so.1.
 */
#ifndef KVSVPLATFORM_H
#define KVSVPLATFORM_H

#include <stddef.h>
#include <stdint.h>

#include "kvorproperties.h"
#include "kvsvapi.h"

#ifdef __cplusplus
extern "C" {
#endif

/* ==== Host runtime ========================================================================== */

/* Opaque host path. */
typedef struct SvPathRecord *SvPath;

/* Cookie of a registered host reference. */
typedef uint64_t SvRefnum;

/* A clean-up procedure runs with the argument given at registration when the program stops. */
typedef int32_t (*SvCleanupProc)(uint64_t argument);

/* Memory. Handles are zero-filled; a resize may move the block. */
SvHandle svNewHandleClr(size_t size);
int32_t svSetHandleSizeClr(SvHandle handle, size_t size);
size_t svGetHandleSize(SvHandle handle);
int32_t svDisposeHandle(SvHandle handle);
int32_t svCopyHandle(SvHandle *destination, SvHandle source);
void svCopyBytes(const void *source, void *destination, size_t size);

/* Strings. svStrPrintf resizes the string handle as needed; non-negative on success. */
int32_t svStrPrintf(SvHandle string, const char *format, ...);
int32_t svStrCaseCmp(const SvStr *a, const SvStr *b);
int32_t svStrFromPtr(SvHandle *string, int32_t length, const void *bytes);

/* Sets a string attribute of the variant at `variant`. `attributeName` is length-prefixed (one
 * length byte, then the text). The text is copied; the caller keeps `value`. */
int32_t svVariantSetStringAttr(void *variant, const unsigned char *attributeName, SvHandle value);

/* Paths. */
SvPath svEmptyPath(int32_t flags);
int32_t svAppPath(SvPath path);
int32_t svDestroyPath(SvPath path);
int32_t svPathToString(SvPath path, SvHandle *text);
int32_t svStringToPath(SvHandle text, SvPath *path);
SvHandle svPathCText(SvPath path);

/* Run mode: each non-zero for yes. */
int32_t svIsBoundApp(int32_t reserved);
int32_t svIsRunTime(int32_t reserved);
int32_t svIsFullFeatureRunTime(int32_t reserved);

/* References. All text arguments are string handles; the numbers are protocol constants. */
int32_t svRegisterRefKind3(SvHandle name, uint32_t handle, SvHandle kind, SvHandle className,
                           int32_t c21, SvRefnum *reference, int32_t c8, SvHandle libraryPattern,
                           int32_t c1, SvHandle openName, SvHandle closeName, int32_t z0,
                           int32_t z1, int32_t keep);
int32_t svUnregisterRef(SvRefnum reference);
/* Not every host has it: the library looks it up at run time. */
typedef int32_t (*SvUnregisterRefByNameProc)(SvHandle name, SvHandle kind, SvHandle className,
                                             int32_t c21);

/* Registers a clean-up procedure for the running program. */
int32_t svSetCleanupProc(SvCleanupProc procedure, uint64_t argument, int32_t mode);

/* ==== Driver ================================================================================ */

/* Session modes. */
enum kvSessionMode {
  kvMode_SignalInSinglePoint = 0,
  kvMode_SignalInWaveform = 1,
  kvMode_SignalInXY = 2,
  kvMode_SignalOutSinglePoint = 3,
  kvMode_SignalOutWaveform = 4,
  kvMode_SignalOutXY = 5,
  kvMode_FrameInStream = 6,
  kvMode_FrameInQueued = 7,
  kvMode_FrameInSinglePoint = 8,
  kvMode_FrameOutStream = 9,
  kvMode_FrameOutQueued = 10,
  kvMode_FrameOutSinglePoint = 11,
  kvMode_SignalConversionSinglePoint = 12
};

/* Protocols. */
enum kvProtocol { kvProtocol_CAN = 0, kvProtocol_FlexRay = 1, kvProtocol_LIN = 2, kvProtocol_Ethernet = 3 };

/* Sessions. */
int32_t kvCreateSession(const char *database, const char *cluster, const char *list,
                        const char *interfaceName, uint32_t mode, uint32_t *session);
int32_t kvClear(uint32_t session);
/* A handle that stands for a failed open and answers every call with `status`. */
int32_t kvhdnCreateErrorSession(int32_t status, uint32_t *session);
int32_t kvWait(uint32_t session, uint32_t condition, uint32_t parameter, uint32_t *parameterOut,
               double timeout);

/* Session control. */
int32_t kvStart(uint32_t session, uint32_t scope);
int32_t kvStop(uint32_t session, uint32_t scope);
int32_t kvFlush(uint32_t session);
int32_t kvConnectTerminals(uint32_t session, const char *source, const char *destination);
int32_t kvDisconnectTerminals(uint32_t session, const char *source, const char *destination);
int32_t kvhdnCreateSvTiming_FlexRayMacrotick(uint32_t session, uint64_t *timingSource);
int32_t kvBlink(uint32_t interfaceRef, uint32_t mode);

/* Frames. Buffers hold the driver's packed frame records; sizes are in bytes. kvReadFrame fills
 * 24-byte records, kvhdnReadFrame records of each frame's own size, at most `numFrames`. */
int32_t kvReadFrame(uint32_t session, void *buffer, uint32_t size, double timeout,
                    uint32_t *bytesReturned);
int32_t kvhdnReadFrame(uint32_t session, void *buffer, uint32_t size, uint32_t numFrames,
                       double timeout, uint32_t *bytesReturned);
int32_t kvWriteFrame(uint32_t session, const void *buffer, uint32_t size, double timeout);
/* Ethernet frames travel through descriptors that point at the payload bytes: 40-byte read
 * descriptors, 16-byte write descriptors. */
int32_t kvhdnReadFrameEthernet(uint32_t session, void *descriptors, uint32_t numFrames,
                               int32_t *numReturned, double timeout);
int32_t kvhdnWriteFrameEthernet(uint32_t session, const void *descriptors, uint32_t numFrames,
                                double timeout);

/* Conversion sessions (kvMode_SignalConversionSinglePoint) pack signals into frame records and
 * back, with no bus. `frames` holds records in the session's form; sizes are in bytes. Values are
 * one 64-bit float per signal; a byte image holds the signals' raw bits, kvPropHidden_ByteArrayBits
 * of them. `timestamps` may be null (size 0); if not, it gets each signal's frame time. */
int32_t kvConvertSignalsToFramesSinglePoint(uint32_t session, const double *values,
                                            uint32_t valuesSize, void *frames,
                                            uint32_t framesSize, uint32_t *bytesReturned);
int32_t kvConvertFramesToSignalsSinglePoint(uint32_t session, const void *frames,
                                            uint32_t framesSize, double *values,
                                            uint32_t valuesSize, uint64_t *timestamps,
                                            uint32_t timestampsSize);
int32_t kvConvertByteArrayToFramesSinglePoint(uint32_t session, const uint8_t *bytes,
                                              uint32_t bytesSize, void *frames,
                                              uint32_t framesSize, uint32_t *bytesReturned);
int32_t kvConvertFramesToByteArraySinglePoint(uint32_t session, const void *frames,
                                              uint32_t framesSize, uint8_t *bytes,
                                              uint32_t bytesSize);

/* Databases. A database is opened by alias, by the path of a database file, or as ":memory:";
 * its objects are found or created under a parent by class (the class codes of the property
 * identifiers: 0x10000 cluster, 0x20000 frame, 0x30000 signal, 0x40000 subframe, 0x50000 ECU,
 * 0x60000 LIN schedule, 0x70000 LIN schedule entry, 0x80000 PDU) and name. A signal is found in its frame by name, or in its cluster
 * as "frame.signal" or by a name that no other frame uses. Every handle of a database, its own
 * or an object's, serves kvdbCloseDatabase: closeAll 0 undoes one open, 1 every open. */
int32_t kvdbOpenDatabase(const char *name, uint32_t *database);
int32_t kvdbCloseDatabase(uint32_t database, uint32_t closeAll);
int32_t kvdbFindObject(uint32_t parent, uint32_t objectClass, const char *name, uint32_t *object);
int32_t kvdbCreateObject(uint32_t parent, uint32_t objectClass, const char *name,
                         uint32_t *object);
/* Deletes an object with everything it holds (a frame its signals, subframes and PDU; a LIN
 * schedule its entries). */
int32_t kvdbDeleteObject(uint32_t object);
/* The database that holds `object` (a database gives itself). */
int32_t kvhdndbGetDatabaseRefFromObjRef(uint32_t object, uint32_t *database);
/* Tells the driver that one more reference to `handle` exists: its database takes one more open,
 * which the reference's kvdbCloseDatabase(handle, 0) gives back. */
int32_t kvhdndbOpenDatabaseByRef(uint32_t handle);
/* Makes a handle that stands for an open that failed with `status`: calls on it give `status`,
 * and kvdbCloseDatabase ends it. */
int32_t kvhdndbCreateErrorObject(int32_t status, uint32_t *object);
/* Properties of database objects; the identifier's class must be the object's. */
int32_t kvdbGetPropertySize(uint32_t object, uint32_t id, uint32_t *size);
int32_t kvdbGetProperty(uint32_t object, uint32_t id, uint32_t size, void *value);
int32_t kvdbSetProperty(uint32_t object, uint32_t id, uint32_t size, const void *value);
/* Writes the database as a database file at `filePath`, or, if it is null or empty, to the file
 * it was opened from. */
int32_t kvdbSaveDatabase(uint32_t database, const char *filePath);
/* Copies the cluster `source` with its objects into the cluster `target` of another database.
 * `copyMode` 0: an object of the same name in the target is replaced; 1: it stays and the
 * source's is skipped; 2: a name found in both is an error and nothing is copied. `prefix` (may be
 * null) goes before the name of every frame, ECU and PDU copied. The stand-in completes at once:
 * `*percentComplete` (may be null) is 100 whatever `waitForComplete`. */
int32_t kvdbMerge(uint32_t target, uint32_t source, uint32_t copyMode, const char *prefix,
                  uint32_t waitForComplete, uint32_t *percentComplete);
/* Copies the database file of `alias` to the target at `ipAddress`, where it is then known by
 * the same alias; Undeploy removes it there. Completion as for kvdbMerge. */
int32_t kvdbDeploy(const char *ipAddress, const char *alias, uint32_t waitForComplete,
                   uint32_t *percentComplete);
int32_t kvdbUndeploy(const char *ipAddress, const char *alias);
/* Attributes of a database file (its BA_ values) of a database, ECU, frame or signal, as text.
 * `mode` 0: the value of attribute `name` (`*isDefault` 1 when the object sets none and the
 * definition's default is given); 1: the texts of an enumeration attribute `name`, comma-separated;
 * 2: the names of every attribute defined for the object's class, comma-separated (`name`
 * unused). Sizes count the NUL. */
int32_t kvdbGetDBCAttributeSize(uint32_t object, uint32_t mode, const char *name, uint32_t *size);
int32_t kvdbGetDBCAttribute(uint32_t object, uint32_t mode, const char *name, uint32_t size,
                            char *value, uint32_t *isDefault);
/* Names a database file by an alias; the baud rate serves a file that gives none. Aliases are kept
 * in a file of the driver's configuration directory and outlive the process. */
int32_t kvdbAddAlias(const char *alias, const char *filePath, uint32_t defaultBaudRate);
int32_t kvdbAddAlias64(const char *alias, const char *filePath, uint64_t defaultBaudRate);
int32_t kvdbRemoveAlias(const char *alias);
/* The aliases and their file paths, as two comma-separated lists in the same order. Sizes count
 * the NUL; with no alias at all both are 0. `target` 0 is this machine; otherwise it is the address of a target's IP address text,
 * and the list is what was deployed there. A list that outgrew the sizes given is
 * kvErrDatabaseListChanged. */
int32_t kvdbGetDatabaseListSizes(uint64_t target, uint32_t *aliasesSize, uint32_t *pathsSize);
int32_t kvdbGetDatabaseList(uint64_t target, uint32_t aliasesSize, char *aliases,
                           uint32_t pathsSize, char *paths, uint32_t *count);

/* Status text. */
void kvStatusToString(int32_t status, uint32_t size, char *text);

/* System. */
int32_t kvSystemOpen(uint32_t *system);
int32_t kvSystemClose(uint32_t system);

/* Properties of sessions and system objects. */
int32_t kvGetPropertySize(uint32_t object, uint32_t id, uint32_t *size);
int32_t kvGetProperty(uint32_t object, uint32_t id, uint32_t size, void *value);
int32_t kvSetProperty(uint32_t object, uint32_t id, uint32_t size, const void *value);
int32_t kvGetSubProperty(uint32_t object, uint32_t index, uint32_t id, uint32_t size, void *value);
int32_t kvSetSubProperty(uint32_t object, uint32_t index, uint32_t id, uint32_t size,
                         const void *value);

/* State. `size` is the byte size of the value at `value`. */
enum kvStateId {
  /* Selects a LIN session's schedule by its 32-bit index. */
  kvState_LINScheduleChange = 0x130081
};
int32_t kvWriteState(uint32_t session, uint32_t stateId, uint32_t size, const void *value);
/* Arms the session's trigger at `when`, a raw time, or a 1 ns time since 1970 on an Ethernet
 * session; `option` is passed through. */
int32_t kvFutureTimeTrigger(uint32_t session, uint64_t when, uint32_t option);
/* States that kvReadState gives, each with the one size it takes. The communication words are
 * packed bit fields whose meaning is the driver's. Times are raw times; the 24-byte time records
 * (first time, second time, a 32-bit word whose bit 0 is a flag, 4 bytes unused) belong to
 * Ethernet sessions and hold 1 ns times. */
enum kvReadStateId {
  kvState_CANComm = 0x130010,          /* 4 bytes */
  kvState_FlexRayComm = 0x130020,      /* 4 bytes; bits 24-31 the current cycle */
  kvState_LINComm = 0x130030,          /* 8 bytes: two words */
  kvState_J1939Comm = 0x130040,        /* 16 bytes */
  kvState_FlexRayStats = 0x8130021,    /* 24 bytes */
  kvState_TimeCurrent = 0x7130001,     /* 8 bytes: the driver's time now */
  kvState_TimeStart = 0x7130002,       /* 8 bytes: when the bus started; 0 before */
  kvState_TimeComm = 0x7130003,        /* 8 bytes: the third time the driver keeps */
  kvState_TimeCurrentLong = 0xC130005, /* 24 bytes each: the same three as time records */
  kvState_TimeStartLong = 0xC130006,
  kvState_TimeCommLong = 0xC130007
};
/* Reads state `stateId` into `value`; `fault`, where not null, gets the driver's fault word. */
int32_t kvReadState(uint32_t session, uint32_t stateId, uint32_t size, void *value,
                    uint32_t *fault);
/* Blocks until the session's time trigger fires, or `timeout` seconds pass (negative: none), and
 * gives its 24-byte time record. */
int32_t kvReadStateTimeTrigger(uint32_t session, uint32_t size, void *value, double timeout);

/* Signals. Buffer sizes are in bytes. */
int32_t kvReadSignalSinglePoint(uint32_t session, double *values, uint32_t valuesSize,
                                uint64_t *timestamps, uint32_t timestampsSize);
int32_t kvWriteSignalSinglePoint(uint32_t session, const double *values, uint32_t valuesSize);

/* Waveforms: `buffers` holds one sample buffer per signal of the session, each `bufferSize`
 * bytes. A read fills every buffer with the same number of evenly spaced samples, and gives the
 * raw time of the first, the interval in seconds and that number; a write takes bufferSize / 8
 * samples from each buffer. */
int32_t kvhdnReadSignalWaveform(uint32_t session, double timeout, uint64_t *startTime,
                                double *interval, double *const *buffers, uint32_t bufferSize,
                                uint32_t *numSamples);
int32_t kvhdnWriteSignalWaveform(uint32_t session, double timeout, const double *const *buffers,
                                 uint32_t bufferSize);

/* Value and timestamp pairs. The value and timestamp regions hold one run per signal, in list
 * order, all runs of one length (the region's size over 8 bytes per signal); the pair count
 * region one 32-bit count per signal, the pairs used at the start of its run. A read takes the
 * pairs stamped no later than *timeLimit (raw time; null for no limit); a write's timestamps may
 * be null (size 0), and the driver stamps the values itself. */
int32_t kvReadSignalXY(uint32_t session, const uint64_t *timeLimit, double *values,
                       uint32_t valuesSize, uint64_t *timestamps, uint32_t timestampsSize,
                       uint32_t *numPairs, uint32_t numPairsSize);
int32_t kvWriteSignalXY(uint32_t session, double timeout, const double *values,
                        uint32_t valuesSize, const uint64_t *timestamps, uint32_t timestampsSize,
                        const uint32_t *numPairs, uint32_t numPairsSize);

#ifdef __cplusplus
}
#endif

#endif
