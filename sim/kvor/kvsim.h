/*
 * kvsim.h: control of the driver stand-in libkvor.so.1, for tests. Plain C.
 *
 * The stand-in is an in-memory driver: one system of two devices whose interfaces are joined in
 * pairs to virtual networks, sessions with their properties, error sessions, signal values that
 * travel over a network, a virtual clock, and blocking calls that honour their time limit and
 * return when their session is cleared. The functions below script it and look inside it. None
 * of them is a driver call: none goes into the call log, none can be held or made to fail.
 *
 * The hardware of the stand-in:
 *
 *   device 1 "BusBox 6 CAN/LIN", serial 1001234: CAN1, CAN2, CAN3, CAN4, LIN1, LIN2 (ports 1-6)
 *   device 2 "BusBox 3 FlexRay/Ethernet", serial 1001235: FlexRay1, FlexRay2, ENET1 (ports 1-3)
 *
 * Networks: CAN1-CAN2, CAN3-CAN4, LIN1-LIN2 and FlexRay1-FlexRay2 are wired together; ENET1 is on
 * its own. Protocols (kvPropIntf_Protocol, kvPropSession_Protocol): 0 CAN, 1 FlexRay, 2 LIN,
 * 3 Ethernet.
 *
 * Handles:
 *   session and error session  0x20GGIIII: IIII 1..8192 (unique among open sessions), GG a
 *                              generation that changes each time IIII is handed out again
 *   system                     0x01SS0000: SS 1..255, one per open system
 *   device                     0x01SSDD00: DD the device number 1..2
 *   interface                  0x01SSDD0P: P the port 1..15 on device DD
 * Device and interface handles are valid while the system SS that listed them is open.
 *
 * What the driver functions do here, beyond their declarations in kvsvplatform.h:
 *
 *   kvCreateSession   The interface is one of the names above, in any case, optionally followed
 *                     by "/suffix" ("ENET1/monitor"); the mode is 0..12; the list is cut at
 *                     commas and each item trimmed (an empty item among others is refused). On
 *                     failure the handle output is left as it was.
 *   Session properties  Read-only, from the creation: kvPropSession_Mode, NumInList (items in the
 *                     list), List (items joined by ","), IntfName (as given), Protocol,
 *                     DatabaseName, ClusterName. Any other identifier keeps the bytes last set
 *                     and gives them back; a value never set is kvsimErrPropertyUnknown. Types
 *                     0x00 and 0x05 take exactly 4 bytes, 0x01 and 0x09 exactly 8, 0x02 exactly
 *                     1; text types (0x03, 0x04) get a NUL if set without one, and their size
 *                     counts it. Sub-properties are kept per list item: the index must be below
 *                     NumInList. A read whose buffer is smaller than the value is refused whole,
 *                     except a 1-byte read of a type 0x00 value, which gets its low byte.
 *                     Values that name objects are checked when set, and then kept as set:
 *                     kvPropSession_J1939ECU is the handle of an ECU, and
 *                     kvPropSession_IntfOutStrmList handles of frames (a size that is a multiple
 *                     of 4), each of a loaded database (else kvsimErrInvalidDatabase; an object
 *                     of another class: kvsimErrInvalidClass; an error object: its status).
 *                     kvPropSession_IntfEnetEptReceiveFilter, on Ethernet sessions only (else
 *                     kvsimErrWrongProtocol), is an array of 28-byte records, empty until set:
 *                     flags (4 bytes: bit 0 the 16-bit value, bit 1 the 8-bit value, bit 2 the
 *                     name are in force), the 16-bit value, the 8-bit value, a name of 21 bytes.
 *                     A size that is not a multiple of 28 is kvsimErrPropertySize; a flag beyond
 *                     bit 2, or a name without its NUL in its 21 bytes, kvsimErrInvalidArgument.
 *                     Paths, such as kvPropSession_EnetLogFile and kvPropSession_IntfCustCodeFile,
 *                     are texts like any other.
 *   System objects    Read-only: kvPropSys_Ver* (4 bytes), DevRefs, IntfRefs, IntfRefsAll,
 *                     IntfRefsCAN/FlexRay/LIN/Ethernet (arrays of 4-byte handles, in device and
 *                     port order);
 *                     kvPropDev_Name, SerNum (the serials above), ProductNum, NumPorts,
 *                     NumPortsAll, IntfRefs, IntfRefsAll; kvPropIntf_Name, Protocol, Num,
 *                     PortNum, DevRef (the handle of its device).
 *   Error sessions    kvhdnCreateErrorSession takes a negative status only. Every call on the
 *                     handle returns that status and touches no output, except kvClear and
 *                     kvSystemClose, which end the error session and return 0.
 *   Signals           kvReadSignalSinglePoint needs mode 0, kvWriteSignalSinglePoint mode 3;
 *                     each buffer must hold 8 bytes per signal. A session made with the database
 *                     "" or ":memory:" carries its values over its network by signal name (see
 *                     kvsimSetSignalValues); waveform and XY writes of such a session leave the
 *                     last value of each signal there, and nothing reaches its waveform or XY
 *                     reads.
 *                     So does one whose database is neither an alias nor a file.
 *                     A signal session made with any other database (an alias or a database file,
 *                     see Databases) takes its signals from that database's cluster (the first
 *                     for an empty cluster name; one of another name is kvsimErrObjectNotFound),
 *                     copied when the session is made. Each list item
 *                     is "frame.signal", or the name of a signal that no other frame of the
 *                     cluster has (else kvCreateSession fails with kvsimErrObjectNotFound;
 *                     kvsimErrSignalLayout for a signal that does not fit its frame). Values then
 *                     travel in frames over the virtual bus, as frames of frame sessions do, and
 *                     reach frame input sessions too:
 *                     Output sessions (modes 3, 4, 5) encode values into the frames of their
 *                     signals. Signals go in frame groups: the plain signals of a frame, or the
 *                     multiplexed signals of one multiplexer value (the group's frame carries
 *                     that value in its multiplexer). The session keeps each group's payload,
 *                     which starts with every signal at its start value, so that a frame carries
 *                     the latest value of every signal of its group. kvWriteSignalSinglePoint
 *                     sends one frame per group of the list, stamped with the clock.
 *                     kvWriteSignalXY sends each pair at its timestamp (the clock where none are
 *                     given), kvhdnWriteSignalWaveform sample k at instant k of the session's
 *                     grid at kvPropSession_ResampRate (8-byte float, default 1000.0 per second),
 *                     which goes on from where the write before ended, or from the clock if that
 *                     has passed; values of one group due at one time share a frame. Frames
 *                     stamped ahead of the clock are delivered at once with their stamps.
 *                     Input sessions (modes 0, 1, 2) decode each frame that reaches them (as a
 *                     frame input session on the same interface would receive it): each signal
 *                     whose frame it is, whose bits all came, and, if multiplexed, whose
 *                     multiplexer holds its value, arrives as a value stamped with the frame's
 *                     time. kvReadSignalSinglePoint serves all three modes with the latest value.
 *                     kvReadSignalXY (mode 2) hands out the pairs of each signal that no read has
 *                     taken, oldest first; kvhdnReadSignalWaveform (mode 1) resamples the values at
 *                     kvPropSession_ResampRate on a grid that starts when the session is made.
 *                     Each signal keeps up to kvPropSession_QueueSize pairs (4-byte, default 4096)
 *                     until read; a pair that finds them full is dropped. A flush forgets values
 *                     and pairs and starts the grid again at the clock. The time rules of each
 *                     read are in sim/kvor/signal_xy.h and signal_waveform.h; moving the clock
 *                     wakes reads that wait for it. The sizes of the regions are those of the
 *                     declarations in kvsvplatform.h; a region too small for the session's
 *                     signals is kvsimErrBufferTooSmall, a missing one kvsimErrNullPointer, a NaN
 *                     time limit or a resample rate that is not a positive number
 *                     kvsimErrInvalidArgument, a pair count above the run length in a write
 *                     kvsimErrInvalidArgument.
 *   Frames            Frame sessions are modes 6 to 8 (input stream, queued, single point) and
 *                     9 to 11 (output). A frame that an output session writes goes out at once,
 *                     stamped with the clock, and arrives at every frame input session on the
 *                     other interfaces of its network. On the writer's own interface it arrives
 *                     only when the writer has kvPropSession_IntfEchoTx set, as an echo: Flags
 *                     bit 7 of a record, bit 0 of an Ethernet descriptor. ENET1, alone on its
 *                     network, hears what it sends: each input session on ENET1 gets it, marked
 *                     as an echo only if the writer has echo set.
 *                     List items of frame sessions name frames by identifier: "0x123" standard,
 *                     "0x18FEF100x" extended (trailing x), each with an optional ":LEN" payload
 *                     length in decimal (else the session's payload maximum). An item of any
 *                     other form is kept but names no frame.
 *                     Properties of frame sessions, settable unless told: PayldLenMax (Ethernet
 *                     1500, FlexRay 254, LIN 8, CAN 1785 with ApplicationProtocol 1 (J1939), 64
 *                     with IntfCanIoMode non-zero (CAN FD), else 8), QueueSize (bytes; default
 *                     4096 records of the payload maximum), IntfCanIoMode, ApplicationProtocol
 *                     and IntfEchoTx (0), NumPend (read-only: frames waiting in an input queue),
 *                     and per item kvPropHidden_FramePayloadLen (the item's length).
 *                     An input stream or queued session queues what arrives. It holds QueueSize /
 *                     recordSize(PayldLenMax) frames, as both stand when a frame arrives; a frame
 *                     that finds it full is dropped and counted (kvsimDroppedFrames). A
 *                     single-point input session keeps the latest frame of each list item, matched
 *                     by identifier; an item that has had no frame since the session was made or
 *                     flushed reads as its identifier at time 0, Type, Flags and Info 0, with a
 *                     payload of zeros of the item's length.
 *   kvReadFrame, kvhdnReadFrame
 *                     Input sessions only (else kvsimErrWrongMode), not Ethernet (else
 *                     kvsimErrWrongProtocol). kvReadFrame gives records of the session's form:
 *                     24 bytes each for LIN and classic CAN, recordSize(L) each for CAN FD,
 *                     J1939 (the long form, Type 0xC0, above 255 bytes) and FlexRay.
 *                     kvhdnReadFrame gives recordSize(L) records, at most numFrames. Both give
 *                     only whole records, as many as fit into `size`, oldest first; a
 *                     single-point session gives one per list item, in list order. A 24-byte
 *                     record holds at most 8 payload bytes and says so.
 *                     Time limit 0: what is there. Otherwise (seconds, negative for none) the
 *                     read waits until what it asks for is all there (numFrames records, or
 *                     records that fill `size`) and takes it, or, when the limit runs out, takes
 *                     what is there and returns 0. A clear of the session ends the wait with
 *                     kvsimErrSessionCleared; a NaN limit is kvsimErrInvalidArgument. Single-point
 *                     reads never wait. On an error the outputs are untouched.
 *   kvWriteFrame      Output sessions only, not Ethernet. The buffer holds records of the
 *                     session's form; it is refused whole with kvsimErrInvalidFrame, and nothing
 *                     is sent, if a fixed-form size is not a multiple of 24, a record runs past
 *                     `size` or cannot hold the payload it claims, or a payload is longer than
 *                     PayldLenMax (or than 8 in a 24-byte record). Nothing past `size` is read; a
 *                     null buffer of size 0 sends nothing. The records' Timestamp is not used;
 *                     Flags bit 7 is cleared on the way. The time limit is accepted and never
 *                     needed: what is taken is sent at once.
 *   kvhdnReadFrameEthernet
 *                     Ethernet input stream or queued sessions (a single-point session:
 *                     kvsimErrWrongMode). Waits as kvhdnReadFrame does for numFrames frames,
 *                     then fills a descriptor per frame, in order: the frame's bytes go to Data,
 *                     at most Length of them (Data 0 takes none); Length becomes the bytes
 *                     stored; Flags bit 0 marks an echo, bit 3 a frame cut to fit, the reserved
 *                     word holds the frame's whole length; Word is the frame's number on its
 *                     network (1 for the first after a reset); FirstTime (arrival) and
 *                     SecondTime (transmission) are the clock in 1 ns units since 1970 (a clock
 *                     before 1970 gives its own value times 100).
 *   kvhdnWriteFrameEthernet
 *                     Ethernet output sessions. Refused whole with kvsimErrInvalidFrame if a
 *                     descriptor's Length is above PayldLenMax, or its Data is 0 with a Length
 *                     that is not; Data 0 with Length 0 is an empty frame.
 *   Conversions       Conversion sessions (mode 12) made with a database take their signals from
 *                     it as signal sessions do (see Signals): the same list items, the same frame
 *                     groups and the same encoding, with no bus. kvConvertSignalsToFramesSinglePoint
 *                     gives, for one value per signal (8 bytes each), the frames that a signal
 *                     output session of the same list would send for the same values at its
 *                     first write, stamped with the clock, one per group in list order.
 *                     kvConvertFramesToSignalsSinglePoint decodes the records given as a signal
 *                     input session decodes what reaches it, a later frame over an earlier one; a
 *                     signal that no record carries reads 0.0 (at time 0 in `timestamps`). The
 *                     byte image of kvConvertByteArrayToFramesSinglePoint and
 *                     kvConvertFramesToByteArraySinglePoint holds each signal's raw bits, low
 *                     byte first, in whole bytes, one signal behind the other in list order.
 *                     Records are of the session's form: variable for FlexRay and for CAN with a
 *                     PayldLenMax above 8 (a frame longer than PayldLenMax goes out whole), fixed
 *                     24-byte records otherwise (a longer frame keeps its first 8 bytes).
 *                     Properties, settable: NumFrames (the groups of the list), PayldLenMax (LIN
 *                     8, FlexRay 254, CAN 1785 with ApplicationProtocol 1, else the longest frame
 *                     of the groups and at least 8), ApplicationProtocol (0), and the
 *                     sub-property kvPropHidden_ByteArrayBits, the same at any index (the image's
 *                     bits). Other modes: kvsimErrWrongMode. A session whose list names signals
 *                     and that was made with no database to find them in: kvsimErrObjectNotFound.
 *                     Buffers too small for what a call gives or takes: kvsimErrBufferTooSmall;
 *                     records that are not whole records of the session's form, or a payload
 *                     above PayldLenMax: kvsimErrInvalidFrame.
 *   kvStart, kvStop   Change what runs, by scope (enum kvsimScope): a session and its interface
 *                     each have a started state (kvsimSessionStarted, kvsimInterfaceStarted).
 *                     Sessions and interfaces begin stopped; starting what is started, or
 *                     stopping what is stopped, is allowed and changes nothing. Reads, writes and
 *                     waits do not look at the state.
 *   kvFlush           Empties the session: signal values that reached its network before the
 *                     flush read as never set (0.0 at time 0) on this session until set again;
 *                     other sessions and kvsimGetSignalValues still see them. A frame input
 *                     session drops its queued frames, and its single-point frames read as never
 *                     received. An output session holds nothing to flush.
 *   kvConnectTerminals, kvDisconnectTerminals
 *                     Route a source terminal to a destination terminal for the session. Both
 *                     are among the names below, spelt exactly, and differ from one another;
 *                     otherwise kvsimErrInvalidTerminal (a null name: kvsimErrNullPointer).
 *                     Connecting a connected route changes nothing; disconnecting a route the
 *                     session has not connected is kvsimErrNotConnected. A clear drops the
 *                     session's routes (kvsimTerminalsConnected).
 *                       StartTrigger, Interface/StartTrigger, FrontPanel0, FrontPanel1,
 *                       PXI_Trig0, PXI_Trig1, ..., PXI_Trig7
 *   kvhdnCreateSvTiming_FlexRayMacrotick
 *                     Only for sessions on a FlexRay interface (else kvsimErrWrongProtocol);
 *                     puts KVSIM_MACROTICK_SOURCE(session) in the output.
 *   kvBlink           Takes an interface handle of an open system (else kvsimErrInvalidObject)
 *                     and a mode of enum kvsimBlinkMode (else kvsimErrInvalidArgument). The mode
 *                     belongs to the interface, not to the handle: it stays after its system is
 *                     closed, until set again or reset (kvsimBlinkMode).
 *   Databases         The kvdb functions serve databases read from database files (see the
 *                     Databases section below): kvdbOpenDatabase takes an alias, an absolute
 *                     path, a path relative to the directory in the environment variable
 *                     KVSIM_DATABASE_DIR (else to the working directory), or ":memory:" for
 *                     the one in-memory database, empty at its first open. A file opened again,
 *                     by any name, is the same database with the same handle; it stays loaded
 *                     until it has been closed as often as it was opened (closeAll: at once).
 *                     Database object handles are 0x8CIIIIII, C the class number (0 database, 1
 *                     cluster, 2 frame, 3 signal, 4 subframe, 5 ECU, 6 LIN schedule, 7 LIN
 *                     schedule entry, 8 PDU). A multiplexed frame has one subframe per value of
 *                     its multiplexer that selects signals, named "m" and the value (found in
 *                     the cluster as "Frame.m2"). LIN schedules and their entries are made by
 *                     callers only; a database that has one cannot be saved. Aliases are kept
 *                     in "kvorAliases.txt" of the directory KVSIM_CONFIG_DIR, else of "kvor" in
 *                     the user's configuration directory; tests that add aliases set it.
 *                     kvdbGetDBCAttribute gives an enumeration's value as its text; a
 *                     warning about what a file from another tool broke is left in
 *                     kvsimDatabaseErrorText after a good open.
 *   Database properties
 *                     Every property of the identifier table of classes 0x00 to 0x08 is
 *                     answered, except kvPropFrm_PDU_Mapping (kvsimErrPropertyUnknown). Every
 *                     cluster is a CAN cluster: the FlexRay and LIN properties of clusters,
 *                     frames and ECUs are kvsimErrWrongProtocol, on read and on set (LIN
 *                     schedules and their entries are not among them). Can be set: names
 *                     (identifiers, unique among siblings: kvsimErrInvalidName,
 *                     kvsimErrObjectExists), comments; cluster BaudRate(64), CanFdBaudRate(64);
 *                     frame ID, CANExtID, PayloadLen, CANTxTime, CANioMode (0 CAN, 1 CAN FD),
 *                     PDURefs, PDUStartBits, PDUUpdateBits; signal StartBit, NumBits, ByteOrdr
 *                     (0 little-endian, 1 big-endian), DataType (0 signed, 1 unsigned, 2 IEEE
 *                     float), ScaleFac, ScaleOff, Min, Max, Default, Unit, Mux*; ECU TxFrmRefs,
 *                     RxFrmRefs, J1939PreferredAddress (0..254, 254 the default), J1939NodeName;
 *                     the PDU's Name, Comment and PayloadLen, which are its frame's; LIN schedule
 *                     Priority (0..254), RunMode (0 continuous, 1 once, 2 null); entry Delay
 *                     (seconds, not negative), EventID (0..63), Type (0 unconditional,
 *                     1 sporadic, 2 event-triggered, 3 diagnostic), Frames, CollisionResSched
 *                     (size 0: none; read with none: kvsimErrPropertyUnknown), NC_FF_DataBytes
 *                     (up to 8). Everything else follows from these and is
 *                     kvsimErrPropertyReadOnly: references, DefaultPayload, ConfigStatus,
 *                     NameUniqueToCluster ("frame.signal"), CANTimingType (0 cyclic with a
 *                     cycle time, 1 on events), ApplicationProtocol (0 none), CanFdIsoMode
 *                     (0 ISO). A frame carries its own PDU (the PDU of a frame is the frame's
 *                     payload) at start bit 0 with update bit 0xFFFFFFFF (none) until its PDUs
 *                     are set: references of PDUs of its cluster, and bits inside its payload
 *                     (an update bit may also be 0xFFFFFFFF). An ECU's TxFrmRefs makes it the
 *                     transmitter of exactly those frames; its RxFrmRefs a receiver of each
 *                     signal of exactly those (a frame without signals:
 *                     kvsimErrInvalidArgument). A saved database keeps all of these but the
 *                     J1939NodeName and LIN schedules, which a database file cannot hold: a
 *                     frame's PDUs are its attribute "PduMapping" ("names|start bits|update
 *                     bits", lists cut by commas), an ECU's address "NmStationAddress".
 *                     Refusals: a property of another class, or one that the object has no
 *                     value for, kvsimErrPropertyUnknown; a read of a 4-, 8- or 1-byte type
 *                     with another size, or a set of such a type with another size or of an
 *                     array not in whole 4-byte items, kvsimErrPropertySize; a read into a
 *                     buffer smaller than the value, kvsimErrBufferTooSmall; a value out of
 *                     its range, kvsimErrInvalidArgument; a handle of another class or
 *                     cluster in a reference, kvsimErrWrongObject.
 *   kvdbCloseDatabase Answers kvsimErrInvalidDatabase for a handle of no loaded database; the handle
 *                     of an object deleted from one still gives back one open of it.
 *   Error handles     kvBlink and kvdbCloseDatabase also answer an error session, given in place
 *                     of their object, with its status, as the session calls do.
 *   kvhdndbCreateErrorObject
 *                     Takes a negative status only (else kvsimErrInvalidArgument) and makes an
 *                     error object 0x8FIIIIII. Every kvdb call on it returns that status and
 *                     touches no output, except kvdbCloseDatabase, which ends it and returns 0.
 *   kvWriteState      Knows kvState_LINScheduleChange, which selects the LIN schedule of a
 *                     session on a LIN interface (else kvsimErrWrongProtocol), and the states that
 *                     a test declared writable on the session (kvsimAllowStateWrite); any other
 *                     state is kvsimErrUnknownState. The value is 4 bytes (another size:
 *                     kvsimErrInvalidArgument), kept as it is written (kvsimLinSchedule,
 *                     kvsimLastState).
 *   kvReadState       Knows the states of enum kvReadStateId (kvsvplatform.h), each with its one
 *                     size (another: kvsimErrInvalidArgument); the 24-byte time records only on
 *                     Ethernet sessions (else kvsimErrWrongProtocol); any other identifier is
 *                     kvsimErrUnknownState. Gives what kvsimSetState set, and its fault word in
 *                     `fault` where that is not null; a state never set reads as zeros, fault 0.
 *                     A null value is kvsimErrNullPointer, after the checks of state and size.
 *   kvReadStateTimeTrigger
 *                     Size 24 only (else kvsimErrInvalidArgument; a null value is
 *                     kvsimErrNullPointer). Waits until the clock reaches the time of the
 *                     trigger that kvsimSetTimeTrigger set, then gives its record.
 *                     The time limit is in seconds, negative for none, 0 for no wait; a wait that
 *                     runs out, or a session with no trigger, gives kvsimErrTimeout, a clear of
 *                     the session kvsimErrSessionCleared, a NaN limit kvsimErrInvalidArgument.
 *   kvFutureTimeTrigger
 *                     Output sessions only (modes 3, 4, 5, 9, 10, 11; else kvsimErrWrongMode).
 *                     The time is in the session's units: 1 ns since 1970 on Ethernet, as its
 *                     frame times (a clock before 1970 counts as its own value times 100), raw
 *                     time on the other protocols. A time before the clock is
 *                     kvsimErrTimeInPast; the clock's own time is accepted. The time and the
 *                     option, which may be any value, are kept as given (kvsimFutureTrigger),
 *                     the last over an earlier one; nothing fires.
 */
