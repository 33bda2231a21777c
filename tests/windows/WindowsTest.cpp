// Tests what a person can expect of every window: a key for everything, readable texts at any size, and names for
// screen readers.
#include "base/modLoggerEx.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/ShopDatabase.h"
#include "utilities/frmLogin.h"
#include "windows/EveryWindow.h"

namespace gestures = desktop::gestures;

// --- Keys ---

/// Returns all controls that Tab reaches, starting with the control that has the focus when the window opens.
static QSet<const QWidget*> tabRound(QDialog& window)
{
    QSet<const QWidget*> met;
    for (int presses = 0; presses < 50; ++presses) {
        QWidget* here = QApplication::focusWidget();
        if (!here || met.contains(here))
            break;
        met.insert(here);
        const auto* text = qobject_cast<const QPlainTextEdit*>(here);
        const auto with = text && !text->tabChangesFocus() ? Qt::ControlModifier : Qt::NoModifier;
        gestures::press(window, with | Qt::Key_Tab);
    }
    return met;
}

TEST_F(EveryWindow, HasAKeyForEveryControl)
{
    each([](QDialog& window) {
        const QSet<const QWidget*> met = tabRound(window);
        for (const QWidget* control : controlsOf(window)) {
            const auto isFellow = [&](const QWidget* other) {  // the arrow keys reach the other options of its group
                return isA<QRadioButton>(*control) && isA<QRadioButton>(*other) && other->parent() == control->parent();
            };
            EXPECT_TRUE(met.contains(control) || met.contains(control->focusProxy()) ||
                        std::ranges::any_of(met, isFellow))
                << nameOf(*control);
        }
        for (const QLineEdit* field : window.findChildren<QLineEdit*>())
            for (const QAction* button : field->actions())
                EXPECT_TRUE(!button->shortcut().isEmpty() || field->isClearButtonEnabled()) << nameOf(*field);
    });
}

TEST_F(EveryWindow, HasEachAccessKeyOnce)
{
    each([](QDialog& window) {
        QStringList keys;
        for (const QAbstractButton* button : visible<QAbstractButton>(window))
            keys += button->shortcut().toString();
        for (const QLabel* label : visible<QLabel>(window))
            keys += label->buddy() ? QKeySequence::mnemonic(label->text()).toString() : QString();
        keys.removeAll(QString());
        EXPECT_EQ(QStringList(keys).removeDuplicates(), 0) << keys.join(u' ');
        const QStringList keyless{u"OK"_s, u"Cancel"_s};  // Enter and Escape
        for (const QWidget* control : controlsOf(window)) {
            const auto* button = qobject_cast<const QAbstractButton*>(control);
            if (button && !isA<QMessageBox>(window) && !isA<QToolButton>(*button)) {
                EXPECT_NE(keyless.contains(button->text()), !button->shortcut().isEmpty()) << nameOf(*button);
            }
        }
    });
}

TEST_F(EveryWindow, IsLeftByEscapeAsByItsCloseBox)
{
    const QString defaults = u"frmKEST.cmdOK frmSubletAuth.Command1 frmLogin.cmdOK frmProfile.cmdOK frmHeld.cmdView"_s;
    each([&](QDialog& window) {
        QStringList takers;
        for (const QPushButton* button : window.findChildren<QPushButton*>())
            if (button->isDefault())
                takers += window.objectName() + u'.' + button->objectName();
        if (window.objectName().startsWith("frm"_L1)) {
            EXPECT_EQ(takers, defaults.split(u' ').filter(window.objectName() + u'.'));
        }
        gestures::press(window, Qt::Key_Escape);
        EXPECT_EQ(window.isVisible(), window.objectName() == "frmExtraInfo"_L1) << "only half the values can't be left";
        window.hide();
    });
}

