// Edits a quote's network fields, for a service person whose quote no longer agrees with the insurer's records.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"
#include "platform/desktop/Form.h"
#include "utilities/frmHistory.h"

class QCheckBox;
class QLineEdit;
class QPushButton;
class QTabBar;

namespace kest {

class ExactTextEdit;
struct StatusRepair;

/// The window "Utilities": the fields, the flags, the remarks and the status buttons of a quote.
class frmUtilities final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the quote; an empty subquote means "0". Only "Save" writes to the tables, and it opens `grsQuote` again.
    /// `undoLoad` is for the button "Undo" of the history.
    static void ShowForm(const QString& sQTNNO, const QString& sSubQuote, const frmHistory::Undo& undoLoad = {});

protected:
    void chooseColours() override;

private:
    frmUtilities(const QuoteKey& key, frmHistory::Undo undo);
    QWidget* quoteInformation();
    QWidget* setQuoteStatus();
    QWidget* closingButtons();
    QPushButton* button(const QString& name, const QString& caption, void (frmUtilities::*click)());
    QLineEdit* box(QLatin1StringView name) const;

    void addTabs();
    void openRows();
    void closeRows();
    void fill();
    void writeField(QLatin1StringView name, const QString& column);
    void writeQuote();
    void writeRemarks();

    void TabStrip1_Click();
    void Command1_Click();  // Save
    void Command2_Click();  // Close
    void Command9_Click();  // Undo
    void cmdHistory_Click();
    void setStatus(const StatusRepair& repair);

    frmHistory::Undo undoLoad;
    QuoteKey shown;  // not read from `quote`, because another user may delete the row
    int shownTab = 0;

    db::Recordset quote;    // of QUOTE1
    db::Recordset lines;    // of QUOTE2; opened and closed with the others
    db::Recordset remarks;  // of QUOTE3, which may have no row for the quote

    QTabBar* TabStrip1;
    QCheckBox* chkReadOnly;
    QCheckBox* chkExtraInfo;
    ExactTextEdit* txtRemarks;
};

}  // namespace kest
