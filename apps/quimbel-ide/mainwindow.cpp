// SPDX-License-Identifier: MIT
#include "mainwindow.h"

#include "codecolours.h"
#include "codewindow.h"
#include "commandbarview.h"
#include "designerview.h"
#include "host/model/events.h"
#include "icons.h"
#include "idecommands.h"
#include "projectexplorer.h"
#include "propertiesview.h"
#include "qtplatform.h"
#include "toolbox.h"
#include "vbfonts.h"
#include "windowmanager.h"

#include <QApplication>
#include <QCloseEvent>
#include <QDockWidget>
#include <QLabel>
#include <QMdiArea>
#include <QMenu>
#include <QPlainTextEdit>
#include <QScreen>
#include <QSettings>
#include <QStatusBar>
#include <QTimer>

namespace desktop {

MainWindow::MainWindow(std::shared_ptr<host::VbeImpl> vbe, QtUserInterface& ui, MainWindowOptions options)
    : m_vbe(std::move(vbe)), m_ui(ui) {
  setObjectName(QStringLiteral("mainWindow"));
  setWindowIcon(icon(Glyph::Project));
  // The window's own bars and their buttons in the IDE's classic face whatever the desktop's theme: flat
  // buttons that rise under the mouse and sink when pressed or on. Dialogs over the window keep their look.
  setStyleSheet(QStringLiteral(
      "QMainWindow > QMenuBar, QMainWindow > QToolBar, QMainWindow > QStatusBar, #projectWindowBar"
      " { background: #d4d0c8; }"
      "QMainWindow > QToolBar, #projectWindowBar { border: none; spacing: 0px; padding: 1px; }"
      "QMainWindow > QToolBar::separator { background: #808080; width: 1px; margin: 3px 3px; }"
      "QMainWindow > QToolBar QToolButton, #projectWindowBar QToolButton, #codeViewButtons QToolButton"
      " { background: transparent; border: 1px solid transparent; padding: 2px; }"
      "QMainWindow > QToolBar QToolButton:hover, #projectWindowBar QToolButton:hover,"
      " #codeViewButtons QToolButton:hover { border-color: #ffffff #808080 #808080 #ffffff; }"
      "QMainWindow > QToolBar QToolButton:pressed, QMainWindow > QToolBar QToolButton:checked,"
      " #projectWindowBar QToolButton:pressed, #projectWindowBar QToolButton:checked,"
      " #codeViewButtons QToolButton:pressed, #codeViewButtons QToolButton:checked"
      " { border-color: #808080 #ffffff #ffffff #808080; }"));
  if (!options.settingsPath.isEmpty())
    m_settings = std::make_unique<QSettings>(options.settingsPath, QSettings::IniFormat);
  // The code colours the user chose; without settings (a script's session) the IDE's own.
  if (m_settings)
    CodeColours::instance().load(*m_settings);
  else
    CodeColours::instance().resetToDefaults();
  m_ui.setDialogParent(this);

  m_mdi = new QMdiArea(this);
  m_mdi->setObjectName(QStringLiteral("mdiArea"));
  m_mdi->setBackground(QColor(0x80, 0x80, 0x80));
  m_mdi->setHorizontalScrollBarPolicy(Qt::ScrollBarAsNeeded);
  m_mdi->setVerticalScrollBarPolicy(Qt::ScrollBarAsNeeded);
  setCentralWidget(m_mdi);
  m_mdi->setProperty(kWindowHandleProperty, QVariant::fromValue<quintptr>(m_vbe->MainWindow()->hWnd()));

  m_bars = new CommandBarView(m_vbe->commandBars(), this);
  m_bars->setErrorReporter([this](const QString& message) { reportError(message); });
  m_windows = new WindowManager(m_vbe, m_mdi);
  m_windows->setErrorReporter([this](const QString& message) { reportError(message); });
  m_commands = new IdeCommands(*this);
  buildDocks();

  m_position = new QLabel(this);
  m_position->setObjectName(QStringLiteral("caretPosition"));
  m_position->setMinimumWidth(130);
  m_mode = new QLabel(this);
  m_mode->setObjectName(QStringLiteral("ideMode"));
  m_mode->setMinimumWidth(70);
  statusBar()->addPermanentWidget(m_position);
  statusBar()->addPermanentWidget(m_mode);

  m_vbe->setCommandHandler(
      [this](int command) { m_commands->run(static_cast<host::BuiltinCommand>(command)); });
  connect(m_windows, &WindowManager::caretMoved, this, [this](int line, int column) {
    m_position->setText(QStringLiteral("Ln %1, Col %2").arg(line).arg(column));
  });
  connect(m_windows, &WindowManager::activeViewChanged, this, [this] {
    if (!m_windows->activeCodeWindow()) m_position->clear();
    updateProperties();
  });
  connect(m_windows, &WindowManager::statusMessage, this,
          [this](const QString& message) { showStatus(message, 8000); });
  connect(m_windows, &WindowManager::codeContextMenuWanted, this,
          [this](CodeWindow*, const QPoint& position) { showCodeMenu(position); });
  connect(m_windows, &WindowManager::designerSelectionChanged, this, [this] { updateProperties(); });
  connect(m_windows, &WindowManager::codeOfDesignerWanted, this, [this](DesignerWindow* designer) {
    if (auto component = designer->window()->component()) m_commands->show(component, true);
  });
  connect(m_explorer, &ProjectExplorer::openWanted, this,
          [this](const std::shared_ptr<host::ComponentImpl>& component, bool code) {
            m_commands->show(component, code);
          });
  connect(m_explorer, &ProjectExplorer::contextMenuWanted, this, &MainWindow::showProjectMenu);
  connect(m_toolbox, &Toolbox::controlWanted, this, &MainWindow::addControl);
  connect(m_properties, &PropertiesView::objectChosen, this,
          [this](const std::shared_ptr<host::ControlImpl>& control) {
            DesignerWindow* designer = m_windows->activeDesigner();
            if (!designer) return;
            const bool root =
                control == std::static_pointer_cast<host::ControlImpl>(designer->form()->Root());
            designer->selectControl(root ? nullptr : control);
          });
  connect(qApp, &QApplication::focusChanged, this, [this](QWidget* old, QWidget* now) {
    focusChanged(now);
    if (old && !now) activateUnder(old->window());
  });

  auto& events = m_vbe->events();
  auto titleLater = [this](auto&&...) { QTimer::singleShot(0, this, [this] { updateTitle(); }); };
  m_connections.push_back(events.projects->ItemAdded.connect(titleLater));
  m_connections.push_back(events.projects->ItemActivated.connect(titleLater));
  m_connections.push_back(events.projects->ItemRenamed.connect(titleLater));
  m_connections.push_back(events.projects->ItemRemoved.connect(titleLater));
  m_connections.push_back(
      events.projects->ItemRenamed.connect([this](auto&&...) { m_windows->refreshCaptions(); }));
  m_connections.push_back(events.components->ItemRenamed.connect([this](auto&&...) {
    m_windows->refreshCaptions();
    updateProperties();
  }));
  m_connections.push_back(events.components->ItemSelected.connect([this](auto&&...) { updateProperties(); }));
  m_connections.push_back(m_vbe->mainWindow()->changed.connect([this](host::WindowImpl*) {
    updateTitle();
    m_windows->setCodeReadOnly(m_vbe->mode() == ide::IdeMode::Run);
  }));

  resize(options.size);
  if (QScreen* screen = options.fitToScreen ? QGuiApplication::primaryScreen() : nullptr) {
    const QRect available = screen->availableGeometry();
    if (available.width() > 200 && available.height() > 200)
      resize(size().boundedTo(available.size() * 0.95));
  }
  updateTitle();
  updateProperties();
}

MainWindow::~MainWindow() {
  if (!m_shutDown) {
    m_shutDown = true;
    m_vbe->shutdown();
  }
  m_vbe->setCommandHandler({});
  m_ui.setDialogParent(nullptr);
}

void MainWindow::buildDocks() {
  setDockOptions(QMainWindow::AnimatedDocks | QMainWindow::AllowNestedDocks);
  m_explorer = new ProjectExplorer(m_vbe, this);
  m_explorer->setProperty(kWindowHandleProperty,
                          QVariant::fromValue<quintptr>(m_vbe->projectWindow()->hWnd()));
  m_explorerDock = new QDockWidget(m_explorer->title(), this);
  m_explorerDock->setObjectName(QStringLiteral("projectDock"));
  m_explorerDock->setWidget(new ProjectWindow(m_explorer, this));
  addDockWidget(Qt::RightDockWidgetArea, m_explorerDock);

  m_properties = new PropertiesView(this);
  m_properties->setProperty(kWindowHandleProperty,
                            QVariant::fromValue<quintptr>(m_vbe->propertiesWindow()->hWnd()));
  m_properties->setErrorReporter([this](const QString& message) { reportError(message); });
  m_propertiesDock = new QDockWidget(QStringLiteral("Properties"), this);
  m_propertiesDock->setObjectName(QStringLiteral("propertiesDock"));
  m_propertiesDock->setWidget(m_properties);
  addDockWidget(Qt::RightDockWidgetArea, m_propertiesDock);
  splitDockWidget(m_explorerDock, m_propertiesDock, Qt::Vertical);

  m_toolbox = new Toolbox(this);
  m_toolbox->setMinimumWidth(84);
  m_toolboxDock = new QDockWidget(QStringLiteral("General"), this);
  // Room for its title: the toolbox is narrow and its floating button is of little use.
  m_toolboxDock->setFeatures(QDockWidget::DockWidgetClosable | QDockWidget::DockWidgetMovable);
  m_toolboxDock->setObjectName(QStringLiteral("toolboxDock"));
  m_toolboxDock->setWidget(m_toolbox);
  addDockWidget(Qt::LeftDockWidgetArea, m_toolboxDock);
  resizeDocks({m_explorerDock, m_toolboxDock}, {300, 64}, Qt::Horizontal);

  // The Immediate window: a place to type and to read what the program printed; Ctrl+G shows it.
  m_immediate = new QPlainTextEdit(this);
  m_immediate->setObjectName(QStringLiteral("immediateWindow"));
  m_immediate->setFont(codeFont());
  m_immediate->setLineWrapMode(QPlainTextEdit::NoWrap);
  m_immediateDock = new QDockWidget(QStringLiteral("Immediate"), this);
  m_immediateDock->setObjectName(QStringLiteral("immediateDock"));
  m_immediateDock->setWidget(m_immediate);
  addDockWidget(Qt::BottomDockWidgetArea, m_immediateDock);
  resizeDocks({m_immediateDock}, {110}, Qt::Vertical);
  auto* showImmediate = new QAction(this);
  showImmediate->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_G));
  addAction(showImmediate);
  connect(showImmediate, &QAction::triggered, this, [this] {
    m_immediateDock->show();
    m_immediate->setFocus();
  });
}

