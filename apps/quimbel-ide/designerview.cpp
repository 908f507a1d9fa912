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

constexpr int kMargin = 10;
constexpr int kBorder = 4;
constexpr int kTitleHeight = 22;
constexpr int kMenuHeight = 20;
constexpr int kGrid = 8;  // 120 twips
constexpr int kHandle = 6;

QString bareClass(const QString& className) {
  const qsizetype dot = className.indexOf(u'.');
  return dot < 0 ? className : className.sliced(dot + 1);
}

/// A property of a control, or `fallback` when the control has none or it cannot be read.
QVariant valueOf(host::ControlImpl& control, const QString& name, const QVariant& fallback = {}) {
  try {
    if (!control.hasProperty(name)) return fallback;
    const QVariant value = control.property(name);
    return value.isValid() ? value : fallback;
  } catch (const ide::Error&) {
    return fallback;
  }
}

double numberOf(host::ControlImpl& control, const QString& name, double fallback) {
  bool ok = false;
  const double value = valueOf(control, name).toDouble(&ok);
  return ok ? value : fallback;
}

QString textOf(host::ControlImpl& control, const QString& name) {
  return valueOf(control, name).toString();
}

QColor colorOf(host::ControlImpl& control, const QString& name, QColor fallback) {
  const QVariant value = valueOf(control, name);
  if (!value.isValid()) return fallback;
  bool ok = false;
  const qint32 number = value.toInt(&ok);
  return ok ? vbColor(number) : fallback;
}

bool isLightweight(const QString& bare) {
  return bare == QLatin1StringView("Label") || bare == QLatin1StringView("Image") ||
         bare == QLatin1StringView("Shape") || bare == QLatin1StringView("Line");
}

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

bool isContainer(const QString& bare) {
  return bare == QLatin1StringView("Frame") || bare == QLatin1StringView("PictureBox");
}

}  // namespace

