// SPDX-License-Identifier: MIT
// The event tables, built once from the groups of events the classes share, each sorted by name.
#include "host/files/controlevents.h"

#include <algorithm>
#include <cstring>
#include <initializer_list>
#include <map>
#include <vector>

namespace host {
namespace {

using Events = std::vector<EventInfo>;

const Events kMouse = {{"MouseDown", "Button As Integer, Shift As Integer, X As Single, Y As Single"},
                       {"MouseMove", "Button As Integer, Shift As Integer, X As Single, Y As Single"},
                       {"MouseUp", "Button As Integer, Shift As Integer, X As Single, Y As Single"}};
const Events kKeys = {{"KeyDown", "KeyCode As Integer, Shift As Integer"},
                      {"KeyPress", "KeyAscii As Integer"},
                      {"KeyUp", "KeyCode As Integer, Shift As Integer"}};
const Events kDrag = {{"DragDrop", "Source As Control, X As Single, Y As Single"},
                      {"DragOver", "Source As Control, X As Single, Y As Single, State As Integer"}};
const Events kFocus = {{"GotFocus", ""}, {"LostFocus", ""}};
const Events kOle = {{"OLECompleteDrag", "Effect As Long"},
                     {"OLEDragDrop",
                      "Data As DataObject, Effect As Long, Button As Integer, Shift As Integer, X As Single, "
                      "Y As Single"},
                     {"OLEDragOver",
                      "Data As DataObject, Effect As Long, Button As Integer, Shift As Integer, X As Single, "
                      "Y As Single, State As Integer"},
                     {"OLEGiveFeedback", "Effect As Long, DefaultCursors As Boolean"},
                     {"OLESetData", "Data As DataObject, DataFormat As Integer"},
                     {"OLEStartDrag", "Data As DataObject, AllowedEffects As Long"}};
const Events kLink = {{"LinkClose", ""},
                      {"LinkError", "LinkErr As Integer"},
                      {"LinkNotify", ""},
                      {"LinkOpen", "Cancel As Integer"}};
const Events kFormLink = {{"LinkClose", ""},
                          {"LinkError", "LinkErr As Integer"},
                          {"LinkExecute", "CmdStr As String, Cancel As Integer"},
                          {"LinkOpen", "Cancel As Integer"}};
const Events kLife = {{"Initialize", ""}, {"Terminate", ""}};
const Events kWindow = {{"Activate", ""}, {"Deactivate", ""},
                        {"Load", ""},     {"QueryUnload", "Cancel As Integer, UnloadMode As Integer"},
                        {"Resize", ""},   {"Unload", "Cancel As Integer"}};
const Events kValidate = {{"Validate", "Cancel As Boolean"}};
const EventInfo kClick{"Click", ""};
const EventInfo kDblClick{"DblClick", ""};
const EventInfo kChange{"Change", ""};
const EventInfo kScroll{"Scroll", ""};
const EventInfo kPaint{"Paint", ""};

struct ClassEvents {
  Events events;
  const char* defaultEvent;
};

Events join(std::initializer_list<Events> groups, std::initializer_list<EventInfo> own = {}) {
  Events all(own);
  for (const Events& group : groups)
    all.insert(all.end(), group.begin(), group.end());
  std::sort(all.begin(), all.end(),
            [](const EventInfo& a, const EventInfo& b) { return std::strcmp(a.name, b.name) < 0; });
  return all;
}

const std::map<QString, ClassEvents>& tables() {
  static const std::map<QString, ClassEvents> byClass = [] {
    std::map<QString, ClassEvents> t;
    const auto add = [&](const char* name, Events events, const char* defaultEvent) {
      t[QString::fromLatin1(name).toLower()] = {std::move(events), defaultEvent};
    };
    add("Form",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kFormLink, kLife, kWindow}, {kClick, kDblClick, kPaint}),
        "Load");
    add("MDIForm", join({kMouse, kDrag, kOle, kFormLink, kLife, kWindow}, {kClick, kDblClick}), "Load");
    add("UserControl",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kLife},
             {kClick,
              kDblClick,
              kPaint,
              {"AccessKeyPress", "KeyAscii As Integer"},
              {"AmbientChanged", "PropertyName As String"},
              {"AsyncReadComplete", "AsyncProp As AsyncProperty"},
              {"AsyncReadProgress", "AsyncProp As AsyncProperty"},
              {"EnterFocus", ""},
              {"ExitFocus", ""},
              {"GetDataMember", "DataMember As String, Data As Object"},
              {"Hide", ""},
              {"HitTest", "X As Single, Y As Single, HitResult As Integer"},
              {"InitProperties", ""},
              {"ReadProperties", "PropBag As PropertyBag"},
              {"Resize", ""},
              {"Show", ""},
              {"WriteProperties", "PropBag As PropertyBag"}}),
        "Initialize");
    add("PropertyPage",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kLife}, {kClick,
                                                           kDblClick,
                                                           kPaint,
                                                           {"ApplyChanges", ""},
                                                           {"EditProperty", "PropertyName As String"},
                                                           {"SelectionChanged", ""}}),
        "SelectionChanged");
    add("Class", join({kLife}), "Initialize");
    add("CommandButton", join({kMouse, kKeys, kDrag, kFocus, kOle}, {kClick}), "Click");
    add("TextBox", join({kMouse, kKeys, kDrag, kFocus, kOle, kLink, kValidate}, {kChange, kClick, kDblClick}),
        "Change");
    add("Label", join({kMouse, kDrag, kOle, kLink}, {kChange, kClick, kDblClick}), "Click");
    add("ComboBox",
        join({kKeys, kDrag, kFocus, kOle, kValidate},
             {kChange, kClick, kDblClick, kScroll, {"DropDown", ""}}),
        "Change");
    add("ListBox",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kValidate},
             {kClick, kDblClick, kScroll, {"ItemCheck", "Item As Integer"}}),
        "Click");
    add("CheckBox", join({kMouse, kKeys, kDrag, kFocus, kOle, kValidate}, {kClick}), "Click");
    add("OptionButton", join({kMouse, kKeys, kDrag, kFocus, kOle, kValidate}, {kClick, kDblClick}), "Click");
    add("Frame", join({kMouse, kDrag, kOle}, {kClick, kDblClick}), "DragDrop");
    add("PictureBox",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kLink, kValidate},
             {kChange, kClick, kDblClick, kPaint, {"Resize", ""}}),
        "Click");
    add("Image", join({kMouse, kDrag, kOle}, {kClick, kDblClick}), "Click");
    add("Timer", join({}, {{"Timer", ""}}), "Timer");
    add("HScrollBar", join({kKeys, kDrag, kFocus, kValidate}, {kChange, kScroll}), "Change");
    add("VScrollBar", join({kKeys, kDrag, kFocus, kValidate}, {kChange, kScroll}), "Change");
    add("DriveListBox", join({kKeys, kDrag, kFocus, kOle, kValidate}, {kChange, kScroll}), "Change");
    add("DirListBox", join({kMouse, kKeys, kDrag, kFocus, kOle, kValidate}, {kChange, kClick, kScroll}),
        "Change");
    add("FileListBox",
        join({kMouse, kKeys, kDrag, kFocus, kOle, kValidate},
             {kClick, kDblClick, kScroll, {"PathChange", ""}, {"PatternChange", ""}}),
        "Click");
    add("Menu", join({}, {kClick}), "Click");
    add("Shape", {}, "");
    add("Line", {}, "");
    // What the container gives a control it knows nothing of.
    add("", join({kDrag, kFocus, kValidate}), "GotFocus");
    return t;
  }();
  return byClass;
}