#ifndef KVSIM_H
#define KVSIM_H

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

#define KVSIM_API __attribute__((visibility("default")))

/* The driver's version, as kvPropSys_VerMajor, VerMinor, VerUpdate, VerPhase (3: release) and
 * VerBuild give it. */
#define KVSIM_VERSION_MAJOR 24u
#define KVSIM_VERSION_MINOR 5u
#define KVSIM_VERSION_UPDATE 0u
#define KVSIM_VERSION_PHASE 3u
#define KVSIM_VERSION_BUILD 49u

/* ==== Statuses of the driver ================================================================= */

/* Every error that the stand-in makes; kvStatusToString gives a text for each. */
enum kvsimStatus {
  kvsimErrInternal = (int32_t)0xBFF62001,         /* an unexpected failure inside the driver */
  kvsimErrOutOfMemory = (int32_t)0xBFF62002,      /* the driver could not allocate memory */
  kvsimErrNullPointer = (int32_t)0xBFF62003,      /* a required pointer argument is null */
  kvsimErrInvalidArgument = (int32_t)0xBFF62004,  /* an argument is out of range (NaN time limit,
                                                     non-negative status of an error session,
                                                     blink mode above 1) */
  kvsimErrInvalidSession = (int32_t)0xBFF62010,   /* not an open session: never made, or cleared */
  kvsimErrInvalidObject = (int32_t)0xBFF62011,    /* not a system, device or interface of an open
                                                     system */
  kvsimErrTooManySessions = (int32_t)0xBFF62012,  /* 8192 sessions are open already */
  kvsimErrTooManySystems = (int32_t)0xBFF62013,   /* 255 systems are open already */
  kvsimErrUnknownInterface = (int32_t)0xBFF62020, /* no interface of that name */
  kvsimErrInvalidMode = (int32_t)0xBFF62021,      /* session mode above 12 */
  kvsimErrInvalidList = (int32_t)0xBFF62022,      /* the list has an empty item */
  kvsimErrWrongMode = (int32_t)0xBFF62023,        /* the call does not fit the session's mode */
  kvsimErrWrongProtocol = (int32_t)0xBFF62024,    /* the call does not fit the session's
                                                     protocol */
  kvsimErrInvalidScope = (int32_t)0xBFF62025,     /* kvStart or kvStop: scope above 2 */
  kvsimErrPropertyUnknown = (int32_t)0xBFF62030,  /* the object has no such property, or no value */
  kvsimErrPropertyReadOnly = (int32_t)0xBFF62031, /* the property cannot be set */
  kvsimErrPropertySize = (int32_t)0xBFF62032,     /* the size does not fit the property's type */
  kvsimErrBufferTooSmall = (int32_t)0xBFF62033,   /* a buffer cannot hold the data */
  kvsimErrInvalidSubIndex = (int32_t)0xBFF62034,  /* sub-property index outside the session list */
  kvsimErrTimeout = (int32_t)0xBFF62040,          /* the time limit ran out */
  kvsimErrSessionCleared = (int32_t)0xBFF62041,  /* the session was cleared while the call waited */
  kvsimErrInvalidCondition = (int32_t)0xBFF62042, /* kvWait does not know the condition */
  kvsimErrTimeInPast = (int32_t)0xBFF62043,       /* kvFutureTimeTrigger: the time is before
                                                     the clock */
  kvsimErrInvalidTerminal = (int32_t)0xBFF62050,  /* not a terminal name, or a terminal routed to
                                                     itself */
  kvsimErrNotConnected = (int32_t)0xBFF62051,     /* the session has not connected that route */
  kvsimErrInvalidDatabase = (int32_t)0xBFF62060,  /* not an open database */
  kvsimErrUnknownState = (int32_t)0xBFF62070,     /* kvWriteState does not know the state */
  kvsimErrInvalidFrame = (int32_t)0xBFF62080      /* a frame write holds a malformed record or a
                                                     payload over the session's maximum */
};

