// Lets a program with windows show that it waits.
#pragma once

#include <QString>

#include <functional>

namespace kest {

/// Sets a function that long operations call between their steps, such as statements and pictures. An empty function
/// turns this off.
void setWorkStep(std::function<void()> step);
/// Calls that function.
void workStep();

/// Waits until `isDone`, which takes some milliseconds, returns true. `what` says what the user is waiting for.
using Wait = std::function<void(const QString& what, const std::function<bool()>& isDone)>;
/// Sets what the calling thread, which must be that of the windows, does while a server does not answer. An empty
/// function turns this off.
void setWait(Wait wait);

/// Runs a step that a server can hold up for seconds: in another thread if a Wait is set. Throws what it throws. A
/// second step, which an event needs while the first one runs, waits for the first one.
/// Objects of Qt that remain must have been moved to the thread of the caller.
void patiently(const QString& what, const std::function<void()>& step);

}  // namespace kest
