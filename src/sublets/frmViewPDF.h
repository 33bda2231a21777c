// Shows one PDF document: pages, zoom, print.
#pragma once

#include "platform/desktop/Form.h"

class QLabel;
class QPdfDocument;
class QPdfView;

namespace kest {

class frmViewPDF final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the document at a whole path in the host's form. A file that is gone or is no PDF gives a message instead.
    static void ShowForm(const QString& fileName);

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    frmViewPDF(QPdfDocument& document, const QString& caption);

    QWidget* tools();
    void goTo(int page);
    void zoom(double factor);
    void print();
    void showPage(int page);

    QPdfDocument& pdf;
    QPdfView* AcroPDF1;
    QWidget* toolStrip;
    QLabel* lblPage;
};

}  // namespace kest
