// The project sessions of one interface, keyed by the interface text without its "/..." suffix.
#ifndef KVSVAPI_SESSION_SN_LIFE_INTERFACE_H
#define KVSVAPI_SESSION_SN_LIFE_INTERFACE_H

#include <memory>
#include <string>

#include <boost/noncopyable.hpp>
#include <boost/unordered_map.hpp>

#include "session/sn_life_session.h"

namespace nKVSVAPI100 {

class cSnLifeInterface : boost::noncopyable {
 public:
  cSnLifeInterface();
  ~cSnLifeInterface();

  std::string tag;  // compared at each later open
  std::string database;
  std::string cluster;
  boost::unordered_map<std::string, cSnLifeSession *> sessions;  // owned
};

}  // namespace nKVSVAPI100

#endif