/* The status that the call log shows for a call that is still inside the driver. */
#define KVSIM_STATUS_PENDING ((int32_t)0x7FFFFFFF)

/* ==== Conditions of kvWait =================================================================== */

/* kvWait(session, condition, parameter, &out, timeLimit) returns 0 as soon as the condition is
 * raised on the session (kvsimRaiseCondition), with the raised value in *out; the parameter is
 * not used. A raised condition stays raised until lowered, so any number of waits return at once.
 * The time limit is in seconds, negative for none; a wait that runs out returns kvsimErrTimeout.
 * A clear of the session makes the wait return kvsimErrSessionCleared. */
enum kvsimCondition {
  kvsimConditionTransmitComplete = 0x8001,
  kvsimConditionIntfCommunicating = 0x8002,
  kvsimConditionIntfRemoteWakeup = 0x8003
};

/* ==== Scopes of kvStart and kvStop =========================================================== */

/* Normal start: the session and its interface. Normal stop: the session, and its interface too if
 * no other session on it is started; a clear of a started session stops it in the same way.
 * Session only: the session's state alone. Interface only: the interface's state alone; the
 * sessions on it keep theirs. */
enum kvsimScope { kvsimScopeNormal = 0, kvsimScopeSessionOnly = 1, kvsimScopeInterfaceOnly = 2 };