TEST_F(EveryWindow, PressesTheButtonThatHasTheFocusByEnter)
{
    each([](QDialog& window) {
        const QList<QAbstractButton*> buttons = window.findChildren<QAbstractButton*>();
        QStringList pressed;
        for (QAbstractButton* button : buttons) {
            button->disconnect(SIGNAL(clicked(bool)));
            QObject::connect(button, &QAbstractButton::clicked, button, [&, button] { pressed += button->text(); });
        }
        const auto* everywhere = window.objectName() == "frmKEST"_L1 ? &control<QPushButton>(window, "cmdOK") : nullptr;
        for (QWidget* control : controlsOf(window)) {
            const auto* button = qobject_cast<const QAbstractButton*>(control);
            if (!button || button->isCheckable())
                continue;
            pressed.clear();
            control->setFocus();
            gestures::press(window, Qt::Key_Return);
            EXPECT_EQ(pressed, QStringList((everywhere ? everywhere : button)->text())) << nameOf(*button);
        }
        for (QAbstractButton* button : buttons)
            button->disconnect(SIGNAL(clicked(bool)));
    });
}

TEST_F(EveryWindow, TellsAboutItselfByF1)
{
    logFailure(RuntimeError(FileNotFound, u"the last straw"_s), u"a test"_s);
    each([&](QDialog& window) {
        if (!window.objectName().startsWith("frm"_L1) && window.objectName() != "KESTWeb"_L1)
            return;
        gestures::press(window, Qt::Key_F1);
        const QString about = desktop->boxes().last();
        for (const QString& part : {u"KEST2 " KEST_VERSION ""_s, profile::root(), u"WirSql (embedded)"_s, u"straw"_s})
            EXPECT_TRUE(about.contains(part)) << about.toStdString();
        if (window.objectName() == "frmKEST"_L1) {
            EXPECT_EQ(window.contextMenuPolicy(), Qt::ActionsContextMenu);
            window.actions().value(0)->trigger();
            EXPECT_EQ(desktop->boxes(), QStringList({about, about})) << "in its menu";
        }
    });
}

TEST_F(EveryWindow, HasTextsThatCanBeCopied)
{
    const auto copied = [](QDialog& window) {
        QGuiApplication::clipboard()->clear();
        gestures::press(window, Qt::CTRL | Qt::Key_C);
        return QGuiApplication::clipboard()->text();
    };
    each([&](QDialog& window) {
        for (QTreeView* list : visible<QTreeView>(window)) {
            EXPECT_TRUE(list->header()->stretchLastSection());
            const QVariant tip = list->model()->headerData(1, Qt::Horizontal, Qt::ToolTipRole);
            EXPECT_EQ(tip.toString(), u"Sort by this column (Ctrl+2)"_s);
            list->setFocus();
            if (const QString row = copied(window); list->currentIndex().isValid()) {
                EXPECT_EQ(row.count(u'\t'), list->header()->count() - 1) << row;
            }
            for (int column = 0; list->model()->rowCount() > 0 && column < list->header()->count(); ++column) {
                const QModelIndex cell = list->model()->index(0, column);
                EXPECT_TRUE(cell.data(Qt::ToolTipRole).toString().contains(cell.data().toString()))
                    << "a long text can be read whole";
            }
        }
        if (const auto* box = qobject_cast<const QMessageBox*>(&window)) {
            EXPECT_TRUE(box->textFormat() == Qt::PlainText && box->icon() == QMessageBox::Critical);
            EXPECT_TRUE(copied(window).startsWith(u"KEST\n"_s));
            window.findChild<QLabel*>(u"qt_msgbox_label"_s)->setSelection(0, 7);
            EXPECT_EQ(copied(window), u"Are you"_s);
        } else if (auto* field = window.findChild<QLineEdit*>(); qobject_cast<QInputDialog*>(&window)) {
            EXPECT_TRUE(copied(window).startsWith(u"View KEST Messages\n"_s));
            field->setText(u"1007"_s);
            field->selectAll();
            EXPECT_EQ(copied(window), u"1007"_s);
        }
        if (window.objectName().startsWith("frm"_L1) || !window.findChildren<QTreeView*>().isEmpty())
            return;
        for (const QLabel* label : window.findChildren<QLabel*>())
            EXPECT_TRUE(label->text().isEmpty() || label->textInteractionFlags() & Qt::TextSelectableByMouse);
    });
}

