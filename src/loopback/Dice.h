// Choices that look free and are the same for the same seed.
#pragma once

#include <QRandomGenerator>

namespace kest::app {

class Dice {
public:
    /// `turn` keeps the choices of one message apart from those of the next.
    Dice(quint32 seed, quint32 turn)
    {
        const quint32 words[] = {seed, turn};
        generator = QRandomGenerator(words);
    }

    /// From 0 to below `count`.
    int below(qsizetype count) { return int(generator.bounded(quint32(count))); }
    template <class List>
    const auto& of(const List& list)
    {
        return list[size_t(below(qsizetype(std::size(list))))];
    }

private:
    QRandomGenerator generator;
};

}  // namespace kest::app
