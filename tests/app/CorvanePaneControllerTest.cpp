// The pane screens and their rows, on the offscreen platform.

#include <QFontMetrics>
#include <QScrollArea>
#include <QScrollBar>
#include <QSignalSpy>

#include "AppTestSupport.h"
#include "app/NavigationController.h"
#include "app/Theme.h"

namespace corvane {

using test::A;
using test::D;
using test::S;

class CorvanePaneControllerTest : public QObject {
  Q_OBJECT

 private:
  // A stack on the given root screen, shown, as the application makes it.
  static std::unique_ptr<NavigationController> stackOn(CorvanePaneController* root) {
    auto navigation = std::make_unique<NavigationController>(root);
    navigation->resize(400, 720);
    navigation->show();
    return navigation;
  }

  static Value sampleDisplay() {
    return D({{"Serving Cell", D({{"ARFCN", S("62")}, {"Band", D({{"Name", S("GSM 900")}, {"Width", S("35 MHz")}})}})},
              {"Empty Section", Value(Dictionary())},
              {"Timing Advance", S("3")}});
  }

 private slots:
  void theRootBeforeAnyDataIsTitledCorvaneWithNoRowsAndSpinsWhileConnecting() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    root->setStatus(QStringLiteral("Connecting"), true);
    auto navigation = stackOn(root);

    QCOMPARE(root->title(), QStringLiteral("Corvane"));
    QCOMPARE(navigation->barTitle(), QStringLiteral("Corvane"));
    QCOMPARE(root->tableView()->numberOfRows(), 0);
    QCOMPARE(root->tableViewNumberOfRowsInSection(*root->tableView(), 0), 0);
    QCOMPARE(test::statusTextOf(root), QStringLiteral("Connecting"));
    QVERIFY(test::indicatorOf(root)->isAnimating());
    QVERIFY(!test::indicatorOf(root)->isHidden());
    QVERIFY(!navigation->isToolbarHidden());
  }

  void aScreenIsTitledAfterItsNodeAndListsItsChildrenInOrder() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->reloadWithNode(test::treeOf(sampleDisplay()));