/* ==== Modes of kvBlink ======================================================================= */

/* The interface's identification light: off, or blinking. */
enum kvsimBlinkMode { kvsimBlinkOff = 0, kvsimBlinkOn = 1 };

/* ==== FlexRay macrotick timing source ======================================================== */

/* The token that kvhdnCreateSvTiming_FlexRayMacrotick gives for `session`: never 0. */
#define KVSIM_MACROTICK_SOURCE(session) (0x4D54000000000000ull | (uint64_t)(uint32_t)(session))

/* ==== Reset ================================================================================== */

/* Back to the state of a freshly loaded driver: clears every session (calls blocked on one
 * return kvsimErrSessionCleared), closes every system, stops every interface, turns every
 * interface's light off, lifts every hold (held calls that wait on no session go on), drops
 * injected failures, the call log (and turns it on), the signal values, the frames and the raised
 * conditions, numbers frames from 1 again, unloads every database, forgets what was deployed to
 * targets, reads the database aliases from their file again (they outlive a reset as they outlive
 * the process), and sets the clock to 0. Handle generations keep counting, so a handle of before the reset
 * stays invalid. */
KVSIM_API void kvsimReset(void);

/* ==== Injected failures ====================================================================== */

/* The next `count` calls of the driver function `function` (count < 0: every call until
 * kvsimClearFailures or kvsimReset) return `status`. A negative status replaces the call: it does
 * nothing and its outputs are untouched. A positive status is a warning: the call does its work
 * and returns the warning instead of 0 (a failure stays a failure). A call that takes a property
 * identifier is checked against kvsimFailProperty rules first. Returns 0, or -1 if `function` is
 * not a driver function that returns a status or `count` is 0. */
