// The host's settings: the machine-wide section of the registry, with the per-user area behind it.
#pragma once

#include "platform/settings/registry.h"

#include <QString>

namespace kest {

enum class CopyUp { Yes, No };

/// The machine-wide value, else the per-user one, else the default. What came from behind is copied up to the
/// machine-wide place unless told not to, so that from then on the default given in code no longer matters.
QString GetRegSetting(const QString& app, const QString& section, const QString& key, const QString& fallback,
                      CopyUp copyUp = CopyUp::Yes);

/// One value as text; empty when anything fails, cut to a buffer of 1024 bytes.
QString RegGetValue(settings::Hive hive, const QString& subKey, const QString& valueName);
/// Writes to an existing key, keeping the value's type; false when that fails.
bool RegSetValue(settings::Hive hive, const QString& subKey, const QString& valueName, const QString& value);
void RegCreateSubKey(settings::Hive hive, const QString& subKey);
void RegRemoveKey(settings::Hive hive, const QString& subKey);

}  // namespace kest
