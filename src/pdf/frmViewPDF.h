// Shows and prints a PDF document.
#pragma once

#include "platform/desktop/Form.h"

class QPdfDocument;
class QPdfView;

namespace kest::desktop {
class PageTools;
}

namespace kest {

/// A window with the pages of a PDF document, and buttons for pages, zoom, printing and saving a copy.
class frmViewPDF final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the document and returns when the user has closed it. `fileName` is a full path in the host's form. If the
    /// file does not exist, is not a PDF or is so damaged that reading it does not end, shows a box instead.
    static void ShowForm(const QString& fileName);

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    frmViewPDF(QPdfDocument& document, const QString& fileName);

    void goTo(int page);
    void zoom(double factor);
    void print();
    void save();

    QPdfDocument& pdf;
    QString path;  // in the host's form
    QPdfView* AcroPDF1;
    desktop::PageTools* tools;
};

}  // namespace kest
