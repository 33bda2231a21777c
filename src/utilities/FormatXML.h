// Formats the text of a message file with one element on each line. Uses no widgets.
#pragma once

#include <QString>

namespace kest {

/// Returns the indented text of a message file. `fileName` is a path in the host's form.
///
/// Repairs two faults: wraps several top-level elements in "request", and escapes bare ampersands. If the file can't be
/// read or parsed even then, shows a critical box and returns an empty text. Otherwise the text is never empty.
QString FormatXML(const QString& fileName);

/// Returns the text as the viewer saves it, with the characters themselves in place of `&gt;`, `&lt;` and `&amp;`. The
/// result may be ill-formed for other readers; FormatXML can read it.
QString withMarkupCharacters(const QString& text);

/// Removes the wrapper that FormatXML adds around several top-level elements. Returns any other text unchanged.
QString withoutRequestWrapper(const QString& text);

}  // namespace kest
