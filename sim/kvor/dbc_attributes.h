// The names of the attributes and placeholders that carry database properties in a CAN
// database file, shared by its reader and its writer.
#ifndef KVOR_SIM_DBC_ATTRIBUTES_H
#define KVOR_SIM_DBC_ATTRIBUTES_H

#include <cstdint>
#include <string_view>

namespace nKvorSim {

constexpr std::string_view kAttrCycleTime = "GenMsgCycleTime";    // frame, milliseconds
constexpr std::string_view kAttrFrameFormat = "VFrameFormat";     // frame, enumeration index
constexpr std::string_view kAttrStartValue = "GenSigStartValue";  // signal, raw value
constexpr std::string_view kAttrBaudRate = "Baudrate";            // cluster
constexpr std::string_view kAttrFdBaudRate = "BaudrateCANFD";     // cluster, data phase
constexpr std::string_view kAttrClusterName = "DBName";           // cluster
constexpr std::string_view kAttrStationAddress = "NmStationAddress";  // ECU, J1939 address
// Frame, the PDUs that it carries when not only its own: "names|start bits|update bits", each
// list cut by commas.
constexpr std::string_view kAttrPduMapping = "PduMapping";

// Indexes of the frame format enumeration; those between are not CAN frames.
constexpr uint32_t kFormatStandardCan = 0;
constexpr uint32_t kFormatExtendedCan = 1;
constexpr uint32_t kFormatStandardCanFd = 14;
constexpr uint32_t kFormatExtendedCanFd = 15;

// Stands where a file needs a node name and no node is meant: no transmitter, no receiver.
constexpr std::string_view kNoNode = "Vector__XXX";

}  // namespace nKvorSim

#endif
