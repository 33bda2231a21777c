// Shows PDF documents. The window is in a library of its own, because it needs many others.
#pragma once

#include <QString>

namespace kest {

/// Shows a PDF document and returns when the user has closed it. `fileName` is a full path in the host's form. If the
/// document can't be shown, shows a box that says why.
void showPdf(const QString& fileName);

}  // namespace kest
