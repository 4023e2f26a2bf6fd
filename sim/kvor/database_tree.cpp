#include "database_tree.h"

#include <algorithm>

#include "kvsim.h"

namespace nKvorSim {

namespace {

template <class List>
auto *Named(List &list, const std::string &name) {
  for (auto &item : list) {
    if (item.name == name) return &item;
  }
  return static_cast<typename List::value_type *>(nullptr);
}

template <class List, class Item>
void Erase(List &list, const Item *item) {
  for (auto it = list.begin(); it != list.end(); ++it) {
    if (&*it == item) {
      list.erase(it);
      return;
    }
  }
}

tObjectRef As(const tObjectRef &from, uint32_t objectClass) {
  tObjectRef ref = from;
  ref.objectClass = objectClass;
  return ref;
}

tSubframe *SubframeOf(tFrame &frame, const tSignal &signal) {
  if (signal.mux != MuxRole::kMultiplexed) return nullptr;
  for (tSubframe &subframe : frame.subframes) {
    if (subframe.muxValue == signal.muxValue) return &subframe;
  }
  return nullptr;
}

// The child found by "outer.inner" in a cluster, or by `inner` alone if only one outer object
// has it. `innerOf(outer, name)` finds in one outer object.
template <class Outers, class InnerOf>
Status FindQualified(Outers &outers, const std::string &name, const char *what, InnerOf innerOf,
                     std::string *error, decltype(&*outers.begin()) *outerFound) {
  const size_t dot = name.find('.');
  if (dot != std::string::npos) {
    auto *outer = Named(outers, name.substr(0, dot));
    if (outer == nullptr || !innerOf(*outer, name.substr(dot + 1))) return kvsimErrObjectNotFound;
    *outerFound = outer;
    return 0;
  }
  bool seen = false;
  for (auto &outer : outers) {
    if (!innerOf(outer, name)) continue;
    if (seen) {
      *error = std::string(what) + " '" + name + "' is in more than one " +
               (what[0] == 'e' ? "schedule: name it with its schedule" : "frame: name it with its frame");
      return kvsimErrObjectNotFound;
    }
    seen = true;
    *outerFound = &outer;
  }
  return seen ? 0 : kvsimErrObjectNotFound;
}

Status FindInCluster(const tObjectRef &parent, uint32_t objectClass, const std::string &name,
                     tObjectRef *found, std::string *error) {
  tCluster &cluster = *parent.cluster;
  *found = As(parent, objectClass);
  switch (objectClass) {
    case kClassEcu:
      found->ecu = Named(cluster.ecus, name);
      return found->ecu != nullptr ? 0 : kvsimErrObjectNotFound;
    case kClassFrame:
    case kClassPdu:
      found->frame = Named(cluster.frames, name);
      return found->frame != nullptr ? 0 : kvsimErrObjectNotFound;
    case kClassLinSchedule:
      found->schedule = Named(cluster.linSchedules, name);
      return found->schedule != nullptr ? 0 : kvsimErrObjectNotFound;
    case kClassSignal:
    case kClassSubframe: {
      const bool signal = objectClass == kClassSignal;
      const Status status = FindQualified(
          cluster.frames, name, signal ? "signal" : "subframe",
          [&](tFrame &frame, const std::string &inner) {
            if (signal) return Named(frame.signals, inner) != nullptr;
            AddMissingSubframes(&frame);
            return Named(frame.subframes, inner) != nullptr;
          },
          error, &found->frame);
      if (status != 0) return status;
      const std::string inner = name.substr(name.find('.') + 1);
      if (signal) {
        found->signal = Named(found->frame->signals, inner);
        found->subframe = nullptr;
      } else {
        found->subframe = Named(found->frame->subframes, inner);
      }
      return 0;
    }
    case kClassLinScheduleEntry: {
      const Status status = FindQualified(
          cluster.linSchedules, name, "entry",
          [&](tLinSchedule &schedule, const std::string &inner) {
            return Named(schedule.entries, inner) != nullptr;
          },
          error, &found->schedule);
      if (status != 0) return status;
      found->entry = Named(found->schedule->entries, name.substr(name.find('.') + 1));
      return 0;
    }
    default:
      return kvsimErrInvalidClass;
  }
}

// The lowest identifier that no frame of the cluster has, standard before extended.
Status FreeIdentifier(const tCluster &cluster, tFrame *frame) {
  for (;;) {
    bool free = true;
    for (const tFrame &other : cluster.frames) {
      if (other.id == frame->id && other.extended == frame->extended) free = false;
    }
    if (free) return 0;
    if (frame->id == MaxFrameId(frame->extended)) {
      if (frame->extended) return kvsimErrObjectExists;
      frame->extended = true;
      frame->id = 0;
    } else {
      ++frame->id;
    }
  }
}

}  // namespace

Status FindChild(const tObjectRef &parent, uint32_t objectClass, const std::string &name,
                 tObjectRef *found, std::string *error) {
  switch (parent.objectClass) {
    case kClassDatabase: {
      std::list<tCluster> &clusters = parent.database->clusters;
      if (objectClass != kClassCluster) {
        if (clusters.size() != 1) return kvsimErrInvalidClass;
        tObjectRef cluster = As(parent, kClassCluster);
        cluster.cluster = &clusters.front();
        return FindChild(cluster, objectClass, name, found, error);
      }
      *found = As(parent, kClassCluster);
      found->cluster = name.empty() && !clusters.empty() ? &clusters.front() : Named(clusters, name);
      return found->cluster != nullptr ? 0 : kvsimErrObjectNotFound;
    }
    case kClassCluster:
      return FindInCluster(parent, objectClass, name, found, error);
    case kClassFrame:
    case kClassPdu:
      *found = As(parent, objectClass);
      if (objectClass == kClassSignal) {
        found->signal = Named(parent.frame->signals, name);
        return found->signal != nullptr ? 0 : kvsimErrObjectNotFound;
      }
      if (objectClass == kClassSubframe) {
        AddMissingSubframes(parent.frame);
        found->subframe = Named(parent.frame->subframes, name);
        return found->subframe != nullptr ? 0 : kvsimErrObjectNotFound;
      }
      return kvsimErrInvalidClass;
    case kClassSubframe:
      if (objectClass != kClassSignal) return kvsimErrInvalidClass;
      // The signal's handle is the one it has in its frame.
      *found = As(parent, kClassSignal);
      found->subframe = nullptr;
      found->signal = Named(parent.frame->signals, name);
      if (found->signal == nullptr || SubframeOf(*parent.frame, *found->signal) != parent.subframe) {
        return kvsimErrObjectNotFound;
      }
      return 0;
    case kClassLinSchedule:
      if (objectClass != kClassLinScheduleEntry) return kvsimErrInvalidClass;
      *found = As(parent, kClassLinScheduleEntry);
      found->entry = Named(parent.schedule->entries, name);
      return found->entry != nullptr ? 0 : kvsimErrObjectNotFound;
    default:
      return kvsimErrInvalidClass;
  }
}

Status CreateChild(const tObjectRef &parent, uint32_t objectClass, const std::string &name,
                   tObjectRef *made) {
  if (!IsIdentifier(name)) return kvsimErrInvalidName;
  *made = As(parent, objectClass);
  const uint32_t under = parent.objectClass;
  if (under == kClassDatabase && objectClass == kClassCluster) {
    // A database file holds one cluster.
    if (!parent.database->clusters.empty()) return kvsimErrObjectExists;
    made->cluster = &parent.database->clusters.emplace_back();
    made->cluster->name = name;
    return 0;
  }
  if (under == kClassCluster && objectClass == kClassEcu) {
    if (Named(parent.cluster->ecus, name) != nullptr) return kvsimErrObjectExists;
    made->ecu = &parent.cluster->ecus.emplace_back();
    made->ecu->name = name;
    return 0;
  }
  if (under == kClassCluster && (objectClass == kClassFrame || objectClass == kClassPdu)) {
    if (Named(parent.cluster->frames, name) != nullptr) return kvsimErrObjectExists;
    tFrame frame;
    frame.name = name;
    if (const Status status = FreeIdentifier(*parent.cluster, &frame)) return status;
    made->frame = &parent.cluster->frames.emplace_back(std::move(frame));
    return 0;
  }
  if (under == kClassCluster && objectClass == kClassLinSchedule) {
    if (Named(parent.cluster->linSchedules, name) != nullptr) return kvsimErrObjectExists;
    made->schedule = &parent.cluster->linSchedules.emplace_back();
    made->schedule->name = name;
    return 0;
  }
  if (under == kClassLinSchedule && objectClass == kClassLinScheduleEntry) {
    if (Named(parent.schedule->entries, name) != nullptr) return kvsimErrObjectExists;
    made->entry = &parent.schedule->entries.emplace_back();
    made->entry->name = name;
    return 0;
  }
  if ((under == kClassFrame || under == kClassPdu || under == kClassSubframe) &&
      objectClass == kClassSignal) {
    tFrame &frame = *parent.frame;
    if (Named(frame.signals, name) != nullptr) return kvsimErrObjectExists;
    tSignal signal;
    signal.name = name;
    if (under == kClassSubframe) {
      signal.mux = MuxRole::kMultiplexed;
      signal.muxValue = parent.subframe->muxValue;
    }
    made->subframe = nullptr;
    made->signal = &frame.signals.emplace_back(std::move(signal));
    return 0;
  }
  if ((under == kClassFrame || under == kClassPdu) && objectClass == kClassSubframe) {
    tFrame &frame = *parent.frame;
    // Only a frame with a multiplexer has values to select subframes by.
    if (FindMultiplexer(frame) == nullptr) return kvsimErrInvalidClass;
    AddMissingSubframes(&frame);
    if (Named(frame.subframes, name) != nullptr) return kvsimErrObjectExists;
    uint32_t value = 0;
    while (std::any_of(frame.subframes.begin(), frame.subframes.end(),
                       [&](const tSubframe &s) { return s.muxValue == value; })) {
      ++value;
    }
    made->subframe = &frame.subframes.emplace_back(tSubframe{name, value});
    return 0;
  }
  return kvsimErrInvalidClass;
}

Status DeleteObject(const tObjectRef &object, std::set<const void *> *gone) {
  switch (object.objectClass) {
    case kClassCluster:
      gone->insert(object.cluster);
      Erase(object.database->clusters, object.cluster);
      return 0;
    case kClassFrame:
    case kClassPdu: {
      const std::string name = object.frame->name;
      gone->insert(object.frame);
      Erase(object.cluster->frames, object.frame);
      ForgetFrame(object.cluster, name);
      return 0;
    }
    case kClassSignal:
      gone->insert(object.signal);
      Erase(object.frame->signals, object.signal);
      return 0;
    case kClassSubframe: {
      // Its signals are those that its value selects.
      std::list<tSignal> &signals = object.frame->signals;
      for (auto it = signals.begin(); it != signals.end();) {
        if (SubframeOf(*object.frame, *it) == object.subframe) {
          gone->insert(&*it);
          it = signals.erase(it);
        } else {
          ++it;
        }
      }
      gone->insert(object.subframe);
      Erase(object.frame->subframes, object.subframe);
      return 0;
    }
    case kClassEcu: {
      // The frames name their nodes by text, so they lose this one.
      const std::string name = object.ecu->name;
      for (tFrame &frame : object.cluster->frames) {
        if (frame.transmitter == name) frame.transmitter.clear();
        for (tSignal &signal : frame.signals) {
          auto &receivers = signal.receivers;
          receivers.erase(std::remove(receivers.begin(), receivers.end(), name), receivers.end());
        }
      }
      gone->insert(object.ecu);
      Erase(object.cluster->ecus, object.ecu);
      return 0;
    }
    case kClassLinSchedule: {
      const std::string name = object.schedule->name;
      gone->insert(object.schedule);
      Erase(object.cluster->linSchedules, object.schedule);
      RenameScheduleReferences(object.cluster, name, "");
      return 0;
    }
    case kClassLinScheduleEntry:
      gone->insert(object.entry);
      Erase(object.schedule->entries, object.entry);
      return 0;
    default:
      return kvsimErrInvalidClass;
  }
}

bool IsWithin(const tObjectRef &ref, const std::set<const void *> &gone) {
  for (const void *part : {static_cast<const void *>(ref.cluster), static_cast<const void *>(ref.frame),
                           static_cast<const void *>(ref.signal), static_cast<const void *>(ref.subframe),
                           static_cast<const void *>(ref.ecu), static_cast<const void *>(ref.schedule),
                           static_cast<const void *>(ref.entry)}) {
    if (part != nullptr && gone.count(part) != 0) return true;
  }
  return false;
}

}  // namespace nKvorSim
