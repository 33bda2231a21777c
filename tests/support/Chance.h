// Makes up the inputs of tests that state what holds for all of them.
#pragma once

#include <QList>
#include <QRandomGenerator>

namespace kest::test {

/// A row of choices. The same seed makes the same choices, so that a failure can be repeated.
class Chance {
public:
    explicit Chance(quint32 seed) : random(seed) {}

    /// Returns a number from `least` to `most`.
    int number(int least, int most) { return random.bounded(least, most + 1); }
    bool once(int in) { return random.bounded(in) == 0; }
    template <class Value = QString>
    Value one(const QList<Value>& of)
    {
        return of[random.bounded(of.size())];
    }

private:
    QRandomGenerator random;
};

}  // namespace kest::test
