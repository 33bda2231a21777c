// The number of the failure that a step ends in, where that number is all that matters.
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

}  // namespace kest::test
