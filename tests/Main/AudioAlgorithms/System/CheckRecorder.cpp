#include "CheckRecorder.h"

namespace zentest {

namespace {
std::vector<std::string>& Recorded() {
    static std::vector<std::string> checks;
    return checks;
}
void Record(const char* condition, const char*, int) { Recorded().emplace_back(condition); }
}  // namespace

CheckRecorder::CheckRecorder() : m_previous(ora::system::SetCheckHandler(&Record)) { Recorded().clear(); }
CheckRecorder::~CheckRecorder() { ora::system::SetCheckHandler(m_previous); }
const std::vector<std::string>& CheckRecorder::Checks() const { return Recorded(); }

}  // namespace zentest