QColor vbColor(qint32 value) {
  const quint32 bits = static_cast<quint32>(value);
  if (bits & 0x80000000u) {
    switch (bits & 0xFF) {
      case 0x00:
        return QColor(0xc8, 0xc8, 0xc8);  // scroll bars
      case 0x01:
        return QColor(0x3a, 0x6e, 0xa5);  // desktop
      case 0x02:
        return QColor(0x0a, 0x24, 0x6a);  // active title
      case 0x05:
      case 0x14:
        return Qt::white;  // window, button highlight
      case 0x09:
      case 0x0E:
        return Qt::white;  // title text, highlighted text
      case 0x0C:
        return QColor(0x80, 0x80, 0x80);  // application workspace
      case 0x0D:
        return QColor(0x31, 0x6a, 0xc5);  // highlight
      case 0x10:
        return QColor(0xa0, 0xa0, 0xa0);  // button shadow
      case 0x11:
        return QColor(0x80, 0x80, 0x80);  // grey text
      case 0x18:
        return QColor(0xff, 0xff, 0xe1);  // tooltip background
      case 0x04:
      case 0x0F:
      case 0x16:
        return QColor(0xec, 0xe9, 0xd8);  // menu, button face, light
      default:
        return Qt::black;  // window text, button text, menu text, frames ...
    }
  }
  return QColor(static_cast<int>(bits & 0xFF), static_cast<int>((bits >> 8) & 0xFF),
                static_cast<int>((bits >> 16) & 0xFF));
}

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
  if (container && !isContainer(bareClass(container->liveNode().className()))) container.reset();
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
    : QWidget(parent), m_form(std::move(form)) {
  setFocusPolicy(Qt::StrongFocus);
  setAutoFillBackground(false);
  QFont designFont(QStringLiteral("DejaVu Sans"));
  designFont.setPixelSize(11);
  setFont(designFont);
  m_changed = m_form->controlChanged.connect([this](host::ControlImpl*) {
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
  auto root = std::static_pointer_cast<host::ControlImpl>(m_form->Root());
  const double clientWidth = numberOf(*root, QStringLiteral("ClientWidth"), 4680);
  const double clientHeight = numberOf(*root, QStringLiteral("ClientHeight"), 3090);
  const QPoint origin = clientOrigin();
  m_size = QSize(origin.x() + pixelsOf(clientWidth) + kBorder + kMargin,
                 origin.y() + pixelsOf(clientHeight) + kBorder + kMargin);
  if (size() != m_size) resize(m_size);
}

QPoint FormCanvas::clientOrigin() {
  bool hasMenu = false;
  for (host::FormNode* child : m_form->description().root().children())
    if (bareClass(child->className()) == QLatin1StringView("Menu")) hasMenu = true;
  return QPoint(kMargin + kBorder, kMargin + kBorder + kTitleHeight + (hasMenu ? kMenuHeight : 0));
}

QPoint FormCanvas::containerOrigin(host::FormNode* container) {
  if (!container || !container->parent()) return clientOrigin();
  auto control = m_form->control(container);
  const QRect rect = rectOf(control);
  // Inside a picture box the coordinates start within its border; a frame's start at its corner.
  const int inset = bareClass(container->className()) == QLatin1StringView("PictureBox") ? 2 : 0;
  return rect.topLeft() + QPoint(inset, inset);
}

QRect FormCanvas::rectOf(const std::shared_ptr<host::ControlImpl>& control) {
  if (!control || !control->node()) return {};
  host::FormNode* node = control->node();
  const QString bare = bareClass(node->className());
  if (bare == QLatin1StringView("Menu") || !node->parent()) return {};
  const QPoint origin = containerOrigin(node->parent());
  if (bare == QLatin1StringView("Line")) {
    const QPoint a(pixelsOf(numberOf(*control, QStringLiteral("X1"), 0)),
                   pixelsOf(numberOf(*control, QStringLiteral("Y1"), 0)));
    const QPoint b(pixelsOf(numberOf(*control, QStringLiteral("X2"), 0)),
                   pixelsOf(numberOf(*control, QStringLiteral("Y2"), 0)));
    return QRect(a, b).normalized().adjusted(-2, -2, 2, 2).translated(origin);
  }
  const int left = pixelsOf(numberOf(*control, QStringLiteral("Left"), 0));
  const int top = pixelsOf(numberOf(*control, QStringLiteral("Top"), 0));
  // A timer is drawn as its icon, whatever size its description gives it.
  if (bare == QLatin1StringView("Timer")) return QRect(origin + QPoint(left, top), QSize(28, 28));
  const int width = std::max(1, pixelsOf(numberOf(*control, QStringLiteral("Width"), 1215)));
  const int height = std::max(1, pixelsOf(numberOf(*control, QStringLiteral("Height"), 375)));
  return QRect(origin + QPoint(left, top), QSize(width, height));
}

void FormCanvas::paintEvent(QPaintEvent*) {
  QPainter painter(this);
  painter.fillRect(rect(), QColor(0x80, 0x80, 0x80));
  auto root = std::static_pointer_cast<host::ControlImpl>(m_form->Root());
  const QPoint origin = clientOrigin();
  const QRect client(origin, QSize(m_size.width() - origin.x() - kBorder - kMargin,
                                   m_size.height() - origin.y() - kBorder - kMargin));
  const QRect frame(kMargin, kMargin, client.right() + kBorder - kMargin + 1,
                    client.bottom() + kBorder - kMargin + 1);

  // Window frame and title bar.
  const QColor face = vbColor(static_cast<qint32>(0x8000000F));
  painter.fillRect(frame, face);
  painter.setPen(QColor(0x40, 0x40, 0x40));
  painter.drawRect(frame.adjusted(0, 0, -1, -1));
  const QRect title(frame.left() + kBorder, frame.top() + kBorder, frame.width() - 2 * kBorder,
                    kTitleHeight - 2);
  QLinearGradient gradient(title.topLeft(), title.topRight());
  gradient.setColorAt(0, QColor(0x0a, 0x24, 0x6a));
  gradient.setColorAt(1, QColor(0xa6, 0xca, 0xf0));
  painter.fillRect(title, gradient);
  icon(Glyph::Form).paint(&painter, QRect(title.left() + 3, title.top() + 2, 16, 16));
  QFont titleFont = font();
  titleFont.setBold(true);
  painter.setFont(titleFont);
  painter.setPen(Qt::white);
  painter.drawText(title.adjusted(22, 0, -60, 0), Qt::AlignVCenter | Qt::AlignLeft,
                   textOf(*root, QStringLiteral("Caption")));
  // Minimise, maximise and close boxes.
  for (int i = 0; i < 3; ++i) {
    const QRect box(title.right() - 18 * (3 - i) + 1, title.top() + 2, 16, 14);
    painter.fillRect(box, face);
    painter.setPen(QColor(0x40, 0x40, 0x40));
    painter.drawRect(box.adjusted(0, 0, -1, -1));
    const QPoint c = box.center();
    if (i == 0) painter.drawLine(c.x() - 3, c.y() + 3, c.x() + 3, c.y() + 3);
    if (i == 1) painter.drawRect(QRect(c.x() - 4, c.y() - 3, 8, 7));
    if (i == 2) {
      painter.drawLine(c.x() - 3, c.y() - 3, c.x() + 3, c.y() + 3);
      painter.drawLine(c.x() + 3, c.y() - 3, c.x() - 3, c.y() + 3);
    }
  }
  painter.setFont(font());

  // Menu strip.
  int menuX = client.left() + 6;
  for (host::FormNode* child : m_form->description().root().children()) {
    if (bareClass(child->className()) != QLatin1StringView("Menu")) continue;
    auto menu = m_form->control(child);
    QString caption = textOf(*menu, QStringLiteral("Caption"));
    caption.remove(u'&');
    painter.setPen(Qt::black);
    const int width = painter.fontMetrics().horizontalAdvance(caption) + 14;
    painter.drawText(QRect(menuX, client.top() - kMenuHeight, width, kMenuHeight), Qt::AlignCenter, caption);
    menuX += width;
  }

  // Client area with its grid.
  painter.fillRect(client, colorOf(*root, QStringLiteral("BackColor"), face));
  painter.setPen(QColor(0x50, 0x50, 0x50));
  for (int y = client.top(); y < client.bottom(); y += kGrid)
    for (int x = client.left(); x < client.right(); x += kGrid)
      painter.drawPoint(x, y);

  // Controls: lightweight ones below windowed ones, as the form draws them; containers before what they hold.
  std::function<void(host::FormNode*, bool)> paintChildren = [&](host::FormNode* node, bool lightweight) {
    for (host::FormNode* child : node->children()) {
      const QString bare = bareClass(child->className());
      if (bare == QLatin1StringView("Menu")) continue;
      if (isLightweight(bare) == lightweight) {
        auto control = m_form->control(child);
        const QRect r = rectOf(control);
        painter.save();
        painter.setClipRect(node->parent() ? rectOf(m_form->control(node)) : client);
        paintControl(painter, control, r);
        painter.restore();
      }
      if (isContainer(bare) && !lightweight) {
        paintChildren(child, true);
        paintChildren(child, false);
      }
    }
  };
  paintChildren(&m_form->description().root(), true);
  paintChildren(&m_form->description().root(), false);

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

void FormCanvas::paintControl(QPainter& painter, const std::shared_ptr<host::ControlImpl>& control,
                              const QRect& r) {
  host::ControlImpl& c = *control;
  const QString bare = bareClass(c.liveNode().className());
  const QColor face = vbColor(static_cast<qint32>(0x8000000F));
  QStyle* style = QApplication::style();
  QString caption = textOf(c, QStringLiteral("Caption"));
  const QColor fore = colorOf(c, QStringLiteral("ForeColor"), Qt::black);
  auto sunkenBox = [&](const QColor& fill) {
    painter.fillRect(r, fill);
    painter.setPen(QColor(0x80, 0x80, 0x80));
    painter.drawLine(r.topLeft(), r.topRight());
    painter.drawLine(r.topLeft(), r.bottomLeft());
    painter.setPen(Qt::white);
    painter.drawLine(r.bottomLeft(), r.bottomRight());
    painter.drawLine(r.topRight(), r.bottomRight());
    painter.setPen(QColor(0x40, 0x40, 0x40));
    painter.drawLine(r.topLeft() + QPoint(1, 1), r.topRight() + QPoint(-1, 1));
    painter.drawLine(r.topLeft() + QPoint(1, 1), r.bottomLeft() + QPoint(1, -1));
  };
  auto drawMnemonicText = [&](const QRect& area, int flags, const QString& text) {
    painter.setPen(fore);
    painter.drawText(area, flags | Qt::TextShowMnemonic, text);
  };

  if (bare == QLatin1StringView("CommandButton")) {
    QStyleOptionButton option;
    option.rect = r;
    option.text = caption;
    option.state = QStyle::State_Enabled | QStyle::State_Raised;
    option.palette.setColor(QPalette::Button, colorOf(c, QStringLiteral("BackColor"), face));
    option.fontMetrics = painter.fontMetrics();
    style->drawControl(QStyle::CE_PushButton, &option, &painter);
  } else if (bare == QLatin1StringView("Label")) {
    if (numberOf(c, QStringLiteral("BackStyle"), 1) != 0)
      painter.fillRect(r, colorOf(c, QStringLiteral("BackColor"), face));
    if (numberOf(c, QStringLiteral("BorderStyle"), 0) != 0)
      sunkenBox(colorOf(c, QStringLiteral("BackColor"), face));
    const int alignment = static_cast<int>(numberOf(c, QStringLiteral("Alignment"), 0));
    const int horizontal = alignment == 1   ? Qt::AlignRight
                           : alignment == 2 ? Qt::AlignHCenter
                                            : Qt::AlignLeft;
    // An AutoSize label is as wide as its caption in the IDE's font; ours may be wider, so it is not cut
    // or wrapped.
    const bool autoSize = valueOf(c, QStringLiteral("AutoSize")).toBool();
    const bool wrap = !autoSize;
    drawMnemonicText(autoSize ? r.adjusted(1, 1, 200, -1) : r.adjusted(1, 1, -1, -1),
                     horizontal | Qt::AlignTop | (wrap ? Qt::TextWordWrap : 0), caption);
  } else if (bare == QLatin1StringView("TextBox")) {
    sunkenBox(colorOf(c, QStringLiteral("BackColor"), Qt::white));
    painter.setPen(fore);
    painter.drawText(r.adjusted(4, 2, -3, -2), Qt::AlignLeft | Qt::AlignTop,
                     textOf(c, QStringLiteral("Text")));
  } else if (bare == QLatin1StringView("ComboBox")) {
    sunkenBox(colorOf(c, QStringLiteral("BackColor"), Qt::white));
    const QRect button(r.right() - 16, r.top() + 2, 15, r.height() - 4);
    painter.fillRect(button, face);
    painter.setPen(QColor(0x40, 0x40, 0x40));
    painter.drawRect(button.adjusted(0, 0, -1, -1));
    painter.setBrush(Qt::black);
    const QPoint m = button.center();
    painter.drawPolygon(
        QPolygon({QPoint(m.x() - 3, m.y() - 1), QPoint(m.x() + 3, m.y() - 1), QPoint(m.x(), m.y() + 2)}));
    painter.setPen(fore);
    painter.drawText(r.adjusted(4, 2, -20, -2), Qt::AlignLeft | Qt::AlignVCenter,
                     textOf(c, QStringLiteral("Text")));
  } else if (bare == QLatin1StringView("ListBox") || bare == QLatin1StringView("FileListBox") ||
             bare == QLatin1StringView("DirListBox") || bare == QLatin1StringView("DriveListBox")) {
    sunkenBox(colorOf(c, QStringLiteral("BackColor"), Qt::white));
    painter.setPen(fore);
    painter.drawText(r.adjusted(4, 2, -3, -2), Qt::AlignLeft | Qt::AlignTop, c.name());
  } else if (bare == QLatin1StringView("Frame")) {
    painter.fillRect(r, colorOf(c, QStringLiteral("BackColor"), face));
    const int textHeight = painter.fontMetrics().height();
    const QRect box = r.adjusted(0, textHeight / 2, -1, -1);
    painter.setPen(QColor(0x80, 0x80, 0x80));
    painter.drawRect(box);
    painter.setPen(Qt::white);
    painter.drawRect(box.translated(1, 1));
    const int width = painter.fontMetrics().horizontalAdvance(QString(caption).remove(u'&')) + 6;
    painter.fillRect(QRect(r.left() + 6, r.top(), width, textHeight),
                     colorOf(c, QStringLiteral("BackColor"), face));
    drawMnemonicText(QRect(r.left() + 8, r.top(), width, textHeight), Qt::AlignLeft | Qt::AlignVCenter,
                     caption);
  } else if (bare == QLatin1StringView("CheckBox") || bare == QLatin1StringView("OptionButton")) {
    painter.fillRect(r, colorOf(c, QStringLiteral("BackColor"), face));
    QStyleOptionButton option;
    option.rect = QRect(r.left(), r.center().y() - 7, 14, 14);
    option.state = QStyle::State_Enabled;
    const bool on = numberOf(c, QStringLiteral("Value"), 0) != 0;
    option.state |= on ? QStyle::State_On : QStyle::State_Off;
    style->drawPrimitive(bare == QLatin1StringView("CheckBox") ? QStyle::PE_IndicatorCheckBox
                                                               : QStyle::PE_IndicatorRadioButton,
                         &option, &painter);
    drawMnemonicText(r.adjusted(18, 0, 0, 0), Qt::AlignLeft | Qt::AlignVCenter, caption);
  } else if (bare == QLatin1StringView("PictureBox")) {
    sunkenBox(colorOf(c, QStringLiteral("BackColor"), face));
  } else if (bare == QLatin1StringView("Image")) {
    painter.setPen(QPen(QColor(0x40, 0x40, 0x40), 1, Qt::DashLine));
    painter.setBrush(Qt::NoBrush);
    painter.drawRect(r.adjusted(0, 0, -1, -1));
  } else if (bare == QLatin1StringView("Timer")) {
    painter.fillRect(r, face);
    painter.setPen(QColor(0x40, 0x40, 0x40));
    painter.drawRect(r.adjusted(0, 0, -1, -1));
    controlIcon(bare).paint(&painter, r.adjusted(4, 4, -4, -4));
  } else if (bare == QLatin1StringView("HScrollBar") || bare == QLatin1StringView("VScrollBar")) {
    QStyleOptionSlider option;
    option.rect = r;
    option.orientation = bare == QLatin1StringView("HScrollBar") ? Qt::Horizontal : Qt::Vertical;
    option.minimum = 0;
    option.maximum = 100;
    option.pageStep = 10;
    option.state = QStyle::State_Enabled;
    if (option.orientation == Qt::Horizontal) option.state |= QStyle::State_Horizontal;
    style->drawComplexControl(QStyle::CC_ScrollBar, &option, &painter);
  } else if (bare == QLatin1StringView("Shape")) {
    painter.setPen(QPen(colorOf(c, QStringLiteral("BorderColor"), Qt::black),
                        numberOf(c, QStringLiteral("BorderWidth"), 1)));
    painter.setBrush(numberOf(c, QStringLiteral("BackStyle"), 0) != 0
                         ? QBrush(colorOf(c, QStringLiteral("BackColor"), Qt::white))
                         : QBrush(Qt::NoBrush));
    const int shape = static_cast<int>(numberOf(c, QStringLiteral("Shape"), 0));
    const QRect box = r.adjusted(0, 0, -1, -1);
    if (shape == 2 || shape == 3)
      painter.drawEllipse(
          shape == 3 ? QRect(box.center() - QPoint(std::min(box.width(), box.height()) / 2,
                                                   std::min(box.width(), box.height()) / 2),
                             QSize(std::min(box.width(), box.height()), std::min(box.width(), box.height())))
                     : box);
    else if (shape == 4 || shape == 5)
      painter.drawRoundedRect(box, 6, 6);
    else
      painter.drawRect(box);
  } else if (bare == QLatin1StringView("Line")) {
    const QPoint origin = containerOrigin(c.liveNode().parent());
    painter.setPen(QPen(colorOf(c, QStringLiteral("BorderColor"), Qt::black),
                        numberOf(c, QStringLiteral("BorderWidth"), 1)));
    painter.drawLine(origin + QPoint(pixelsOf(numberOf(c, QStringLiteral("X1"), 0)),
                                     pixelsOf(numberOf(c, QStringLiteral("Y1"), 0))),
                     origin + QPoint(pixelsOf(numberOf(c, QStringLiteral("X2"), 0)),
                                     pixelsOf(numberOf(c, QStringLiteral("Y2"), 0))));
  } else {
    // A control the designer cannot draw (an ActiveX control): a box with its class and name.
    painter.fillRect(r, Qt::white);
    painter.setPen(QColor(0x40, 0x40, 0x40));
    painter.drawRect(r.adjusted(0, 0, -1, -1));
    painter.drawText(r.adjusted(3, 2, -2, -2), Qt::AlignLeft | Qt::AlignTop, bare + u' ' + c.name());
  }
}

std::shared_ptr<host::ControlImpl> FormCanvas::controlAt(const QPoint& point) {
  // Topmost first: windowed controls above lightweight ones, later ones above earlier, inner above outer.
  std::shared_ptr<host::ControlImpl> found;
  std::function<void(host::FormNode*, bool)> search = [&](host::FormNode* node, bool lightweight) {
    for (host::FormNode* child : node->children()) {
      const QString bare = bareClass(child->className());
      if (bare == QLatin1StringView("Menu")) continue;
      auto control = m_form->control(child);
      if (isLightweight(bare) == lightweight && rectOf(control).contains(point)) found = control;
      if (isContainer(bare) && !lightweight && rectOf(control).contains(point)) {
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
  const QPoint origin = containerOrigin(selected->liveNode().parent());
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
