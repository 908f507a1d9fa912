// SPDX-License-Identifier: MIT
#include "designerview.h"

#include "icons.h"
#include "qtplatform.h"

#include <QApplication>
#include <QKeyEvent>
#include <QMouseEvent>
#include <QPainter>
#include <QStyle>
#include <QStyleOption>

#include <array>
#include <cstdio>

namespace desktop {
namespace {

constexpr int kGrid = 8;  // 120 twips
constexpr int kHandle = 6;

/// The eight grab handles: the corners and the middles of the sides, top row first.
std::array<QPoint, 8> handleCenters(const QRect& r) {
  return {r.topLeft(),
          QPoint(r.center().x(), r.top()),
          r.topRight(),
          QPoint(r.left(), r.center().y()),
          QPoint(r.right(), r.center().y()),
          r.bottomLeft(),
          QPoint(r.center().x(), r.bottom()),
          r.bottomRight()};
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// Designer window

DesignerWindow::DesignerWindow(const std::shared_ptr<host::WindowImpl>& window, QWidget* parent)
    : QScrollArea(parent), m_window(window) {
  auto component = window->component();
  m_canvas = new FormCanvas(component->form(), this);
  m_canvas->setObjectName(QStringLiteral("formCanvas"));
  setWidget(m_canvas);
  setWidgetResizable(false);
  setBackgroundRole(QPalette::Dark);
  setAlignment(Qt::AlignLeft | Qt::AlignTop);
  setFocusProxy(m_canvas);
  connect(m_canvas, &FormCanvas::selectionChanged, this, &DesignerWindow::selectionChanged);
  connect(m_canvas, &FormCanvas::codeWanted, this, &DesignerWindow::codeWanted);
}

DesignerWindow::~DesignerWindow() = default;

std::shared_ptr<host::FormImpl> DesignerWindow::form() const {
  return m_canvas->form();
}

std::shared_ptr<host::ControlImpl> DesignerWindow::selectedControl() const {
  return m_canvas->selected();
}

void DesignerWindow::selectControl(const std::shared_ptr<host::ControlImpl>& control) {
  m_canvas->setSelected(control);
}

std::shared_ptr<host::ControlImpl> DesignerWindow::addControl(const QString& className) {
  auto container = m_canvas->selected();
  if (container && !m_canvas->geometry().isContainer(&container->liveNode())) container.reset();
  auto control = form()->addControl(className, container);
  // The form gives every new control the same place and size; the designer sizes it for its class, and
  // puts one added into a frame or picture box inside it.
  struct Size {
    const char* className;
    int width;
    int height;
  };
  static constexpr Size kSizes[] = {
      {"Frame", 2055, 1455},       {"PictureBox", 1215, 1215}, {"ListBox", 1215, 1035},
      {"ComboBox", 1215, 315},     {"Label", 1215, 255},       {"CheckBox", 1215, 255},
      {"OptionButton", 1215, 255}, {"HScrollBar", 1215, 255},  {"VScrollBar", 255, 1215},
      {"Image", 1215, 1215},       {"Shape", 1215, 735},       {"DriveListBox", 1215, 315},
      {"DirListBox", 1215, 1215},  {"FileListBox", 1215, 1065}};
  const QString bare = bareClass(control->liveNode().className());
  try {
    for (const Size& size : kSizes) {
      if (bare != QLatin1StringView(size.className)) continue;
      control->setProperty(QStringLiteral("Width"), size.width);
      control->setProperty(QStringLiteral("Height"), size.height);
    }
    if (container && control->hasProperty(QStringLiteral("Left"))) {
      control->setProperty(QStringLiteral("Left"), 120);
      // Below a frame's caption.
      control->setProperty(
          QStringLiteral("Top"),
          bareClass(container->liveNode().className()) == QLatin1StringView("Frame") ? 240 : 120);
    }
  } catch (const ide::Error& error) {
    // A size the form refuses leaves the control as the form made it.
    qCDebug(lcIde) << "the form kept the size it gave a new" << className << ":" << error.description();
  }
  m_canvas->setSelected(control);
  return control;
}

// ---------------------------------------------------------------------------------------------------
// Canvas

FormCanvas::FormCanvas(std::shared_ptr<host::FormImpl> form, QWidget* parent)
    : QWidget(parent), m_form(std::move(form)), m_geometry(m_form) {
  setFocusPolicy(Qt::StrongFocus);
  setAutoFillBackground(false);
  m_changed = m_form->controlChanged.connect([this](host::ControlImpl* control) {
    if (!control) m_pictures.clear();
    if (auto selected = m_selected.lock(); selected && !selected->node()) {
      m_selected.reset();
      Q_EMIT selectionChanged();
    }
    relayout();
    update();
  });
  relayout();
}

FormCanvas::~FormCanvas() = default;

QSize FormCanvas::sizeHint() const {
  return m_size;
}

void FormCanvas::relayout() {
  m_size = m_geometry.canvasSize();
  if (size() != m_size) resize(m_size);
}

QPoint FormCanvas::clientOrigin() {
  return m_geometry.clientOrigin();
}

QRect FormCanvas::rectOf(const std::shared_ptr<host::ControlImpl>& control) {
  return m_geometry.rectOf(control);
}

void FormCanvas::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.fillRect(rect(), QColor(0x80, 0x80, 0x80));
  FormPainter formPainter(painter, m_geometry, m_pictures);
  // The grid shows on a form's client area, where controls are placed.
  const QString rootClass = bareClass(m_form->description().root().className());
  formPainter.paintWindow(rootClass == QLatin1StringView("MDIForm") ? 0 : kGrid);
  formPainter.paintControls();

  // Selection: the outline being dragged, and the grab handles.
  auto selected = m_selected.lock();
  if (!selected) return;
  if (m_drag != Drag::None) {
    painter.setPen(QPen(Qt::black, 1, Qt::DashLine));
    painter.setBrush(Qt::NoBrush);
    painter.drawRect(m_dragRect.adjusted(0, 0, -1, -1));
  }
  painter.setPen(Qt::NoPen);
  painter.setBrush(QColor(0x00, 0x00, 0x80));
  for (const QPoint& center : handleCenters(rectOf(selected)))
    painter.drawRect(QRect(center - QPoint(kHandle / 2, kHandle / 2), QSize(kHandle, kHandle)));
}

std::shared_ptr<host::ControlImpl> FormCanvas::controlAt(const QPoint& point) {
  // Topmost first: windowed controls above lightweight ones, later ones above earlier, inner above outer.
  std::shared_ptr<host::ControlImpl> found;
  std::function<void(host::FormNode*, bool)> search = [&](host::FormNode* node, bool lightweight) {
    for (host::FormNode* child : node->children()) {
      if (isMenu(*child)) continue;
      const QString bare = bareClass(child->className());
      auto control = m_form->control(child);
      if (isLightweight(bare) == lightweight && rectOf(control).contains(point)) found = control;
      if (m_geometry.isContainer(child) && !lightweight && rectOf(control).contains(point)) {
        search(child, true);
        search(child, false);
      }
    }
  };
  search(&m_form->description().root(), true);
  search(&m_form->description().root(), false);
  return found;
}

int FormCanvas::handleAt(const QPoint& point) {
  auto selected = m_selected.lock();
  if (!selected) return -1;
  const auto centers = handleCenters(rectOf(selected));
  for (int i = 0; i < 8; ++i)
    if ((point - centers[i]).manhattanLength() <= kHandle) return i;
  return -1;
}

void FormCanvas::setSelected(const std::shared_ptr<host::ControlImpl>& control) {
  if (m_selected.lock() == control) return;
  m_selected = control;
  std::vector<std::shared_ptr<host::ControlImpl>> selection;
  if (control) selection.push_back(control);
  m_form->setSelection(selection);
  update();
  Q_EMIT selectionChanged();
}

void FormCanvas::mousePressEvent(QMouseEvent* event) {
  setFocus();
  if (event->button() != Qt::LeftButton) return;
  const QPoint point = event->position().toPoint();
  m_handle = handleAt(point);
  if (m_handle < 0) setSelected(controlAt(point));
  auto selected = m_selected.lock();
  if (!selected) return;
  m_pressPoint = point;
  m_startRect = rectOf(selected);
  m_dragRect = m_startRect;
  m_drag = m_handle >= 0 ? Drag::Resize : Drag::None;
  if (m_handle < 0 && bareClass(selected->liveNode().className()) != QLatin1StringView("Line"))
    m_drag = Drag::Move;
}

void FormCanvas::mouseMoveEvent(QMouseEvent* event) {
  if (m_drag == Drag::None) return;
  QPoint delta = event->position().toPoint() - m_pressPoint;
  delta = QPoint(delta.x() / kGrid * kGrid, delta.y() / kGrid * kGrid);
  QRect r = m_startRect;
  if (m_drag == Drag::Move) {
    r.translate(delta);
  } else {
    if (m_handle == 0 || m_handle == 3 || m_handle == 5)
      r.setLeft(std::min(r.left() + delta.x(), r.right() - 1));
    if (m_handle == 2 || m_handle == 4 || m_handle == 7)
      r.setRight(std::max(r.right() + delta.x(), r.left() + 1));
    if (m_handle <= 2) r.setTop(std::min(r.top() + delta.y(), r.bottom() - 1));
    if (m_handle >= 5) r.setBottom(std::max(r.bottom() + delta.y(), r.top() + 1));
  }
  m_dragRect = r;
  update();
}

void FormCanvas::mouseReleaseEvent(QMouseEvent*) {
  const Drag drag = std::exchange(m_drag, Drag::None);
  auto selected = m_selected.lock();
  if (drag == Drag::None || !selected || m_dragRect == m_startRect) {
    update();
    return;
  }
  const QPoint origin = m_geometry.containerOrigin(selected->liveNode().parent());
  try {
    selected->setProperty(QStringLiteral("Left"), twipsOf(m_dragRect.left() - origin.x()));
    selected->setProperty(QStringLiteral("Top"), twipsOf(m_dragRect.top() - origin.y()));
    if (drag == Drag::Resize) {
      selected->setProperty(QStringLiteral("Width"), twipsOf(m_dragRect.width()));
      selected->setProperty(QStringLiteral("Height"), twipsOf(m_dragRect.height()));
    }
  } catch (const ide::Error& error) {
    report(error);
  }
  update();
}

void FormCanvas::mouseDoubleClickEvent(QMouseEvent*) {
  Q_EMIT codeWanted();
}

void FormCanvas::keyPressEvent(QKeyEvent* event) {
  auto selected = m_selected.lock();
  if (event->key() == Qt::Key_Delete && selected) {
    try {
      m_form->removeControl(selected);
    } catch (const ide::Error& error) {
      report(error);
    }
    return;
  }
  if (event->key() == Qt::Key_Escape && selected) {
    // Escape selects the container, as in the IDE.
    host::FormNode* parent = selected->liveNode().parent();
    setSelected(parent && parent->parent() ? m_form->control(parent) : nullptr);
    return;
  }
  QWidget::keyPressEvent(event);
}

void FormCanvas::report(const ide::Error& error) {
  if (m_report)
    m_report(error.description());
  else
    std::fprintf(stderr, "%s\n", qPrintable(error.description()));
}

}  // namespace desktop
