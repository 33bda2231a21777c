// What every test begins with: GoogleTest, Qt, and the names of the program and of the tests' helpers. Only tests
// include this header, so it opens their namespaces.
#pragma once

#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "support/Cases.h"
#include "support/Places.h"
#include "support/TestProfile.h"

#include <QtCore>
#include <QtWidgets>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <optional>
#include <ostream>
#include <tuple>

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

// Failed expectations show texts by these.
inline std::ostream& operator<<(std::ostream& out, const QString& text)
{
    return out << text.toStdString();
}
inline void PrintTo(const QString& text, std::ostream* out)
{
    *out << '"' << text << '"';
}

using namespace Qt::StringLiterals;
using namespace kest;
using namespace kest::test;
