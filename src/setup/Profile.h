// Makes a workstation's profile, and tells where everything of it lies.
#pragma once

#include <QDate>
#include <QJsonObject>

#include <functional>

namespace kest::app {

/// Makes the profile: folders, quote database, settings and, through `registerClass` (true if it succeeded), the class registration, with `demo` a shop with quotes,
/// messages and photographs too. What a host that started before has left is kept, and what is missing is made. On a
/// profile that was made here nothing changes but that the indexes of its databases are
/// rebuilt, which another tool may have left in another order. True when the profile was made.
bool initProfile(const std::function<bool()>& registerClass, bool demo, const QDate& today = QDate::currentDate());

/// The absolute paths of this system: `profile`, `database`, `unread`, `read`, `unsent`, `sent`, `images`, `pdf`,
/// `reports`, `log`, `component`. Reads the settings without copying any.
QJsonObject where();

}  // namespace kest::app
