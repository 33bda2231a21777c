// Random choices that are the same for the same seed.
#pragma once

#include <QRandomGenerator>

namespace kest::app {

/// A random generator for the content of one message.
class Dice {
public:
    /// `turn` gives each message other choices than the one before.
    Dice(quint32 seed, quint32 turn)
    {
        const quint32 words[] = {seed, turn};
        generator = QRandomGenerator(words);
    }

    /// Returns a number from 0 to `count` - 1.
    int below(qsizetype count) { return int(generator.bounded(quint32(count))); }
    /// Returns one of the elements.
    template <class List>
    const auto& of(const List& list)
    {
        return list[size_t(below(qsizetype(std::size(list))))];
    }

private:
    QRandomGenerator generator;
};

}  // namespace kest::app
