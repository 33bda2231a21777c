#include "outbound/frmExtraInfo.h"

#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/Window.h"
#include "platform/values.h"

#include <QAction>
#include <QApplication>
#include <QCloseEvent>
#include <QComboBox>
#include <QFormLayout>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRegularExpressionValidator>
#include <QSignalBlocker>
#include <QStyle>
#include <QToolButton>
#include <QTreeWidget>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr int digitsOfMonth = 2;
constexpr int digitsOfYear = 4;
constexpr int lastYearOfCentury = 29;  // years of two digits up to this belong to the 21st century

QLabel* addDisplay(QFormLayout* layout, const char* name, const QString& label, const QString& text)
{
    auto* display = new QLabel(text);
    display->setObjectName(QString::fromLatin1(name));
    display->setTextFormat(Qt::PlainText);
    layout->addRow(label, display);
    return display;
}

bool isBetween(const QString& text, double below, double above)
{
    const std::optional<double> number = numberIn(text);
    return number && *number > below && *number < above;
}

bool isEnter(int key)
{
    return key == Qt::Key_Return || key == Qt::Key_Enter;
}

/// Returns true for the keys that open a list below its field.
bool isDropKey(const QKeyEvent& key)
{
    return key.key() == Qt::Key_F4 || (key.key() == Qt::Key_Down && key.modifiers() & Qt::AltModifier);
}

}  // namespace

ExtraInfoResult frmExtraInfo::ShowForm(const QString& quoteNumber, const QString& subquote)
{
    ExtraInfo info({quoteNumber, subquote});
    if (!info.problem().isEmpty())
        return info.problem();
    frmExtraInfo form(info);
    desktop::showModal(form);
    const ExtraValues values = form.values();
    info.save(values);
    return values;
}

frmExtraInfo::frmExtraInfo(const ExtraInfo& info)
    : Form(u"frmExtraInfo"_s, u"Extra Information Requested"_s), cmbTransmission(new QComboBox)
{
    setWindowFlags(Qt::Dialog | Qt::CustomizeWindowHint | Qt::WindowTitleHint);  // without the close box
    auto* layout = new QFormLayout(this);
    addDisplay(layout, "lblQTNNO", u"Quote No:"_s, info.quoteNumber());
    addDisplay(layout, "lblCustomer", u"Customer:"_s, info.customer());
    addDisplay(layout, "lblRego", u"Rego:"_s, info.rego());
    addDisplay(layout, "lblModel", u"Model:"_s, info.model());
    build();
    fillColours();
    fill(info);
}

