// The failure that a step ends in, where its number is all that matters.
#pragma once

#include "platform/RuntimeError.h"

namespace kest::test {

/// 0 where there is none.
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

/// What a step gives; "error 13" where it ends in that failure.
template <class Step>
QString outcomeOf(Step&& step)
{
    QString result;
    const int failure = failureOf([&] { result = step(); });
    return failure ? QStringLiteral("error %1").arg(failure) : result;
}

}  // namespace kest::test
