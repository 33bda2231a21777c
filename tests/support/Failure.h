// Returns the error number of a step that fails.
#pragma once

#include "platform/RuntimeError.h"

namespace kest::test {

/// Returns 0 if the step does not fail.
template <class Step>
int failureOf(Step&& step)
{
    try {
        step();
        return 0;
    } catch (const RuntimeError& error) {
        return error.number();
    }
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
