// The exception for a step of a script that can't be carried out.
#pragma once

#include <QString>

#include <utility>

namespace kest::desktop {

/// Says why a step can't be carried out. Script adds the window and the step and ends the run.
struct Refusal {
    explicit Refusal(QString reason) : why(std::move(reason)) {}
    QString why;
};

}  // namespace kest::desktop
