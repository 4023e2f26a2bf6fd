// The attributes of a database file as the database has them now: the definitions and values
// that the file gave, with the values of the attributes that carry properties (cycle time, frame
// format, start value, baud rates, cluster name) taken from those properties. The file's reader
// fills the store; its writer and the driver's attribute calls read it through these functions.
#ifndef KVOR_SIM_DBC_ATTRIBUTE_VALUES_H
#define KVOR_SIM_DBC_ATTRIBUTE_VALUES_H

#include <string>
#include <vector>

#include "database_model.h"

namespace nKvorSim {

// The file's definitions, then the driver's own for each attribute that carries a property and
// that the file does not define.
std::vector<tAttributeDefinition> AttributeDefinitions(const tCluster &cluster);

// The values set on each kind of object, by attribute name: those the file gave, and those of
// the properties that differ from their attribute's default.
tAttributeValues ClusterAttributes(const tCluster &cluster);
tAttributeValues EcuAttributes(const tEcu &ecu);
tAttributeValues FrameAttributes(const tCluster &cluster, const tFrame &frame);
tAttributeValues SignalAttributes(const tCluster &cluster, const tSignal &signal);

// A frame's PDUs as the text of its attribute, and back; false for a text that is not one.
std::string PduMappingText(const tPduMapping &mapping);
bool ParsePduMapping(const std::string &text, tPduMapping *mapping);

// The shortest text that reads back to the same double.
std::string NumberText(double value);

}  // namespace nKvorSim

#endif
