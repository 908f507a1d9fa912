// SPDX-License-Identifier: MIT
#include "formgeometry.h"

#include "host/model/vbe.h"
#include "vbfonts.h"

#include <QFontMetrics>

#include <algorithm>

namespace desktop {
namespace {

// The classic window metrics at 96 pixels per inch.
constexpr int kTitleHeight = 18;
constexpr int kToolTitleHeight = 15;
constexpr int kMenuHeight = 19;
constexpr int kThinBorder = 3;
constexpr int kSizingBorder = 4;
// The timer, like every control without a size of its own, is drawn as its toolbox picture.
constexpr int kIconControlSize = 28;
// What a control whose file gives no size at all is drawn with (the IDE's new-control size).
constexpr double kDefaultWidth = 1215;
constexpr double kDefaultHeight = 375;

/// HIMETRIC (hundredths of a millimetre) in twips: 2540 of them are an inch of 1440 twips.
double twipsOfHimetric(double himetric) {
  return himetric * 1440.0 / 2540.0;
}

/// A number the control's own description holds (not a default of its class).
std::optional<double> writtenNumber(host::ControlImpl& control, const QString& name) {
  if (!control.node() || !control.node()->property(name)) return std::nullopt;
  bool ok = false;
  const double value = valueOf(control, name).toDouble(&ok);
  return ok ? std::optional(value) : std::nullopt;
}

}  // namespace

bool isMenu(const host::FormNode& node) {
  return bareClass(node.className()) == QLatin1StringView("Menu");
}

bool isLightweight(const QString& bare) {
  return bare == QLatin1StringView("Label") || bare == QLatin1StringView("Image") ||
         bare == QLatin1StringView("Shape") || bare == QLatin1StringView("Line");
}

QString bareClass(const QString& className) {
  const qsizetype dot = className.indexOf(u'.');
  return dot < 0 ? className : className.sliced(dot + 1);
}

QVariant valueOf(host::ControlImpl& control, const QString& name, const QVariant& fallback) {
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

QColor vbColor(qint32 value) {
  const quint32 bits = static_cast<quint32>(value);
  if (bits & 0x80000000u) {
    switch (bits & 0xFF) {
      case 0x00:
        return QColor(0xd4, 0xd0, 0xc8);  // scroll bars
      case 0x01:
        return QColor(0x3a, 0x6e, 0xa5);  // desktop
      case 0x02:
        return QColor(0x0a, 0x24, 0x6a);  // active title
      case 0x03:
        return QColor(0x80, 0x80, 0x80);  // inactive title
      case 0x05:
      case 0x14:
        return Qt::white;  // window, button highlight
      case 0x09:
      case 0x0E:
        return Qt::white;  // title text, highlighted text
      case 0x0C:
        return QColor(0x80, 0x80, 0x80);  // application workspace
      case 0x0D:
        return QColor(0x0a, 0x24, 0x6a);  // highlight
      case 0x10:
        return QColor(0x80, 0x80, 0x80);  // button shadow
      case 0x11:
        return QColor(0x80, 0x80, 0x80);  // grey text
      case 0x15:
        return QColor(0x40, 0x40, 0x40);  // dark shadow
      case 0x18:
        return QColor(0xff, 0xff, 0xe1);  // tooltip background
      case 0x04:
      case 0x0F:
      case 0x16:
        return QColor(0xd4, 0xd0, 0xc8);  // menu, button face, light
      default:
        return Qt::black;  // window text, button text, menu text, frames ...
    }
  }
  return QColor(static_cast<int>(bits & 0xFF), static_cast<int>((bits >> 8) & 0xFF),
                static_cast<int>((bits >> 16) & 0xFF));
}

QColor colorOf(host::ControlImpl& control, const QString& name, QColor fallback) {
  const QVariant value = valueOf(control, name);
  if (!value.isValid()) return fallback;
  bool ok = false;
  const qint32 number = value.toInt(&ok);
  return ok ? vbColor(number) : fallback;
}

// ---------------------------------------------------------------------------------------------------

host::ControlImpl& FormGeometry::root() const {
  return *std::static_pointer_cast<host::ControlImpl>(m_form->Root());
}

FormFrame FormGeometry::frame() const {
  FormFrame frame;
  host::FormNode& node = m_form->description().root();
  const QString kind = bareClass(node.className());
  if (kind != QLatin1StringView("Form") && kind != QLatin1StringView("MDIForm")) return frame;
  for (const host::FormNode* child : node.children())
    if (isMenu(*child)) frame.menuHeight = kMenuHeight;
  host::ControlImpl& form = root();
  const int borderStyle = static_cast<int>(numberOf(form, QStringLiteral("BorderStyle"), 2));
  const bool controlBox = valueOf(form, QStringLiteral("ControlBox"), true).toBool();
  frame.minEnabled = valueOf(form, QStringLiteral("MinButton"), true).toBool();
  frame.maxEnabled = valueOf(form, QStringLiteral("MaxButton"), true).toBool();
  switch (borderStyle) {
    case 0:  // None: neither frame nor title bar
      return frame;
    case 2:  // Sizable
    case 5:  // Sizable ToolWindow
      frame.border = kSizingBorder;
      frame.sizable = true;
      break;
    default:  // Fixed Single, Fixed Dialog, Fixed ToolWindow
      frame.border = kThinBorder;
      break;
  }
  frame.toolWindow = borderStyle == 4 || borderStyle == 5;
  frame.titleHeight = frame.toolWindow ? kToolTitleHeight : kTitleHeight;
  frame.closeButton = controlBox;
  // A dialog frame and a tool window show no icon; a tool window has only its close button.
  frame.icon = controlBox && (borderStyle == 1 || borderStyle == 2);
  frame.minMaxButtons = controlBox && !frame.toolWindow && (frame.minEnabled || frame.maxEnabled);
  return frame;
}

QSize FormGeometry::clientSize() const {
  host::ControlImpl& form = root();
  return QSize(pixelsOf(numberOf(form, QStringLiteral("ClientWidth"), 4680)),
               pixelsOf(numberOf(form, QStringLiteral("ClientHeight"), 3090)));
}

QRect FormGeometry::windowRect() const {
  const FormFrame f = frame();
  const QSize client = clientSize();
  return QRect(kMargin, kMargin, client.width() + 2 * f.border,
               client.height() + 2 * f.border + f.titleHeight + f.menuHeight);
}

QRect FormGeometry::titleRect() const {
  const FormFrame f = frame();
  const QRect window = windowRect();
  return QRect(window.left() + f.border, window.top() + f.border, window.width() - 2 * f.border,
               f.titleHeight);
}

QPoint FormGeometry::clientOrigin() const {
  const FormFrame f = frame();
  return windowRect().topLeft() + QPoint(f.border, f.border + f.titleHeight + f.menuHeight);
}

QSize FormGeometry::canvasSize() const {
  const QRect window = windowRect();
  return QSize(window.right() + 1 + kMargin, window.bottom() + 1 + kMargin);
}

std::shared_ptr<host::ControlImpl> FormGeometry::userControlOf(const QString& className) const {
  const qsizetype dot = className.indexOf(u'.');
  auto component = m_form->component();
  auto project = component ? component->project() : nullptr;
  auto vbe = project ? project->vbe() : nullptr;
  if (dot < 0 || !vbe) return nullptr;
  const QString projectName = className.left(dot);
  const QString name = className.mid(dot + 1);
  for (const auto& candidate : vbe->projects()) {
    if (candidate->Name().compare(projectName, Qt::CaseInsensitive) != 0) continue;
    auto found = candidate->component(name);
    if (found && found->Type() == ide::ComponentType::UserControl && found->form())
      return std::static_pointer_cast<host::ControlImpl>(found->form()->Root());
  }
  return nullptr;
}

bool FormGeometry::isContainer(host::FormNode* node) const {
  if (!node || isMenu(*node)) return false;
  const QString kind = bareClass(node->className());
  if (kind == QLatin1StringView("Frame") || kind == QLatin1StringView("PictureBox")) return true;
  if (std::any_of(node->children().begin(), node->children().end(),
                  [](const host::FormNode* child) { return !isMenu(*child); }))
    return true;
  if (auto userControl = userControlOf(node->className()))
    return valueOf(*userControl, QStringLiteral("ControlContainer"), false).toBool();
  return false;
}

QPoint FormGeometry::containerOrigin(host::FormNode* container) const {
  if (!container || !container->parent()) return clientOrigin();
  auto control = m_form->control(container);
  const QRect rect = rectOf(control);
  // Inside a picture box the coordinates start within its border; a frame's and a user control's at their
  // corner.
  int inset = 0;
  if (bareClass(container->className()) == QLatin1StringView("PictureBox") &&
      numberOf(*control, QStringLiteral("BorderStyle"), 1) != 0)
    inset = numberOf(*control, QStringLiteral("Appearance"), 1) != 0 ? 2 : 1;
  return rect.topLeft() + QPoint(inset, inset);
}

QRect FormGeometry::rectOf(const std::shared_ptr<host::ControlImpl>& control) const {
  if (!control || !control->node()) return {};
  host::FormNode* node = control->node();
  const QString kind = bareClass(node->className());
  if (isMenu(*node) || !node->parent()) return {};
  const QPoint origin = containerOrigin(node->parent());
  if (kind == QLatin1StringView("Line")) {
    const QPoint a(pixelsOf(numberOf(*control, QStringLiteral("X1"), 0)),
                   pixelsOf(numberOf(*control, QStringLiteral("Y1"), 0)));
    const QPoint b(pixelsOf(numberOf(*control, QStringLiteral("X2"), 0)),
                   pixelsOf(numberOf(*control, QStringLiteral("Y2"), 0)));
    return QRect(a, b).normalized().adjusted(-2, -2, 2, 2).translated(origin);
  }
  const QPoint topLeft = origin + QPoint(pixelsOf(numberOf(*control, QStringLiteral("Left"), 0)),
                                         pixelsOf(numberOf(*control, QStringLiteral("Top"), 0)));
  if (kind == QLatin1StringView("Timer")) return QRect(topLeft, QSize(kIconControlSize, kIconControlSize));

  // A control without Width and Height (an ActiveX or user control at its default size) has the extent
  // its own properties keep in HIMETRIC, else the size its user control was designed with.
  std::optional<double> width = writtenNumber(*control, QStringLiteral("Width"));
  std::optional<double> height = writtenNumber(*control, QStringLiteral("Height"));
  if (!width)
    if (const auto extent = writtenNumber(*control, QStringLiteral("_ExtentX")))
      width = twipsOfHimetric(*extent);
  if (!height)
    if (const auto extent = writtenNumber(*control, QStringLiteral("_ExtentY")))
      height = twipsOfHimetric(*extent);
  if (!width || !height) {
    if (auto userControl = userControlOf(node->className())) {
      if (!width) width = numberOf(*userControl, QStringLiteral("ClientWidth"), kDefaultWidth);
      if (!height) height = numberOf(*userControl, QStringLiteral("ClientHeight"), kDefaultHeight);
    }
  }
  QRect rect(topLeft, QSize(std::max(1, pixelsOf(width.value_or(kDefaultWidth))),
                            std::max(1, pixelsOf(height.value_or(kDefaultHeight)))));

  // An AutoSize label is as large as its caption in the font it is drawn with; it grows from the side its
  // Alignment keeps (a right-aligned one to the left). With WordWrap its width stays and it grows downwards.
  if (kind == QLatin1StringView("Label") && valueOf(*control, QStringLiteral("AutoSize"), false).toBool()) {
    const QFontMetrics metrics(vbFont(control->font()));
    QString caption = textOf(*control, QStringLiteral("Caption"));
    const bool wrap = valueOf(*control, QStringLiteral("WordWrap"), false).toBool();
    const int flags =
        (wrap ? Qt::TextWordWrap : 0) |
        (valueOf(*control, QStringLiteral("UseMnemonic"), true).toBool() ? Qt::TextShowMnemonic : 0);
    const QRect text = metrics.boundingRect(QRect(0, 0, wrap ? rect.width() : 100000, 100000), flags,
                                            caption.isEmpty() ? QStringLiteral(" ") : caption);
    const int newWidth = wrap ? rect.width() : std::max(1, text.width());
    const int alignment = static_cast<int>(numberOf(*control, QStringLiteral("Alignment"), 0));
    int left = rect.left();
    if (alignment == 1) left = rect.right() + 1 - newWidth;
    if (alignment == 2) left = rect.center().x() - newWidth / 2;
    rect = QRect(left, rect.top(), newWidth, std::max(1, text.height()));
  }
  return rect;
}

}  // namespace desktop
