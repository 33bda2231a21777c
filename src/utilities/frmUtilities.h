// A quote's network fields, to be put right by hand when the quote and the insurer have fallen out of step.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"
#include "platform/desktop/Form.h"

class QCheckBox;
class QLineEdit;
class QPushButton;
class QTabBar;

namespace kest {

class ExactTextEdit;
struct StatusRepair;

class frmUtilities final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the quote; an empty subquote is "0". Only "Save" writes, and it opens `grsQuote` anew.
    static void ShowForm(const QString& sQTNNO, const QString& sSubQuote);

private:
    explicit frmUtilities(const QuoteKey& key);
    QWidget* quoteInformation();
    QWidget* setQuoteStatus();
    QWidget* closingButtons();
    QPushButton* button(const QString& name, const QString& caption, void (frmUtilities::*click)());
    QLineEdit* box(QLatin1StringView name) const;

    void AddTabs();
    void OpenRows();
    void CloseRows();
    void Fill();
    void WriteField(QLatin1StringView name, const QString& column);
    void WriteQuote();
    void WriteRemarks();

    void TabStrip1_Click();
    void Command1_Click();  // Save
    void Command2_Click();  // Close
    void Command9_Click();  // Undo
    void SetStatus(const StatusRepair& repair);

    QuoteKey shown;  // the row itself may go
    int shownTab = 0;

    db::Recordset quote;    // of QUOTE1
    db::Recordset lines;    // of QUOTE2: opened and closed with the others
    db::Recordset remarks;  // of QUOTE3, where the quote may have no row

    QTabBar* TabStrip1;
    QCheckBox* chkReadOnly;
    QCheckBox* chkExtraInfo;
    ExactTextEdit* txtRemarks;
};

}  // namespace kest
