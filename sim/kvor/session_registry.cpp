#include "session_registry.h"

#include "kvsim.h"

namespace nKvorSim {

Status SessionRegistry::Add(std::shared_ptr<Session> session, uint32_t *handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  // The index goes round instead of taking the lowest free one, so that an index comes back as
  // late as possible and a stale handle is caught even by a caller that looks only at the index.
  for (uint32_t step = 1; step <= kMaxSessions; ++step) {
    const uint32_t index = (lastIndex_ + step - 1) % kMaxSessions + 1;
    if (inUse_[index]) continue;
    const uint32_t made = kTag | (uint32_t{++generation_[index]} << 16) | index;
    sessions_.emplace(made, std::move(session));
    inUse_[index] = true;
    lastIndex_ = index;
    *handle = made;
    return 0;
  }
  return kvsimErrTooManySessions;
}

std::shared_ptr<Session> SessionRegistry::Find(uint32_t handle) const {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = sessions_.find(handle);
  return found == sessions_.end() ? nullptr : found->second;
}

std::shared_ptr<Session> SessionRegistry::Remove(uint32_t handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = sessions_.find(handle);
  if (found == sessions_.end()) return nullptr;
  std::shared_ptr<Session> session = std::move(found->second);
  sessions_.erase(found);
  inUse_[handle & 0xFFFFu] = false;
  return session;
}

std::vector<std::shared_ptr<Session>> SessionRegistry::RemoveAll() {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<std::shared_ptr<Session>> removed;
  removed.reserve(sessions_.size());
  for (auto &entry : sessions_) removed.push_back(std::move(entry.second));
  sessions_.clear();
  inUse_.fill(false);
  return removed;
}

std::vector<std::shared_ptr<Session>> SessionRegistry::All() const {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<std::shared_ptr<Session>> all;
  all.reserve(sessions_.size());
  for (const auto &entry : sessions_) all.push_back(entry.second);
  return all;
}

size_t SessionRegistry::Count() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return sessions_.size();
}

}  // namespace nKvorSim