KVSIM_API int32_t kvsimFailCall(const char *function, int32_t status, int32_t count);

/* As kvsimFailCall, but only for calls of `function` with the property identifier `propertyId`.
 * `function` is one of kvGetPropertySize, kvGetProperty, kvSetProperty, kvGetSubProperty and
 * kvSetSubProperty; any other gives -1. */
KVSIM_API int32_t kvsimFailProperty(const char *function, uint32_t propertyId, int32_t status,
                                    int32_t count);

/* Drops every injected failure. */
KVSIM_API void kvsimClearFailures(void);

/* ==== Call log =============================================================================== */

/* One driver call. The meaning of the fields follows the function:
 *
 *   function                 object                     propertyId  size1          size2
 *   kvCreateSession          handle made (0 if failed)  0           mode           0
 *   kvhdnCreateErrorSession  handle made (0 if failed)  0           the status     0
 *   kvClear                  session                    0           0              0
 *   kvWait                   session                    condition   parameter      0
 *   kvStatusToString         the status                 0           size           0
 *   kvSystemOpen             handle made (0 if failed)  0           0              0
 *   kvSystemClose            system                     0           0              0
 *   kvGetPropertySize        object                     identifier  0              0
 *   kvGetProperty            object                     identifier  size           0
 *   kvSetProperty            object                     identifier  size           0
 *   kvGetSubProperty         object                     identifier  size           index
 *   kvSetSubProperty         object                     identifier  size           index
 *   kvReadSignalSinglePoint  session                    0           values size    timestamps size
 *   kvWriteSignalSinglePoint session                    0           values size    0
 *   kvhdnReadSignalWaveform  session                    0           buffer size    0
 *   kvhdnWriteSignalWaveform session                    0           buffer size    0
 *   kvReadSignalXY           session                    0           values size    counts size
 *   kvWriteSignalXY          session                    0           values size    counts size
 *   kvStart                  session                    0           scope          0
 *   kvStop                   session                    0           scope          0
 *   kvFlush                  session                    0           0              0
 *   kvConnectTerminals       session                    0           0              0
 *   kvDisconnectTerminals    session                    0           0              0
 *   kvhdnCreateSvTiming_FlexRayMacrotick
 *                            session                    0           0              0
 *   kvBlink                  interface                  0           mode           0
 *   kvdbCloseDatabase        database                   0           closeAll       0
 *   kvhdndbCreateErrorObject handle made (0 if failed)  0           the status     0
 *   kvWriteState             session                    state       size           0
 *   kvReadState              session                    state       size           0
 *   kvReadStateTimeTrigger   session                    0           size           0
 *   kvFutureTimeTrigger      session                    0           option         0
 *   kvReadFrame              session                    0           size           0
 *   kvhdnReadFrame           session                    0           size           numFrames
 *   kvWriteFrame             session                    0           size           0
 *   kvhdnReadFrameEthernet   session                    0           numFrames      0
 *   kvhdnWriteFrameEthernet  session                    0           numFrames      0
 *   kvConvertSignalsToFramesSinglePoint
 *                            session                    0           values size    frames size
 *   kvConvertFramesToSignalsSinglePoint
 *                            session                    0           frames size    values size
 *   kvConvertByteArrayToFramesSinglePoint
 *                            session                    0           image size     frames size
 *   kvConvertFramesToByteArraySinglePoint
 *                            session                    0           frames size    image size
 *
 * `text` holds the interface name of kvCreateSession, and "source -> destination" for
 * kvConnectTerminals and kvDisconnectTerminals (a null name as empty), cut to 63 bytes; it is
 * empty otherwise.
 * `status` is the result, or KVSIM_STATUS_PENDING while the call is inside the driver. */
