// The text of a message file, rebuilt from its parsed document with one element to a line; no widgets.
#pragma once

#include <QString>

namespace kest {

/// The indented text of a message file, whose path is in the host's form.
///
/// Repairs two faults on the way: several top-level elements are wrapped in "request", bare ampersands are escaped.
/// A file that cannot be read, or not be parsed after that, shows a critical box and gives the empty text; the text of
/// a message that was read is never empty.
QString FormatXML(const QString& fileName);

/// What the viewer writes for the text that it shows: the characters themselves in place of the three markup
/// references. It may be ill-formed for other readers; FormatXML reads it back.
QString withMarkupCharacters(const QString& text);

/// The text without the wrapper that FormatXML put around several top-level elements; any other text as it is.
QString withoutRequestWrapper(const QString& text);

}  // namespace kest
