// What every test begins with: GoogleTest, Qt, and the names of the program and of the tests' helpers. Only tests
// include this header, so it opens their namespaces.
#pragma once

#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "support/Cases.h"
#include "support/Failure.h"
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