typedef struct kvsimCallRecord {
  char function[48]; /* the whole name of every driver function fits */
  uint32_t object;
  uint32_t propertyId;
  uint32_t size1;
  uint32_t size2;
  int32_t status;
  char text[64];
} kvsimCallRecord;

/* Number of calls in the log, in the order in which they entered the driver. The log keeps the
 * latest 1048576 calls; older ones are dropped. */
KVSIM_API int32_t kvsimLogCount(void);

/* Copies call `index` (0 the oldest kept) into *entry. Returns 1, or 0 if there is no such call or
 * `entry` is null. */
KVSIM_API int32_t kvsimLogEntry(int32_t index, kvsimCallRecord *entry);

/* Empties the log. Calls still inside the driver are not recorded again when they return. */
KVSIM_API void kvsimLogClear(void);

/* Number of logged calls of `function`. */
KVSIM_API int32_t kvsimCountCalls(const char *function);

/* Number of logged kvGetPropertySize, kvGetProperty and kvGetSubProperty calls for `propertyId`,
 * on any object. */
KVSIM_API int32_t kvsimCountPropertyReads(uint32_t propertyId);

/* Turns the log off (0) or on (non-zero). While it is off driver calls are not recorded, so that
 * a benchmark measures no logging; holds and injected failures still apply. On after a reset. */
KVSIM_API void kvsimSetCallLog(int32_t on);

/* ==== Virtual clock ========================================================================== */

/* The driver's time, in 100 ns units since 1601-01-01 00:00 UTC. It moves only when told; every
 * timestamp that the driver gives comes from it. 0 after a reset. */
KVSIM_API void kvsimSetClock(uint64_t rawTime);
KVSIM_API void kvsimAdvanceClock(uint64_t delta);
KVSIM_API uint64_t kvsimClock(void);

/* ==== Held calls ============================================================================= */

/* From now on every call of the driver function `function` parks inside the driver, after it has
 * been logged and before anything else, until kvsimRelease. A parked call on a session returns
 * kvsimErrSessionCleared if the session is cleared meanwhile. Returns 0, or -1 for a name that is
 * not a driver function. */
KVSIM_API int32_t kvsimHold(const char *function);

