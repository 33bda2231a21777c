// Creates the profile of a workstation, and lists its files and folders.
#pragma once

#include <QDate>
#include <QJsonObject>

#include <functional>

namespace kest::app {

/// What a new profile contains. The demo shop has quotes, messages and photographs.
enum class Shop { New, Demo };

/// Creates the profile: folders, quote database, settings and the class registration. `registerClass` registers the
/// class and returns false if it fails.
///
/// Keeps what a host has stored before and adds what is missing. If the profile is complete, only rebuilds the indexes
/// of its databases, because another tool may have left them in another order. Returns true if the profile was created.
/// Throws RuntimeError if a file can't be written.
bool initProfile(const std::function<bool()>& registerClass, Shop shop, const QDate& today = QDate::currentDate());

/// Makes `folder`, an absolute path of this system, the place of the profile, before initProfile(): if it is another
/// folder than profile::root(), that becomes a link to it. Throws RuntimeError if `folder` is no absolute path, if it
/// has other files in it but no profile, or if the link can't be made.
void placeProfile(const QString& folder);

/// Returns absolute paths of this system: `profile`, `database`, `unread`, `read`, `unsent`, `sent`, `images`, `pdf`,
/// `reports`, `log`, `component`. Reads the settings without copying them to the machine-wide place.
QJsonObject where();

}  // namespace kest::app