void frmExtraInfo::build()
{
    auto* layout = static_cast<QFormLayout*>(this->layout());
    cmbTransmission->setObjectName("cmbTransmission"_L1);
    cmbTransmission->addItems({u"Automatic"_s, u"Manual"_s});
    layout->addRow(u"&Transmission:"_s, cmbTransmission);
    txtVIN = addField("txtVIN", u"&VIN:"_s);
    txtOdometer = addField("txtOdometer", u"&Odometer:"_s);
    txtColour = addField("txtColour", u"&Colour:"_s);
    txtCylinders = addField("txtCylinders", u"C&ylinders:"_s);
    txtFuel = addField("txtFuel", u"&Fuel Level (%):"_s);
    txtFuel->setValidator(new QRegularExpressionValidator(QRegularExpression(u"[0-9]*"_s), txtFuel));
    txtBuildMonth = addField("txtBuildMonth", u"Build &Month"_s);
    txtBuildYear = addField("txtBuildYear", u"Build Yea&r"_s);
    txtDamageDesc = addField("txtDamageDesc", u"&Damage Description:"_s);
    txtOldDamageDesc = addField("txtOldDamageDesc", u"O&ld Damage Description:"_s);
    txtDamageDesc->setMinimumWidth(desktop::pixels(5400));
    Command1 = button(u"Command1"_s, u"Do&ne"_s, [this] { Command1_Click(); });
    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(Command1);
    layout->addRow(buttons);
    fixSize();

    lvColour = new QTreeWidget(this);
    lvColour->setObjectName("lvColour"_L1);
    lvColour->setAccessibleName(u"Colours"_s);
    lvColour->setHeaderLabel(u"Colour"_s);
    lvColour->setRootIsDecorated(false);
    desktop::showFocus(*lvColour);
    lvColour->hide();

    enterChain = {cmbTransmission, txtVIN,        txtOdometer,  txtColour,    txtCylinders,
                  txtFuel,         txtBuildMonth, txtBuildYear, txtDamageDesc};
    for (QWidget* control : enterChain)
        control->installEventFilter(this);
    Command1->installEventFilter(this);
    lvColour->installEventFilter(this);

    QAction* drop = txtColour->addAction(desktop::dropArrow(), QLineEdit::TrailingPosition);
    drop->setToolTip(u"Show the colours (F4, Alt+Down)"_s);
    drop->setShortcut(Qt::Key_F4);
    drop->setShortcutContext(Qt::WidgetShortcut);
    auto* cmdColour = txtColour->findChild<QToolButton*>();
    cmdColour->setObjectName("cmdColour"_L1);
    cmdColour->setAccessibleName(u"Show the colours"_s);
    on(drop, &QAction::triggered, u"txtColour_ButtonClick"_s, [this] { txtColour_ButtonClick(); });
    on(txtColour, &QLineEdit::textEdited, u"txtColour_Change"_s, [this] { txtColour_Change(); });
    on(lvColour, &QTreeWidget::currentItemChanged, u"lvColour_ItemClick"_s, [this] { lvColour_ItemClick(); });
    on(lvColour, &QTreeWidget::itemClicked, u"lvColour_ItemClick"_s, [this] { lvColour_ItemClick(); });
}

QLineEdit* frmExtraInfo::addField(const char* name, const QString& label)
{
    auto* field = new QLineEdit;
    field->setObjectName(QString::fromLatin1(name));
    static_cast<QFormLayout*>(layout())->addRow(label, field);
    return field;
}

void frmExtraInfo::fillColours()
{
    db::Recordset colours = opened(u"SELECT * FROM KESTCOLOURS"_s);
    const QSignalBlocker fillIsNoChoice(lvColour);
    for (; !colours.eof(); colours.moveNext()) {
        const double place = leadingNumber(colours.text(u"id"_s)) - 1;
        const int index = static_cast<int>(std::clamp<double>(place, 0, lvColour->topLevelItemCount()));
        lvColour->insertTopLevelItem(index, new QTreeWidgetItem({colours.text(u"script"_s).trimmed()}));
    }
}

void frmExtraInfo::fill(const ExtraInfo& info)
{
    const ExtraValues found = info.values();
    const int both = info.longestMonthAndYear() - 1;
    const std::pair<QLineEdit*, int> longest[] = {{txtVIN, info.longestVin()},
                                                  {txtOdometer, info.longestOdometer()},
                                                  {txtBuildMonth, both - digitsOfYear},
                                                  {txtBuildYear, both - digitsOfMonth}};
    for (const auto& [field, size] : longest)
        if (size > 0)
            field->setMaxLength(size);
    cmbTransmission->setCurrentText(found.transmission);
    txtBuildMonth->setText(found.buildMonth);
    txtBuildYear->setText(found.buildYear);
    txtVIN->setText(found.vin);
    txtOdometer->setText(found.odometer);
    txtCylinders->setText(found.cylinders);
    txtColour->setText(found.colour);
    acceptedColour = found.colour;
}

ExtraValues frmExtraInfo::values() const
{
    return {
        .transmission = cmbTransmission->currentText(),
        .vin = txtVIN->text(),
        .odometer = txtOdometer->text(),
        .cylinders = txtCylinders->text(),
        .fuel = txtFuel->text(),
        .damage = txtDamageDesc->text(),
        .oldDamage = txtOldDamageDesc->text(),
        .buildMonth = txtBuildMonth->text(),
        .buildYear = txtBuildYear->text(),
        .colour = txtColour->text(),
    };
}