/* Lifts the hold of `function`: its parked calls go on. Returns 0, or -1 as kvsimHold. */
KVSIM_API int32_t kvsimRelease(const char *function);

/* Waits until at least `count` calls of `function` are parked at once. Returns 1 when they are,
 * 0 after a safety limit of 10 seconds. */
KVSIM_API int32_t kvsimWaitParked(const char *function, int32_t count);

/* Waits until at least `count` calls of `function` are blocked inside the driver waiting for
 * their event (kvWait for its condition), so that what the test does next happens during the
 * wait. Returns 1 when they are, 0 after a safety limit of 10 seconds. */
KVSIM_API int32_t kvsimWaitBlocked(const char *function, int32_t count);

/* ==== Signal values ========================================================================== */

/* Puts the first `count` values (at most the session's number of signals) on the session's
 * network as the latest values of the session's signals, in list order, with the clock's time as
 * their timestamp. Every session on the same network whose list names a signal sees its value,
 * as a value written by kvWriteSignalSinglePoint on that network is seen. Signals are matched
 * by their name in the list. Returns the number of values set, or -1 if `session` is not an open
 * session (error sessions included) or `values` is null while `count` is positive. */
KVSIM_API int32_t kvsimSetSignalValues(uint32_t session, const double *values, int32_t count);

/* Copies the latest values of the session's signals, in list order, into `values` (at most
 * `max`; a signal never set reads 0.0). Returns the session's number of signals, or -1 as
 * kvsimSetSignalValues. */
KVSIM_API int32_t kvsimGetSignalValues(uint32_t session, double *values, int32_t max);

/* From now on the signal reads of the input session (modes 0, 1, 2) do nothing but fill what
 * they are given, after their checks: value k of signal i is 1000 i + k, stamped with the clock
 * plus k (raw time). kvReadSignalXY gives each signal min(run length, pairs) pairs,
 * kvhdnReadSignalWaveform min(samples per buffer, pairs) samples starting at the clock at
 * 1 / kvPropSession_ResampRate seconds, kvReadSignalSinglePoint value 0 of each. Nothing waits
 * and nothing is taken from what arrived. A negative `pairs` ends it. Returns 0, or -1 for a
 * session that is not a signal input session. */
KVSIM_API int32_t kvsimSetSignalReadFill(uint32_t session, int32_t pairs);

/* ==== Frames ================================================================================= */

/* Puts the variable-form records (recordSize(L) bytes each, the long form for Type 0xC0) into the
 * input session as received, Timestamp, Type, Flags and Info as given: at the end of its queue,
 * subject to its length, or as the latest frame of the list items that name them. Returns the
 * number of records, or -1 for a session that is not a frame input session, a null `records` with
 * a non-zero size, or records that do not exactly fill `size`. */
KVSIM_API int32_t kvsimQueueFrames(uint32_t session, const void *records, uint32_t size);

/* From now on kvReadFrame and kvhdnReadFrame on the input session do nothing but copy these bytes
 * as they are, whatever they hold: as many as fit into the read's size, and for kvhdnReadFrame no
 * more than its first numFrames records, walked as the variable form, take; bytesReturned is that
 * count. `repeat` non-zero serves the same bytes to every read until the next
 * kvsimSetReadStream; zero serves them to the next read only, after which reads take frames
 * again. The checks of the session, mode and protocol still come first. Returns 0, or -1 for a
 * session that is not a frame input session or a null `bytes` with a non-zero size. */
KVSIM_API int32_t kvsimSetReadStream(uint32_t session, const void *bytes, uint32_t size,
                                     int32_t repeat);

/* Copies into `buffer` up to `size` bytes that the last successful kvWriteFrame on the output
 * session was given, and returns how many it was given (0 before any). -1 for a session that is
 * not a frame output session, or a null `buffer` with a non-zero size. */
KVSIM_API int32_t kvsimLastWrite(uint32_t session, void *buffer, uint32_t size);

/* The number of frames of the last successful kvhdnWriteFrameEthernet on the output session (0
 * before any), or -1 as kvsimLastWrite. */
KVSIM_API int32_t kvsimLastEthernetWriteCount(uint32_t session);

/* Copies up to `size` bytes of frame `index` of that write into `buffer` and returns the frame's
 * length; -1 as kvsimLastWrite, or for an index beyond the write's frames. */
KVSIM_API int32_t kvsimLastEthernetWrite(uint32_t session, uint32_t index, void *buffer,
                                         uint32_t size);

/* With `on` non-zero, kvWriteFrame on the output session only keeps the bytes it is given for
 * kvsimLastWrite, after the checks of session, mode and time limit: the records are neither
 * checked nor sent. Returns 0, or -1 for a session that is not a frame output session. */
KVSIM_API int32_t kvsimSetWriteSink(uint32_t session, int32_t on);

/* Number of frames dropped since the input session was made because its queue was full, or -1
 * for a session that is not a frame input session. A flush keeps the count. */
KVSIM_API int32_t kvsimDroppedFrames(uint32_t session);

/* ==== Wait conditions ======================================================================== */

/* Raises `condition` (an enum kvsimCondition) on the session with `value` for kvWait's output,
 * waking every kvWait for it. Returns 0, or -1 for a session that is not open or an unknown
 * condition. */
KVSIM_API int32_t kvsimRaiseCondition(uint32_t session, uint32_t condition, uint32_t value);

/* Lowers `condition` on the session: later waits for it block again. Returns 0 or -1. */
KVSIM_API int32_t kvsimLowerCondition(uint32_t session, uint32_t condition);

/* ==== Session and interface state ============================================================ */

/* 1 if the session is started, 0 if stopped; -1 for a session that is not open (error sessions
 * included). */
KVSIM_API int32_t kvsimSessionStarted(uint32_t session);

/* 1 if the interface of that name (as kvCreateSession takes it, without a "/suffix") is started,
 * 0 if stopped; -1 for a name that is not an interface. */
KVSIM_API int32_t kvsimInterfaceStarted(const char *interfaceName);

/* 1 if the session has connected the route from `source` to `destination`, 0 if not; -1 for a
 * session that is not open (error sessions included) or a null name. */