void MainWindow::updateTitle() {
  setWindowTitle(m_vbe->MainWindow()->Caption());
  m_explorerDock->setWindowTitle(m_explorer->title());
  m_mode->setText(QStringLiteral("[%1]").arg(host::modeName(m_vbe->mode())));
}

void MainWindow::updateProperties() {
  if (DesignerWindow* designer = m_windows->activeDesigner()) {
    auto control = designer->selectedControl();
    m_properties->showControl(
        control ? control : std::static_pointer_cast<host::ControlImpl>(designer->form()->Root()));
    return;
  }
  auto component = std::dynamic_pointer_cast<host::ComponentImpl>(m_vbe->SelectedVBComponent());
  if (!component)
    if (CodeWindow* code = m_windows->activeCodeWindow()) component = code->window()->component();
  if (component && component->attached())
    m_properties->showComponent(component);
  else
    m_properties->clear();
}

void MainWindow::focusChanged(QWidget* now) {
  ide::HWnd hwnd = 0;
  if (now && now->window() == this) {
    hwnd = m_vbe->mainWindow()->hWnd();
    for (QWidget* widget = now; widget; widget = widget->parentWidget()) {
      const QVariant handle = widget->property(kWindowHandleProperty);
      if (handle.isValid()) {
        hwnd = handle.value<quintptr>();
        break;
      }
    }
  }
  // Focus in a dialog or another application is in no IDE window.
  m_vbe->windowSystem().setFocus(hwnd);
}

