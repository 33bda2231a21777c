// Returns the error of a step that fails.
#pragma once

#include "platform/RuntimeError.h"

namespace kest::test {

/// Returns the error that a step throws, with the number 0 if it does not throw.
template <class Step>
RuntimeError failure(Step&& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        return error;
    }
    return RuntimeError(0, QString());
}

/// Returns 0 if the step does not fail.
template <class Step>
int failureOf(Step&& step)
{
    return failure(step).number();
}

/// Returns the result of a step, or for example "error 13" if it fails.
template <class Step>
QString outcomeOf(Step&& step)
{
    QString result;
    const int failure = failureOf([&] { result = step(); });
    return failure ? QStringLiteral("error %1").arg(failure) : result;
}

}  // namespace kest::test
