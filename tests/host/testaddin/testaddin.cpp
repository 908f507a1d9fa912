// SPDX-License-Identifier: MIT
// A minimal add-in for the IDE model's life-cycle tests: it puts one item into the "Add-Ins" menu and
// starts a timer while connected, and logs every call it receives. Setting QUIMBEL_TEST_ADDIN_FAIL makes
// it unload itself when the start-up completes, as an add-in whose start-up failed does.
#include "ide/extensibility.h"
#include "ide/vbide.h"

#include <QString>
#include <QStringList>

namespace {

QStringList& log() {
  static QStringList entries;
  return entries;
}

class TestConnect final : public ide::IDTExtensibility {
 public:
  void OnConnection(const ide::Ref<ide::VBE>& vbe, ide::ConnectMode mode, const ide::Ref<ide::AddIn>& addIn,
                    QVariantList&) override {
    log() << u"connect %1"_qs.arg(static_cast<int>(mode));
    m_vbe = vbe;
    m_addIn = addIn;
    if (mode != ide::ConnectMode::Startup) start();
  }
  void OnStartupComplete(QVariantList&) override {
    log() << u"startup"_qs;
    if (qEnvironmentVariableIsSet("QUIMBEL_TEST_ADDIN_FAIL")) {
      m_addIn->setConnect(false);
      return;
    }
    start();
  }
  void OnAddInsUpdate(QVariantList&) override { log() << u"update"_qs; }
  void OnDisconnection(ide::DisconnectMode mode, QVariantList&) override {
    log() << u"disconnect %1"_qs.arg(static_cast<int>(mode));
    if (m_item) m_item->Delete();
    m_item.reset();
    m_click.disconnect();
    if (m_timer) m_vbe->Platform().loop().KillTimer(m_timer);
    m_timer = 0;
  }

 private:
  void start() {
    m_item =
        m_vbe->CommandBars()->Item(u"Add-Ins"_qs)->Controls()->Add(ide::ControlType::Button, 1, {}, 0, true);
    m_item->setCaption(u"Test Add-In"_qs);
    m_click = m_vbe->Events()->CommandBarEvents(m_item)->Click.connect(
        [](const ide::Ref<ide::CommandBarControl>&, bool&, bool&) { log() << u"click"_qs; });
    m_timer = m_vbe->Platform().loop().SetTimer(100, [] { log() << u"tick"_qs; });
  }

  ide::Ref<ide::VBE> m_vbe;
  ide::Ref<ide::AddIn> m_addIn;
  ide::Ref<ide::CommandBarControl> m_item;
  ide::Connection m_click;
  int m_timer = 0;
};

const ide::AddInDescription kDescription{"QuimbelTest.Connect", "Add-in of the IDE model's tests"};

}  // namespace

extern "C" Q_DECL_EXPORT const ide::AddInDescription* ideAddInDescribe() {
  return &kDescription;
}
extern "C" Q_DECL_EXPORT ide::IDTExtensibility* ideAddInCreate() {
  return new TestConnect();
}
/// The calls received so far, joined with commas; reading clears the log.
extern "C" Q_DECL_EXPORT const char* testAddInTakeLog() {
  static QByteArray text;
  text = log().join(u',').toUtf8();
  log().clear();
  return text.constData();
}