const ClassEvents& eventsOf(QStringView className) {
  const auto& t = tables();
  // Another library's class ("MSComctlLib.ListView", "Loja.ctlPainel") is none of the intrinsic ones.
  const bool intrinsic = className.startsWith(u"VB.", Qt::CaseInsensitive) || !className.contains(u'.');
  const QStringView bare = className.startsWith(u"VB.", Qt::CaseInsensitive) ? className.mid(3) : className;
  const auto found = intrinsic ? t.find(bare.toString().toLower()) : t.end();
  return found == t.end() ? t.at(QString()) : found->second;
}

}  // namespace

std::span<const EventInfo> controlEvents(QStringView className) {
  return eventsOf(className).events;
}

QString defaultEvent(QStringView className) {
  return QString::fromLatin1(eventsOf(className).defaultEvent);
}

QString eventProcedureHeader(QStringView objectName, const EventInfo& event, bool controlArray) {
  QString parameters = controlArray ? QStringLiteral("Index As Integer") : QString();
  if (*event.parameters) {
    if (!parameters.isEmpty()) parameters += QStringLiteral(", ");
    parameters += QString::fromLatin1(event.parameters);
  }
  return QStringLiteral("Private Sub %1_%2(%3)").arg(objectName, QLatin1StringView(event.name), parameters);
}

}  // namespace host
