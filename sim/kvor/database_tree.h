// The objects of an open database under their parents: found by class and name, made, deleted.
//
// Names: a frame, its PDU, an ECU and a LIN schedule are named in their cluster. A signal is
// named in its frame (or in its subframe, among that subframe's signals), and in its cluster as
// "frame.signal" or by its name alone if no other frame has it. A subframe is named in its frame,
// and in its cluster as "frame.subframe" or by its name alone if it is unique; a subframe read from
// a file is "m" and its multiplexer value ("Status.m2"), as the file marks its signals. A LIN
// schedule entry is named in its schedule, and in its cluster as "schedule.entry" or alone.
#ifndef KVOR_SIM_DATABASE_TREE_H
#define KVOR_SIM_DATABASE_TREE_H

#include <cstdint>
#include <set>
#include <string>

#include "database_object.h"
#include "driver_status.h"

namespace nKvorSim {

// The object of `objectClass` and `name` under `parent`. A database of one cluster stands for
// that cluster; an empty cluster name finds the database's first. *error says why a name that
// more than one object has was refused.
Status FindChild(const tObjectRef &parent, uint32_t objectClass, const std::string &name,
                 tObjectRef *found, std::string *error);

// Makes an object of `objectClass` named `name` under `parent`: a cluster in an empty database;
// a frame, PDU (which is a new frame's), ECU or LIN schedule in a cluster; a signal or subframe
// in a frame; a multiplexed signal in a subframe; an entry in a LIN schedule.
Status CreateChild(const tObjectRef &parent, uint32_t objectClass, const std::string &name,
                   tObjectRef *made);

// Deletes the object with everything it holds; *gone gets every object that went, so that
// their handles can go too. A database is not deleted but closed.
Status DeleteObject(const tObjectRef &object, std::set<const void *> *gone);

// Whether `ref` stands for an object in `gone` or under one.
bool IsWithin(const tObjectRef &ref, const std::set<const void *> &gone);

}  // namespace nKvorSim

#endif
