// Asks for the vehicle information that the insurer wants in addition to the quote.
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

/// The window "Extra Information Requested".
class frmExtraInfo final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the dialog, stores the values in the car and the quote, and returns them. If a record is missing, shows
    /// nothing and returns the message that says which.
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
    /// Returns the first wrong field and what is wrong with it, or no field if all values are valid.
    std::pair<QWidget*, QString> complaint() const;

    void Command1_Click();
    void txtBuildYear_LostFocus();
    void txtColour_ButtonClick();
    void txtColour_Change();
    bool txtColour_KeyDown(int key);
    void txtColour_KeyPress();
    void txtColour_KeyUp(int key);
    void lvColour_ItemClick();

    /// Returns the first colour that begins with the field's text, or null.
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
    QString acceptedColour;  // restored if the typed text matches no colour
};

}  // namespace kest
