// Why a step of a script could not be carried out.
#pragma once

#include <QString>

#include <utility>

namespace kest::desktop {

/// Thrown by what carries a step out; the script adds window and step and ends the run.
struct Refusal {
    explicit Refusal(QString reason) : why(std::move(reason)) {}
    QString why;
};

}  // namespace kest::desktop