void frmExtraInfo::closeEvent(QCloseEvent* event)
{
    event->ignore();  // only "Done" closes the window, so that the insurer never gets incomplete values
}

std::pair<QWidget*, QString> frmExtraInfo::complaint() const
{
    if (txtDamageDesc->text().isEmpty())
        return {txtDamageDesc, u"Damage Description must be entered."_s};
    if (txtBuildMonth->text().isEmpty())
        return {txtBuildMonth, u"Build Date must be entered."_s};
    if (!isBetween(txtBuildMonth->text(), 0, 13))
        return {txtBuildMonth, u"Invalid Build Month, Please try again."_s};
    if (txtBuildYear->text().isEmpty())
        return {txtBuildYear, u"Build Date must be entered."_s};
    if (!isBetween(txtBuildYear->text(), 1900, 2100))
        return {txtBuildYear, u"Invalid Build Year, Please try again."_s};
    if (txtVIN->text().isEmpty())
        return {txtVIN, u"VIN Number must be entered."_s};
    if (cmbTransmission->currentText().isEmpty())
        return {cmbTransmission, u"Transmission Type must be entered."_s};
    if (txtCylinders->text().isEmpty())
        return {txtCylinders, u"Number of Cylinders must be entered."_s};
    if (txtColour->text().isEmpty())
        return {txtColour, u"Colour must be entered."_s};
    EnsureConnection();  // it may have been lost while the window was open
    if (opened(sql("SELECT Script from KESTColours WHERE Script='{}'", txtColour->text())).eof())
        return {txtColour, u"You must select a valid KEST Colour"_s};
    return {};
}

void frmExtraInfo::Command1_Click()
{
    txtBuildYear_LostFocus();  // its access key leaves the focus in the field
    const auto [field, message] = complaint();
    if (!field) {
        hide();
        return;
    }
    desktop::msgBox(message);
    field->setFocus(Qt::TabFocusReason);
}

void frmExtraInfo::txtBuildYear_LostFocus()
{
    const QString year = txtBuildYear->text();
    if (year.size() == 2 && std::ranges::all_of(year, [](QChar c) { return c >= u'0' && c <= u'9'; }))
        txtBuildYear->setText((year.toInt() <= lastYearOfCentury ? u"20"_s : u"19"_s) + year);
}

bool frmExtraInfo::eventFilter(QObject* watched, QEvent* event)
{
    const bool keyDown = event->type() == QEvent::KeyPress;
    const int key = keyDown || event->type() == QEvent::KeyRelease ? static_cast<QKeyEvent*>(event)->key() : 0;
    const bool drops = keyDown && isDropKey(static_cast<const QKeyEvent&>(*event));

    if (event->type() == QEvent::FocusOut) {
        if (watched == txtBuildYear)
            txtBuildYear_LostFocus();
        if (watched == lvColour || watched == txtColour)
            hideColoursUnlessUsed();
    } else if (watched == txtColour) {
        if (drops || (keyDown && key == Qt::Key_Escape && lvColour->isVisible())) {
            txtColour_ButtonClick();
            return true;
        }
        if (keyDown && txtColour_KeyDown(key))
            return true;
        if (event->type() == QEvent::KeyRelease)
            txtColour_KeyUp(key);
    } else if (watched == lvColour) {
        if (drops || (keyDown && key == Qt::Key_Escape)) {
            txtColour->setFocus();
            lvColour->hide();
            return true;
        }
        if (keyDown && (isEnter(key) || key == Qt::Key_Tab)) {
            lvColour_ItemClick();
            return true;
        }
    } else if (keyDown && isEnter(key)) {
        const qsizetype place = enterChain.indexOf(static_cast<QWidget*>(watched));
        if (watched == Command1)
            Command1->click();
        else if (place + 1 < enterChain.size())
            enterChain[place + 1]->setFocus(Qt::TabFocusReason);
        return true;
    }
    return Form::eventFilter(watched, event);
}

