#include "Support/AssertionRecorder.h"

#include "Common/ZenAssert.h"

namespace zentest {

namespace {

std::vector<AssertionRecorder::Assertion>& Recorded() {
    static std::vector<AssertionRecorder::Assertion> recorded;
    return recorded;
}

void Record(const char* message, const char* file, int line) { Recorded().push_back({message, file, line}); }

}  // namespace

AssertionRecorder::AssertionRecorder() {
    Recorded().clear();
    zen::SetAssertionHandler(&Record);
}

AssertionRecorder::~AssertionRecorder() { zen::SetAssertionHandler(nullptr); }

const std::vector<AssertionRecorder::Assertion>& AssertionRecorder::Assertions() const { return Recorded(); }

}  // namespace zentest
