// The property programs' fixture: reset stand-ins, slots and host handles ended after each test,
// and the error information that a property export leaves for the host.
#ifndef KVSVAPI_TESTS_PROPERTY_FIXTURE_H
#define KVSVAPI_TESTS_PROPERTY_FIXTURE_H

#include <string>

#include "support/host_strings.h"
#include "support/slot_fixture.h"

class PropertyFixture : public SlotFixture {
 protected:
  void TearDown() override {
    if (info_ != nullptr) svDisposeHandle(info_);
    SlotFixture::TearDown();
  }
  // The annotation the last call left in `info_`, which then belongs to the test again.
  std::string Annotation() {
    const std::string text = info_ != nullptr ? kvsvtest::Text(Keep(info_)) : "";
    info_ = nullptr;
    return text;
  }

  SvHandle info_ = nullptr;
};

#endif
