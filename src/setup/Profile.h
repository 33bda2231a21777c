// Creates the profile of a workstation, and lists its files and folders.
#pragma once

#include <QDate>
#include <QJsonObject>

#include <functional>

namespace kest::app {

/// What a new profile contains. The demo shop has quotes, messages and photographs.
enum class Shop { New, Demo };

/// Returns true if initProfile() has finished before. A host that starts without a profile also writes settings, but
/// only initProfile() writes the version of the system. Throws RuntimeError if the settings can't be read.
bool isWholeProfile();

/// Creates the profile: folders, quote database, settings and the class registration. `registerClass` registers the
/// class and returns false if it fails.
///
/// Keeps what a host has stored before and adds what is missing. If the profile is complete, only rebuilds the indexes
/// of its databases, because another tool may have left them in another order. Returns true if the profile was created.
/// Throws RuntimeError if a file can't be written.
bool initProfile(const std::function<bool()>& registerClass, Shop shop, const QDate& today = QDate::currentDate());

/// Stores the name of the shop, the author of its reports, unless it has one or the name is empty.
void nameShop(const QString& name);

/// Makes `folder`, an absolute path of this system, the place of the profile, before initProfile(): if it is another
/// folder than profile::root(), that becomes a link to it. What an initProfile() that failed has left in `folder` is
/// used, and what it has left in profile::root() is moved to a name with ".unfinished". Throws RuntimeError if `folder`
/// is no absolute path, if it has other files in it but no profile, or if the link can't be made.
void placeProfile(const QString& folder);

/// Returns absolute paths of this system: `profile`, `database`, `unread`, `read`, `unsent`, `sent`, `images`, `pdf`,
/// `reports`, `log`, `component`. Reads the settings without copying them to the machine-wide place.
QJsonObject where();

}  // namespace kest::app
