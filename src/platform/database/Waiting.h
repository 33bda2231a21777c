// Lets a program with windows show that it waits for a database.
#pragma once

#include <QString>

#include <functional>

namespace kest::db {

/// Sets a function that is called before each statement. An empty function turns this off.
void setStatementStep(std::function<void()> step);
/// Calls that function.
void statementStep();

/// Waits until `isDone`, which takes some milliseconds, returns true. `what` says what the user is waiting for.
using Wait = std::function<void(const QString& what, const std::function<bool()>& isDone)>;
/// Sets what to do while a server does not answer. An empty function turns this off.
void setWait(Wait wait);

/// Runs a step that a silent server can hold up for seconds: in another thread if a Wait is set. Throws what it throws.
/// Objects of Qt that remain must have been moved to the thread of the caller.
void patiently(const QString& what, const std::function<void()>& step);

}  // namespace kest::db