// --- Sizes ---

TEST_F(EveryWindow, HasAnIcon)
{
    each([](QDialog& window) { EXPECT_FALSE(window.windowIcon().pixmap(16).isNull()); });
}

TEST_F(EveryWindow, IsStretchedOnlyIfItProfits)
{
    const QStringList fixed{u"frmKEST"_s, u"frmLogin"_s, u"frmExtraInfo"_s, u"frmProfile"_s};
    each([&](QDialog& window) {
        EXPECT_TRUE(!fixed.contains(window.objectName()) || window.minimumSize() == window.maximumSize());
    });
}

/// Returns true for widgets whose whole text must be visible: captions and items. Values can be scrolled, so only their
/// height and their placeholder matter.
static bool hasText(const QWidget& widget)
{
    const bool hasCaption = isA<QAbstractButton, QLabel>(widget) && !widget.property("text").toString().isEmpty();
    return hasCaption || isA<QComboBox, QGroupBox>(widget);
}

static void expectToFit(const QWidget& widget)
{
    QSize needed = widget.minimumSizeHint();
    if (isA<QPushButton>(widget))  // its style requests more space than the caption needs
        needed = widget.fontMetrics().size(Qt::TextShowMnemonic, widget.property("text").toString());
    if (hasText(widget) || isA<QLineEdit>(widget)) {
        EXPECT_GE(widget.height(), needed.height()) << nameOf(widget);
        EXPECT_GE(widget.width(), needed.width()) << nameOf(widget);
    }
    if (const auto* label = qobject_cast<const QLabel*>(&widget); label && label->wordWrap()) {
        EXPECT_GE(label->height(), label->heightForWidth(label->width())) << nameOf(widget);
    }
    if (const auto* field = qobject_cast<const QLineEdit*>(&widget)) {
        const int hint = field->fontMetrics().horizontalAdvance(field->placeholderText());
        EXPECT_GE(field->contentsRect().width(), hint) << nameOf(widget);
    }
    if (const auto* bar = qobject_cast<const QTabBar*>(&widget); bar && bar->count() > 0) {
        EXPECT_TRUE(bar->rect().contains(bar->tabRect(bar->count() - 1))) << nameOf(widget);
        EXPECT_GE(bar->tabRect(0).width(), bar->fontMetrics().horizontalAdvance(bar->tabText(0)));
    }
    if (const auto* list = qobject_cast<const QTreeView*>(&widget)) {
        const QHeaderView& header = *list->header();
        const int last = header.count() - 1;  // takes the space that is left
        for (int column = 0; column < last; ++column)
            EXPECT_GE(header.sectionSize(column), header.sectionSizeHint(column)) << column;
        const QString caption = list->model()->headerData(last, Qt::Horizontal).toString();
        EXPECT_GE(header.sectionSize(last), header.fontMetrics().horizontalAdvance(caption));
    }
}

TEST_F(EveryWindow, ShowsItsTextsWholeAtAnySizeOfTheFont)
{
    const QFont usual = QApplication::font();
    for (const double factor : {1.0, 1.5, 2.0}) {
        QFont font = usual;
        font.setPointSizeF(usual.pointSizeF() * factor);
        QApplication::setFont(font);
        SCOPED_TRACE(factor);
        each([](QDialog& window) {
            gestures::settle();
            QList<const QWidget*> whole;
            for (const QWidget* widget : visible<QWidget>(window)) {
                expectToFit(*widget);
                if (hasText(*widget))
                    whole.append(widget);
            }
            for (const QWidget* widget : whole) {
                const QRect place(widget->mapTo(&window, QPoint()), widget->size());
                EXPECT_TRUE(window.rect().contains(place)) << nameOf(*widget) << " lies outside of its window";
                for (const QWidget* other : whole)
                    EXPECT_TRUE(widget == other || widget->isAncestorOf(other) || other->isAncestorOf(widget) ||
                                !place.intersects({other->mapTo(&window, QPoint()), other->size()}))
                        << nameOf(*widget) << " lies over " << nameOf(*other);
            }
        });
    }
    QApplication::setFont(usual);
}