    QCOMPARE(root->title(), QStringLiteral("Corvane"));
    QCOMPARE(root->tableView()->numberOfRows(), 3);
    QCOMPARE(test::cellAt(root, 0)->key->text(), QStringLiteral("Serving Cell"));
    QCOMPARE(test::cellAt(root, 0)->accessoryType(), TableViewCell::AccessoryType::DisclosureIndicator);
    QCOMPARE(test::cellAt(root, 0)->value, nullptr);  // a key-only row
    QCOMPARE(test::cellAt(root, 2)->key->text(), QStringLiteral("Timing Advance"));
    QCOMPARE(test::cellAt(root, 2)->value->text(), QStringLiteral("3"));
    QCOMPARE(test::cellAt(root, 2)->accessoryType(), TableViewCell::AccessoryType::None);
    QCOMPARE(test::cellAt(root, 2)->reuseIdentifier(), QStringLiteral("CorvanePaneControllerCell"));
  }

  void openingASectionPushesAScreenAtTheJoinedPathWithTheSameStatus() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->reloadWithNode(test::treeOf(sampleDisplay()));
    root->setStatus(QStringLiteral("Updated 2026-11-16 at 08:00:00"), false);

    test::tapRow(root, 0);
    QCOMPARE(navigation->viewControllers().size(), std::size_t{2});
    // A tap selects the row it opens (a leaf row's selection is taken away again).
    QCOMPARE(root->tableView()->indexPathForSelectedRow(), std::optional<IndexPath>(IndexPath{0, 0}));
    auto* serving = qobject_cast<CorvanePaneController*>(navigation->topViewController());
    QVERIFY(serving);
    QCOMPARE(serving->path(), std::string("/Serving Cell"));
    QCOMPARE(serving->title(), QStringLiteral("Serving Cell"));
    QCOMPARE(navigation->barTitle(), QStringLiteral("Serving Cell"));
    QVERIFY(navigation->backButtonText().contains(QStringLiteral("Corvane")));
    QCOMPARE(test::statusTextOf(serving), QStringLiteral("Updated 2026-11-16 at 08:00:00"));
    QVERIFY(!test::indicatorOf(serving)->isAnimating());
    QVERIFY(test::indicatorOf(serving)->isHidden());

    test::tapRow(serving, test::rowWithKey(serving, QStringLiteral("Band")));
    auto* band = qobject_cast<CorvanePaneController*>(navigation->topViewController());
    QCOMPARE(band->path(), std::string("/Serving Cell/Band"));
    QCOMPARE(band->tableView()->numberOfRows(), 2);

    navigation->backButton()->click();
    QCOMPARE(navigation->topViewController(), serving);
    QCOMPARE(navigation->viewControllers().size(), std::size_t{2});
  }

  void anEmptySectionShowsADisclosureRowAndOpensAnEmptyScreen() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->reloadWithNode(test::treeOf(sampleDisplay()));

    const int row = test::rowWithKey(root, QStringLiteral("Empty Section"));
    QCOMPARE(row, 1);
    QCOMPARE(test::cellAt(root, row)->accessoryType(), TableViewCell::AccessoryType::DisclosureIndicator);
    test::tapRow(root, row);

    QCOMPARE(navigation->viewControllers().size(), std::size_t{2});
    auto* empty = qobject_cast<CorvanePaneController*>(navigation->topViewController());
    QCOMPARE(empty->title(), QStringLiteral("Empty Section"));
    QCOMPARE(empty->path(), std::string("/Empty Section"));
    QCOMPARE(empty->tableView()->numberOfRows(), 0);
  }

  void tappingALeafRowOnlyDeselectsIt() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->reloadWithNode(test::treeOf(sampleDisplay()));
    const int leaf = test::rowWithKey(root, QStringLiteral("Timing Advance"));

    test::tapRow(root, leaf);
    QVERIFY(!root->tableView()->indexPathForSelectedRow());
    QCOMPARE(navigation->viewControllers().size(), std::size_t{1});
    // A missing index path is ignored.
    root->tableViewDidSelectRowAtIndexPath(*root->tableView(), std::nullopt);
    QCOMPARE(navigation->viewControllers().size(), std::size_t{1});
  }

  void theToolbarHasThreeItemsWithoutSavingAndFourWithIt() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->setStatus(QStringLiteral("Connecting"), true);
    QCOMPARE(root->toolbarItems().size(), std::size_t{3});
    QCOMPARE(root->toolbarItems()[2].kind, BarItem::Kind::FlexibleSpace);

    host.allow_ = true;
    root->setStatus(QStringLiteral("Connecting"), true);
    QCOMPARE(root->toolbarItems().size(), std::size_t{4});
    auto* save = qobject_cast<QToolButton*>(root->toolbarItems()[3].widget.data());
    QVERIFY(save);
    QCOMPARE(save->text(), QStringLiteral("Save"));
    QVERIFY(!save->icon().isNull());
    save->click();
    QCOMPARE(host.shows_, 1);
  }

  void theStatusTextUsesTheSystemFontAt14AndFollowsEveryChange() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->setStatus(QStringLiteral("Connecting..."), true);
    auto* label = qobject_cast<QLabel*>(root->toolbarItems()[1].widget.data());
    QCOMPARE(label->font().pixelSize(), 14);
    QVERIFY(!label->font().bold());
    QCOMPARE(label->width(), QFontMetrics(label->font()).horizontalAdvance(label->text()));

    root->setStatus(std::nullopt, false);
    QCOMPARE(test::statusTextOf(root), QString());
    QVERIFY(!test::indicatorOf(root)->isAnimating());
    root->reloadWithNode(test::treeOf(sampleDisplay()));
    QCOMPARE(root->toolbarItems().size(), std::size_t{3});
  }

  void aSectionKeyIsPlacedTenPointsInAndCentredInTheBoldFont() {
    auto* cell = CorvaneCell::initWithStyleKey(TableViewCell::Style::Value1, QStringLiteral("id"));
    std::unique_ptr<CorvaneCell> owner(cell);
    cell->resize(300, TableViewCell::kHeight);
    cell->key->setText(QStringLiteral("Neighbour Cells"));
    cell->setLayoutKey();
    const QFontMetrics bold(theme::boldSystemFont(15));
    QCOMPARE(cell->key->font(), theme::boldSystemFont(15));
    QCOMPARE(cell->key->geometry(),
             QRect(10, (cell->contentView()->height() - bold.height()) / 2,
                   bold.horizontalAdvance(QStringLiteral("Neighbour Cells")), bold.height()));
    QCOMPARE(cell->key->parentWidget(), cell->contentView());
    QCOMPARE(cell->view, nullptr);
  }

  void aValueThatFitsIsRightAligned() {
    auto* cell = CorvaneCell::initWithStyle(TableViewCell::Style::Value1, QStringLiteral("id"));
    std::unique_ptr<CorvaneCell> owner(cell);
    cell->key->setText(QStringLiteral("RxLev"));
    cell->value->setText(QStringLiteral("-71 dBm"));
    const QFontMetrics bold(CorvaneCell::measuringFont());
    const int kw = bold.horizontalAdvance(QStringLiteral("RxLev"));
    const int vw = bold.horizontalAdvance(QStringLiteral("-71 dBm"));
    setContentWidth(cell, kw + 10 + 50 + vw + 1);
    cell->setLayout();
    const int width = cell->contentView()->width();
    QCOMPARE(width, kw + 10 + 50 + vw + 1);
    QCOMPARE(cell->value->geometry(), QRect(width - vw, (cell->contentView()->height() - bold.height()) / 2, vw,
                                              bold.height()));
    QCOMPARE(cell->view->widget()->size(), QSize(width, 50));
    QCOMPARE(cell->view->geometry(), QRect(0, 0, width, 50));
    QCOMPARE(cell->value->font(), theme::systemFont(15));
  }

  void aValueThatNeedsExactlyTheWidthStartsAfterTheKeyAndTheContentIsThatWide() {
    auto* cell = CorvaneCell::initWithStyle(TableViewCell::Style::Value1, QStringLiteral("id"));
    std::unique_ptr<CorvaneCell> owner(cell);
    cell->key->setText(QStringLiteral("Cell ID"));
    cell->value->setText(QStringLiteral("14465"));
    // Measured in the bold font, although the value is drawn in the regular one.
    const QFontMetrics bold(theme::boldSystemFont(15));
    const int kw = bold.horizontalAdvance(QStringLiteral("Cell ID"));
    const int vw = bold.horizontalAdvance(QStringLiteral("14465"));
    QVERIFY(vw != QFontMetrics(theme::systemFont(15)).horizontalAdvance(QStringLiteral("14465")));
    const int need = kw + 10 + 50 + vw;
    setContentWidth(cell, need);
    cell->setLayout();

    QCOMPARE(cell->contentView()->width(), need);
    QCOMPARE(cell->key->geometry().topLeft().x(), 10);
    QCOMPARE(cell->value->x(), 10 + kw + 50);
    QCOMPARE(cell->value->width(), vw);
    QCOMPARE(cell->view->widget()->width(), need);
  }

  void aLongValueScrollsSidewaysAfterAFiftyPointGap() {
    auto* cell = CorvaneCell::initWithStyle(TableViewCell::Style::Value1, QStringLiteral("id"));
    std::unique_ptr<CorvaneCell> owner(cell);
    const QString value = QStringLiteral("310-410 / LAC 0x1A2B / Cell 40961 / ARFCN 62 / BSIC 5-3");
    cell->key->setText(QStringLiteral("Serving"));
    cell->value->setText(value);
    const QFontMetrics bold(CorvaneCell::measuringFont());
    const int kw = bold.horizontalAdvance(QStringLiteral("Serving"));
    const int vw = bold.horizontalAdvance(value);
    setContentWidth(cell, 240);
    cell->setLayout();
    QCOMPARE(cell->contentView()->width(), 240);

    QCOMPARE(cell->value->x(), 10 + kw + 50);
    QCOMPARE(cell->view->widget()->size(), QSize(240 + kw + vw, 50));
    QCOMPARE(cell->view->geometry(), QRect(0, 0, 240, 50));
    QCOMPARE(cell->toolTip(), value);
    // Shown, the row scrolls as far as the end of its content.
    cell->show();
    QVERIFY(QTest::qWaitForWindowExposed(cell));
    QCOMPARE(cell->view->horizontalScrollBar()->maximum(), kw + vw);
  }

  void rowsAreReusedAcrossReloadsUnderOneIdentifier() {
    test::FakeScreenHost host;
    auto* root = new CorvanePaneController(nullptr, "/", host);
    auto navigation = stackOn(root);
    root->reloadWithNode(test::treeOf(sampleDisplay()));
    CorvaneCell* first = test::cellAt(root, 0);
    CorvaneCell* last = test::cellAt(root, 2);
    root->reloadWithNode(test::treeOf(D({{"Serving Cell", D({{"ARFCN", S("63")}, {"BSIC", S("1-1")}})},
                                         {"Empty Section", Value(Dictionary())},
                                         {"Timing Advance", S("4")}})));
    QCOMPARE(test::cellAt(root, 0), first);
    QCOMPARE(test::cellAt(root, 2), last);
    QCOMPARE(last->value->text(), QStringLiteral("4"));
  }

 private:
  // Sizes the row so that its content area is `width` wide once laid out.
  static void setContentWidth(CorvaneCell* cell, int width) {
    cell->resize(300, TableViewCell::kHeight);
    cell->setLayout();  // the row's own layout sizes the content area first
    const int extra = cell->width() - cell->contentView()->width();
    cell->resize(width + extra, TableViewCell::kHeight);
  }
};

}  // namespace corvane

QTEST_MAIN(corvane::CorvanePaneControllerTest)
#include "CorvanePaneControllerTest.moc"
