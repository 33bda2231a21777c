// The dialog that asks for the vehicle information which the insurer wants beyond the quote.
#pragma once

#include "outbound/ExtraInfo.h"
#include "platform/desktop/Form.h"

#include <QString>

#include <utility>

class QComboBox;
class QLineEdit;
class QPushButton;
class QTreeWidget;
class QTreeWidgetItem;

namespace kest {

class frmExtraInfo final : public desktop::Form {
    Q_OBJECT

public:
    /// Asks, and stores the answers with the car and the quote. Where a record is missing nothing is shown.
    static ExtraInfoResult ShowForm(const QString& quoteNumber, const QString& subquote);

protected:
    void closeEvent(QCloseEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    explicit frmExtraInfo(const ExtraInfo& info);

    void build();
    QLineEdit* addField(const char* name, const QString& label);
    void fillColours();
    void fill(const ExtraInfo& info);
    ExtraValues values() const;
    /// The first check that fails: the field to go to, and what is wrong. No field where all is well.
    std::pair<QWidget*, QString> complaint() const;

    void Command1_Click();
    void txtBuildYear_LostFocus();
    void txtColour_ButtonClick();
    void txtColour_Change();
    bool txtColour_KeyDown(int key);
    void txtColour_KeyPress();
    void txtColour_KeyUp(int key);
    void lvColour_ItemClick();

    /// The first colour that begins with the field's text, or null.
    QTreeWidgetItem* colourBeginningWithText() const;
    void selectColour(QTreeWidgetItem* item);
    void takeColour();
    void hideColoursUnlessUsed();

    QComboBox* cmbTransmission;
    QLineEdit* txtVIN;
    QLineEdit* txtOdometer;
    QLineEdit* txtColour;
    QLineEdit* txtCylinders;
    QLineEdit* txtFuel;
    QLineEdit* txtBuildMonth;
    QLineEdit* txtBuildYear;
    QLineEdit* txtDamageDesc;
    QLineEdit* txtOldDamageDesc;
    QTreeWidget* lvColour;
    QPushButton* Command1;
    QList<QWidget*> enterChain;
    QString acceptedColour;  // what the type-ahead goes back to
};

}  // namespace kest