// --- Names ---

TEST_F(EveryWindow, NamesEveryControlForAScreenReader)
{
    each([](QDialog& window) {
        QList<QWidget*> all = controlsOf(window);
        for (QGroupBox* frame : visible<QGroupBox>(window))
            all.append(frame);
        QStringList names;
        for (QWidget* control : std::as_const(all)) {
            QAccessibleInterface* heard = QAccessible::queryAccessibleInterface(control);
            ASSERT_TRUE(heard) << nameOf(*control);
            const QString name = heard->text(QAccessible::Name).trimmed();
            EXPECT_FALSE(name.isEmpty() || names.contains(name)) << nameOf(*control) << " is called " << name;
            names.append(name);
            EXPECT_TRUE(heard->role() != QAccessible::Client || isA<QAbstractScrollArea>(*control)) << nameOf(*control);
        }
        EXPECT_FALSE(window.windowTitle().isEmpty());
        for (QTreeView* list : visible<QTreeView>(window)) {
            QAccessibleTableInterface* table = QAccessible::queryAccessibleInterface(list)->tableInterface();
            ASSERT_TRUE(table) << nameOf(*list);
            for (int row = 0; row < list->model()->rowCount(); ++row) {
                QAccessibleInterface* cell = table->cellAt(row, 1);
                EXPECT_EQ(cell->tableCellInterface()->rowIndex(), row);
                EXPECT_EQ(cell->tableCellInterface()->columnIndex(), 1);
                EXPECT_EQ(cell->text(QAccessible::Name), list->model()->index(row, 1).data().toString());
            }
        }
    });
}

// --- Connection ---

TEST_F(EveryWindow, GoesOnAfterTheServerHasDroppedTheConnection)
{
    const Snapshot before;
    bool isThere = true;
    for (int number = 0; isThere; ++number) {
        isThere = false;
        each([&](QDialog& window) {
            QList<QWidget*> all = controlsOf(window);
            all.removeIf([](const QWidget* one) { return !isA<QAbstractButton, QTabBar>(*one); });
            if (number >= all.size())
                return;
            isThere = true;
            const auto values = u"txtDamageDesc=dent txtBuildMonth=3 txtBuildYear=2004 txtVIN=V1 txtCylinders=6"_s;
            for (const auto& [field, text] : pairsIn(window.objectName() == "frmExtraInfo"_L1 ? values : QString()))
                window.findChild<QLineEdit*>(field)->setText(text);
            const std::string name = nameOf(*all[number]);
            dropConnection();
            if (auto* tabs = qobject_cast<QTabBar*>(all[number]))
                tabs->setCurrentIndex(1);
            else
                static_cast<QAbstractButton*>(all[number])->click();
            EXPECT_EQ(shown().find("Line No"), std::string::npos) << name << shown();
            if (const auto* line = window.findChild<QLabel*>(u"lblStatus"_s)) {
                EXPECT_FALSE(line->text().contains("could not"_L1)) << name << line->text();
            }
            EnsureConnection();  // for the next window
        });
        before.restore();
    }
}

TEST_F(EveryWindow, GoesOnIfTheConnectionIsLostWhileAnotherIsOpen)
{
    const auto logIn = [](QDialog& window) {
        control<QLineEdit>(window, "txtPassword").setText(QString::number(dayPassword(QDate::currentDate())));
        control<QPushButton>(window, "cmdOK").click();
    };
    const auto openUtilities = [](QDialog& window) {
        control<QRadioButton>(window, "Option1(3)").click();
        control<QPushButton>(window, "cmdOK").click();
    };
    const auto lose = [](QDialog&) { dropConnection(); };
    const Hands hands({{u"frmLogin"_s, logIn}, {u"frmKEST"_s, openUtilities}, {u"frmUtilities"_s, lose}});
    eKEST().ShowKESTWindow(u"500"_s, u"0"_s);
    EXPECT_EQ(shown(), "");
}