KVSIM_API int32_t kvsimTerminalsConnected(uint32_t session, const char *source,
                                          const char *destination);

/* Number of routes that the session has connected, or -1 as kvsimTerminalsConnected. */
KVSIM_API int32_t kvsimTerminalConnectionCount(uint32_t session);

/* The mode of enum kvsimBlinkMode of the interface of that name, or -1 for a name that is not an
 * interface. */
KVSIM_API int32_t kvsimBlinkMode(const char *interfaceName);

/* ==== LIN schedule ============================================================================ */

/* The schedule index that kvWriteState selected last on the session into *index: 1 if one was
 * selected, 0 if none was since the session was made, -1 for a session that is not open (error
 * sessions included) or a null `index`. */
KVSIM_API int32_t kvsimLinSchedule(uint32_t session, uint32_t *index);

/* ==== State writes and the future time trigger =============================================== */

/* Lets kvWriteState write the 4-byte state `stateId` on the session from now on, until the
 * session is cleared. Returns 0, or -1 for a session that is not open (error sessions included)
 * or for kvState_LINScheduleChange, which every LIN session knows. */
KVSIM_API int32_t kvsimAllowStateWrite(uint32_t session, uint32_t stateId);

/* The value that kvWriteState wrote last to the writable state `stateId` of the session into
 * *value: 1 if one was written, 0 if none was since it was declared writable, -1 for a session
 * that is not open, a state not declared writable on it, or a null `value`. */
KVSIM_API int32_t kvsimLastState(uint32_t session, uint32_t stateId, uint32_t *value);

/* The time and option of the trigger that kvFutureTimeTrigger armed last on the session: 1 if one
 * was armed, 0 if none was since the session was made, -1 for a session that is not open (error
 * sessions included) or a null pointer. */
KVSIM_API int32_t kvsimFutureTrigger(uint32_t session, uint64_t *when, uint32_t *option);

/* ==== States ================================================================================= */

/* Sets what kvReadState gives for `stateId` on the session: the `size` bytes at `bytes`, and
 * `fault` as its fault word. Returns 0, or -1 for a session that is not open (error sessions
 * included), a null `bytes`, or a state and size that kvReadState would refuse on the session. */
KVSIM_API int32_t kvsimSetState(uint32_t session, uint32_t stateId, uint32_t size,
                                const void *bytes, uint32_t fault);

/* Arms the session's time trigger: from the moment the clock reaches `firesAt` (raw time),
 * kvReadStateTimeTrigger gives the 24 bytes at `record`, until the trigger is set again. A reset
 * or a clear of the session drops it. Returns 0, or -1 for a session that is not open (error
 * sessions included) or a null `record`. */
KVSIM_API int32_t kvsimSetTimeTrigger(uint32_t session, uint64_t firesAt, const void *record);

/* ==== Counts ================================================================================= */

/* Number of open sessions, error sessions included. */
KVSIM_API int32_t kvsimOpenSessionCount(void);

/* Number of open systems. */
KVSIM_API int32_t kvsimOpenSystemCount(void);

/* ==== Databases ============================================================================== */

/* Statuses of the kvdb functions, besides the driver's general ones. */
enum kvsimDatabaseStatus {
  kvsimErrDatabaseNotFound = (int32_t)0xBFF62061, /* no alias, and no file, of that name */
  kvsimErrDatabaseSyntax = (int32_t)0xBFF62062,   /* the file is not a database file; the text of
                                                     kvsimDatabaseErrorText names the line */
  kvsimErrObjectNotFound = (int32_t)0xBFF62063,   /* the parent has no object of that class and
                                                     name */
  kvsimErrObjectExists = (int32_t)0xBFF62064,     /* the name, frame identifier, multiplexer or
                                                     cluster is taken already */
  kvsimErrInvalidClass = (int32_t)0xBFF62065,     /* no object of that class under that parent, or
                                                     one that cannot be deleted */
  kvsimErrInvalidName = (int32_t)0xBFF62066,      /* not an identifier (a letter or '_', then
                                                     letters, digits and '_') */
  kvsimErrDatabaseWrite = (int32_t)0xBFF62067,    /* the database cannot be saved there, or cannot
                                                     be written as a database file */
  kvsimErrSignalLayout = (int32_t)0xBFF62068,     /* kvPropSig_ConfigStatus, kvPropFrm_ConfigStatus:
                                                     a signal does not fit its frame, or a frame
                                                     has multiplexed signals and no multiplexer */
  kvsimErrWrongObject = (int32_t)0xBFF62069       /* a handle set into a reference property is not
                                                     one of an object of the class that the
                                                     property refers to, in the same cluster */
};

/* Copies the message of the latest open, save or alias that failed on its file ("tesla.dbc,
 * line 12: bad scale '1x'"), or of a find whose signal name more than one frame uses, into
 * `text`, cut to `size` - 1 bytes and NUL-terminated. Returns the length of the whole message; 0
 * when none has failed since the reset.
 *
 * The call log records the kvdb functions with: `object` the handle made (kvdbOpenDatabase, 0 if
 * it failed) or the object or parent given; `propertyId` the identifier of the property calls;
 * `size1` the class (kvdbFindObject, kvdbCreateObject), closeAll, the property size, the baud
 * rate (kvdbAddAlias), the aliases size (kvdbGetDatabaseList, with the paths size in `size2`),
 * the copy mode (kvdbMerge, with the source cluster in `size2`) or the mode (kvdbGetDBCAttribute
 * and its size call, with the buffer size in `size2`); `text` the name, alias, path or prefix
 * given. */
KVSIM_API int32_t kvsimDatabaseErrorText(char *text, uint32_t size);

/* Number of databases loaded: opened and not yet closed as often. */
KVSIM_API int32_t kvsimLoadedDatabaseCount(void);

/* The next `count` calls of kvdbGetDatabaseList (0 or less: none) find the list changed since
 * its sizes were taken: each returns kvErrDatabaseListChanged and copies nothing. A reset ends
 * it. */
KVSIM_API void kvsimChangeDatabaseList(int32_t count);

#ifdef __cplusplus
}
#endif

#endif
