// Records the library's debug assertions for the scope of a test instead of
// aborting, so that tests can check that programming errors are reported.
#pragma once

#include <string>
#include <vector>

namespace zentest {

class AssertionRecorder {
public:
    struct Assertion {
        std::string message;
        std::string file;
        int line;
    };

    AssertionRecorder();
    ~AssertionRecorder();
    AssertionRecorder(const AssertionRecorder&) = delete;
    AssertionRecorder& operator=(const AssertionRecorder&) = delete;

    const std::vector<Assertion>& Assertions() const;
};

}  // namespace zentest
