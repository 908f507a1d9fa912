// SPDX-License-Identifier: MIT
// The code and designer windows of the model as MDI sub-windows. A window the model opens gets a view;
// one it closes loses it; activation, the minimised state and the captions follow both ways: the
// sub-window the user activates becomes the IDE's active window, and a window the object model shows
// comes to the front.
#pragma once

#include "host/model/vbe.h"
#include "ide/signal.h"

#include <QObject>
#include <QPointer>

#include <functional>
#include <map>
#include <memory>
#include <vector>

class QMdiArea;
class QMdiSubWindow;
class QWidget;

namespace desktop {

class CodeWindow;
class DesignerWindow;

/// The property naming the IDE window a widget belongs to (its hWnd), read when the focus moves.
inline constexpr const char* kWindowHandleProperty = "quimbelHwnd";

class WindowManager final : public QObject {
  Q_OBJECT

 public:
  WindowManager(std::shared_ptr<host::VbeImpl> vbe, QMdiArea* area);
  ~WindowManager() override;

  void setErrorReporter(std::function<void(const QString&)> reporter) { m_report = std::move(reporter); }
  QMdiSubWindow* subWindowOf(const host::WindowImpl* window) const;
  CodeWindow* codeWindowOf(const host::WindowImpl* window) const;
  DesignerWindow* designerOf(const host::WindowImpl* window) const;
  /// The view of the active sub-window, if it is of that kind.
  CodeWindow* activeCodeWindow() const;
  DesignerWindow* activeDesigner() const;
  std::vector<CodeWindow*> codeWindows() const;
  /// Refreshes the sub-windows' captions (after a rename).
  void refreshCaptions();
  /// While the program runs, its code cannot be typed into (the object model may still change it).
  void setCodeReadOnly(bool readOnly);

 Q_SIGNALS:
  void activeViewChanged();
  void caretMoved(int line, int column);
  void codeContextMenuWanted(CodeWindow* window, const QPoint& globalPosition);
  void designerSelectionChanged(DesignerWindow* designer);
  void codeOfDesignerWanted(DesignerWindow* designer);
  void statusMessage(const QString& message);

 protected:
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  struct Entry {
    std::shared_ptr<host::WindowImpl> window;
    QPointer<QMdiSubWindow> sub;
    ide::Connection changed;
  };

  void windowOpened(host::WindowImpl* window);
  void windowChanged(host::WindowImpl* window);
  void windowActivated(host::WindowImpl* window);
  void subWindowActivated(QMdiSubWindow* sub);
  void subWindowStateChanged(QMdiSubWindow* sub, Qt::WindowStates newState);
  Entry* entryOf(const QMdiSubWindow* sub);

  std::shared_ptr<host::VbeImpl> m_vbe;
  QMdiArea* m_area;
  std::map<const host::WindowImpl*, Entry> m_entries;
  std::function<void(const QString&)> m_report;
  bool m_syncing = false;
  bool m_codeReadOnly = false;
  ide::Connection m_opened;
  ide::Connection m_activated;
};

}  // namespace desktop