QTreeWidgetItem* frmExtraInfo::colourBeginningWithText() const
{
    for (int i = 0; i < lvColour->topLevelItemCount(); ++i)
        if (lvColour->topLevelItem(i)->text(0).startsWith(txtColour->text(), Qt::CaseInsensitive))
            return lvColour->topLevelItem(i);
    return nullptr;
}

void frmExtraInfo::selectColour(QTreeWidgetItem* item)
{
    const QSignalBlocker showingIsNoChoice(lvColour);
    lvColour->setCurrentItem(item);
    if (item)
        lvColour->scrollToItem(item);
}

void frmExtraInfo::takeColour()
{
    if (const QTreeWidgetItem* item = lvColour->currentItem()) {
        txtColour->setText(item->text(0));
        acceptedColour = item->text(0);
    }
    lvColour->hide();
    txtDamageDesc->setFocus(Qt::TabFocusReason);
}

void frmExtraInfo::hideColoursUnlessUsed()
{
    const QWidget* focused = QApplication::focusWidget();
    if (focused != lvColour && focused != txtColour)
        lvColour->hide();
}

void frmExtraInfo::txtColour_ButtonClick()
{
    if (lvColour->isVisible()) {
        lvColour->hide();
        return;
    }
    const QPoint place = txtColour->mapTo(this, QPoint(0, txtColour->height()));
    lvColour->setGeometry(place.x(), place.y(), txtColour->width(), height() - place.y() - 1);
    lvColour->header()->resizeSection(0, lvColour->viewport()->width());
    lvColour->show();
    lvColour->raise();
    selectColour(colourBeginningWithText());
    lvColour->setFocus();
}

void frmExtraInfo::txtColour_Change()
{
    if (txtColour->text().isEmpty())
        return;
    QTreeWidgetItem* item = colourBeginningWithText();
    if (!item) {
        txtColour->setText(txtColour->text().size() < 2 ? QString() : acceptedColour);
        item = txtColour->text().isEmpty() ? nullptr : colourBeginningWithText();
        if (!item)
            return;
    }
    const auto typed = static_cast<int>(txtColour->text().size());
    const QString colour = item->text(0);
    txtColour->setText(colour);
    // select from the end, so that the cursor is where the user continues to type
    txtColour->setSelection(static_cast<int>(colour.size()), typed - static_cast<int>(colour.size()));
    acceptedColour = colour.left(typed);
    selectColour(item);
}

bool frmExtraInfo::txtColour_KeyDown(int key)
{
    if (isEnter(key)) {
        txtCylinders->setFocus(Qt::TabFocusReason);
        if (focusWidget() == txtColour)
            txtColour_KeyPress();
        return true;
    }
    if (key == Qt::Key_Tab && lvColour->isVisible()) {
        takeColour();
        return true;
    }
    if (key == Qt::Key_Backspace && txtColour->text().size() >= 2) {
        const int start = txtColour->hasSelectedText() ? txtColour->selectionStart() : txtColour->cursorPosition();
        acceptedColour = txtColour->text().left(std::max(start - 1, 0));
        txtColour->setText(acceptedColour);
        txtColour_Change();
        return true;
    }
    return false;
}

void frmExtraInfo::txtColour_KeyPress()
{
    lvColour->hide();
    txtDamageDesc->setFocus(Qt::TabFocusReason);
    QList<QTreeWidgetItem*> same = lvColour->findItems(txtColour->text(), Qt::MatchFixedString);
    txtColour->setText(same.size() == 1 ? same.first()->text(0) : txtColour->text().toUpper());
}

void frmExtraInfo::txtColour_KeyUp(int key)
{
    if (key == Qt::Key_Down && lvColour->isVisible())
        takeColour();
}

void frmExtraInfo::lvColour_ItemClick()
{
    if (lvColour->isVisible())
        takeColour();
}

}  // namespace kest