void MainWindow::activateUnder(QWidget* closed) {
  // Without a window manager (Xvfb, the offscreen platform) nobody gives the activation back to the window
  // under a dialog that closed, and keys would reach no window: do what a window manager does.
  QPointer<QWidget> under = closed->parentWidget() ? closed->parentWidget()->window() : nullptr;
  if (!under) return;
  QTimer::singleShot(0, this, [under, dialog = QPointer<QWidget>(closed)] {
    // Still open: the application was left, not the dialog.
    if (dialog && dialog->isVisible()) return;
    if (under && under->isVisible() && !QApplication::activeWindow()) under->activateWindow();
  });
}

QString MainWindow::codeWindowMenuName() const {
  return m_vbe->mode() == ide::IdeMode::Break ? QStringLiteral("Code Window (Break)")
                                              : QStringLiteral("Code Window");
}

void MainWindow::showCodeMenu(const QPoint& position) {
  auto bar = m_vbe->commandBars()->bar(codeWindowMenuName());
  if (!bar) return;
  QMenu menu(this);
  m_bars->fillMenu(&menu, bar);
  menu.exec(position);
}

void MainWindow::showProjectMenu(const QPoint& position) {
  auto bar = m_vbe->commandBars()->bar(QStringLiteral("Project Window"));
  if (!bar) return;
  QMenu menu(this);
  m_bars->fillMenu(&menu, bar);
  menu.exec(position);
}

