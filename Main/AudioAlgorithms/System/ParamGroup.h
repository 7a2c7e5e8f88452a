// Base of the algorithm library's settings objects: a group of related
// settings that owners hand whole to an engine. Observers (engines) are told
// when a group changed; they re-read it on their own thread.
#pragma once

#include <algorithm>
#include <vector>

namespace ora {

class ParamGroup;

class ParamObserver {
public:
    virtual ~ParamObserver() = default;
    virtual void OnParamChanged(const ParamGroup& group) = 0;
};

class ParamGroup {
public:
    ParamGroup() = default;
    virtual ~ParamGroup() = default;
    // Observers belong to the object they observe from, not to the copy.
    ParamGroup(const ParamGroup&) {}
    ParamGroup& operator=(const ParamGroup&) { return *this; }

    void Attach(ParamObserver* observer) {
        if (std::find(m_observers.begin(), m_observers.end(), observer) == m_observers.end())
            m_observers.push_back(observer);
    }
    void Detach(ParamObserver* observer) {
        m_observers.erase(std::remove(m_observers.begin(), m_observers.end(), observer), m_observers.end());
    }
    void NotifyChanged() const {
        for (ParamObserver* o : m_observers) o->OnParamChanged(*this);
    }

private:
    std::vector<ParamObserver*> m_observers;
};

}  // namespace ora
