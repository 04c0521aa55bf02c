#pragma once
// The observers of one model (a control, a window): not owned, each once, told in the order
// they were added. An observer told of a change may remove itself or another; one removed
// during the walk is not told.

#include <algorithm>
#include <vector>

template <class Observer>
class RWObserverList {
public:
    void add(Observer* observer) {
        if (observer && !contains(observer)) _observers.push_back(observer);
    }
    void remove(Observer* observer) { std::erase(_observers, observer); }
    bool contains(const Observer* observer) const {
        return std::find(_observers.begin(), _observers.end(), observer) != _observers.end();
    }
    template <class Call>
    void forEach(Call&& call) const {
        const std::vector<Observer*> snapshot = _observers;
        for (Observer* observer : snapshot)
            if (contains(observer)) call(*observer);
    }

private:
    std::vector<Observer*> _observers;
};
