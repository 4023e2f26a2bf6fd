// What the soak found wrong. Each finding is counted and the first ones are printed as they come,
// with the thread that saw them.
#ifndef KVSVAPI_STRESS_SOAK_VIOLATIONS_H
#define KVSVAPI_STRESS_SOAK_VIOLATIONS_H

#include <cstdint>
#include <string>

namespace nKvsvSoak {

void Violation(const std::string &thread, const std::string &what);
uint64_t ViolationCount();

// "0xBFF63020 (text)": a status as the library names it.
std::string StatusText(int32_t status);

}  // namespace nKvsvSoak

#endif