void MainWindow::addControl(const QString& className) {
  DesignerWindow* designer = m_windows->activeDesigner();
  if (!designer) {
    showStatus(QStringLiteral("Open a form designer to add a %1.").arg(className), 5000);
    return;
  }
  try {
    designer->addControl(className);
    designer->setFocus();
  } catch (const ide::Error& error) {
    reportError(error.description());
  }
}

void MainWindow::showStatus(const QString& message, int timeoutMs) {
  statusBar()->showMessage(message, timeoutMs);
}

void MainWindow::reportError(const QString& message) {
  m_ui.MsgBox(message, ide::mb::OKOnly | ide::mb::Exclamation, QStringLiteral("Quimbel IDE"));
}

void MainWindow::closeWithoutPrompt() {
  m_promptOnClose = false;
  close();
}

void MainWindow::restoreLayout() {
  if (!m_settings) return;
  restoreGeometry(m_settings->value(QStringLiteral("MainWindow/geometry")).toByteArray());
  restoreState(m_settings->value(QStringLiteral("MainWindow/state")).toByteArray());
}

void MainWindow::closeEvent(QCloseEvent* event) {
  if (m_promptOnClose && !m_commands->confirmClose(m_vbe->projects())) {
    event->ignore();
    return;
  }
  if (m_settings) {
    m_settings->setValue(QStringLiteral("MainWindow/geometry"), saveGeometry());
    m_settings->setValue(QStringLiteral("MainWindow/state"), saveState());
  }
  if (!m_shutDown) {
    m_shutDown = true;
    m_vbe->shutdown();
  }
  event->accept();
}

}  // namespace desktop
