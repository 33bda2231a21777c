// Reads the host's settings: the machine-wide section of the registry first, then the per-user area.
#pragma once

#include "platform/settings/registry.h"

#include <QString>

namespace kest {

enum class CopyUp { Yes, No };

/// Returns the machine-wide value, or else the per-user value, or else `fallback`.
///
/// With CopyUp::Yes a value that is not machine-wide is copied to the machine-wide place, even the fallback, so later
/// calls no longer use their fallback.
QString GetRegSetting(const QString& app, const QString& section, const QString& key, const QString& fallback,
                      CopyUp copyUp = CopyUp::Yes);

/// Returns a value as text, at most 1023 characters of it, or an empty text if anything fails.
QString RegGetValue(settings::Hive hive, const QString& subKey, const QString& valueName);
/// Writes a value to an existing key and keeps the type of the value. Returns false if that fails.
bool RegSetValue(settings::Hive hive, const QString& subKey, const QString& valueName, const QString& value);
/// Creates a key. Ignores errors.
void RegCreateSubKey(settings::Hive hive, const QString& subKey);
/// Deletes a key. Ignores errors.
void RegRemoveKey(settings::Hive hive, const QString& subKey);

}  // namespace kest
