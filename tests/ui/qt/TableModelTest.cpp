// The list model over a table screen: flattening, roles, and reloads that keep unchanged items.
#include <QAbstractItemModelTester>
#include <QSignalSpy>

#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "../StoreFeed.h"
#include "WarningCatcher.h"
#include "ui/SecondLevelViewController.h"
#include "ui/qt/TableModel.h"

namespace pyx::qt {
namespace {

// A table whose contents the test sets directly.
class FakeTable : public TableController {
  public:
    struct Section {
        std::optional<std::string> title;
        std::vector<Cell> rows;
    };
    std::vector<Section> sections;

    [[nodiscard]] int numberOfSections() const override {
        return static_cast<int>(sections.size());
    }
    [[nodiscard]] std::optional<std::string> titleForHeaderInSection(int s) const override {
        return sections.at(static_cast<std::size_t>(s)).title;
    }
    [[nodiscard]] int numberOfRowsInSection(int s) const override {
        return static_cast<int>(sections.at(static_cast<std::size_t>(s)).rows.size());
    }
    [[nodiscard]] Cell cellForRowAtIndexPath(int s, int r) const override {
        return sections.at(static_cast<std::size_t>(s)).rows.at(static_cast<std::size_t>(r));
    }
};

QVariant role(const TableModel& model, int row, int r) {
    return model.data(model.index(row), r);
}

TEST(TableModel, TitledSectionsBecomeHeaderItemsFollowedByTheirRows) {
    auto table = std::make_shared<FakeTable>();
    table->sections = {{"PDP 0", {Cell{"cid", "1"}, Cell{"apn", "internet"}}},
                       {"PDP 1", {}},
                       {std::nullopt, {Cell{}}}};
    const TableModel model(table);
    ASSERT_EQ(model.rowCount(), 5);
    EXPECT_EQ(role(model, 0, TableModel::KindRole), "header");
    EXPECT_EQ(role(model, 0, TableModel::TextRole), "PDP 0");
    EXPECT_EQ(role(model, 1, TableModel::KindRole), "row");
    EXPECT_EQ(role(model, 1, TableModel::TextRole), "cid");
    EXPECT_EQ(role(model, 1, TableModel::DetailRole), "1");
    EXPECT_EQ(role(model, 1, TableModel::SectionTitleRole), "PDP 0");
    EXPECT_EQ(role(model, 2, TableModel::RowRole), 1);
    EXPECT_EQ(role(model, 3, TableModel::KindRole), "header");  // an empty section keeps its title
    EXPECT_EQ(role(model, 3, TableModel::SectionRole), 1);
    EXPECT_EQ(role(model, 4, TableModel::KindRole), "row");
    EXPECT_EQ(role(model, 4, TableModel::SectionRole), 2);
    EXPECT_FALSE(role(model, 4, TableModel::SectionTitleRole).isValid());
}

TEST(TableModel, TextsLeftAsDequeuedAreUndefinedAndEmptyTextsAreEmpty) {
    auto table = std::make_shared<FakeTable>();
    table->sections = {{std::nullopt, {Cell{}, Cell{"", std::nullopt}}}};
    const TableModel model(table);
    EXPECT_FALSE(role(model, 0, TableModel::TextRole).isValid());
    EXPECT_FALSE(role(model, 0, TableModel::DetailRole).isValid());
    EXPECT_TRUE(role(model, 1, TableModel::TextRole).isValid());
    EXPECT_EQ(role(model, 1, TableModel::TextRole), "");
    EXPECT_EQ(role(model, 1, Qt::DisplayRole), "");
}

TEST(TableModel, RowsAreFoundPastHeaders) {
    auto table = std::make_shared<FakeTable>();
    table->sections = {{"A", {Cell{"a", "1"}}}, {"B", {Cell{"b", "2"}}}, {"C", {}}};
    const TableModel model(table);
    EXPECT_FALSE(model.isRow(0));
    EXPECT_TRUE(model.isRow(1));
    EXPECT_EQ(model.rowFrom(0, 1), 1);
    EXPECT_EQ(model.rowFrom(2, 1), 3);
    EXPECT_EQ(model.rowFrom(4, 1), -1);
    EXPECT_EQ(model.rowFrom(2, -1), 1);
    EXPECT_EQ(model.rowFrom(0, -1), -1);
    EXPECT_EQ(model.indexPath(3), (std::pair{1, 0}));
    EXPECT_EQ(model.indexPath(2), std::nullopt);
    EXPECT_EQ(model.cellAt(3), (Cell{"b", "2"}));
    EXPECT_EQ(model.cellAt(9), std::nullopt);
}

TEST(TableModel, PassesTheModelTesterThroughGrowingChangingAndShrinkingReloads) {
    const test::WarningCatcher catcher;
    auto table = std::make_shared<FakeTable>();
    TableModel model(table);
    const QAbstractItemModelTester tester(&model,
                                          QAbstractItemModelTester::FailureReportingMode::Warning);
    table->sections = {{"A", {Cell{"a", "1"}, Cell{"b", "2"}}}};
    model.reload();
    table->sections = {{"A", {Cell{"a", "9"}}}, {"B", {Cell{"c", "3"}, Cell{}}}};
    model.reload();
    table->sections = {{std::nullopt, {Cell{}}}};
    model.reload();
    table->sections = {};
    model.reload();
    EXPECT_EQ(model.rowCount(), 0);
    EXPECT_TRUE(catcher.warnings().isEmpty()) << catcher.warnings().join('\n').toStdString();
}

TEST(TableModel, PassesTheModelTesterOverTheCategoryScreen) {
    const test::WarningCatcher catcher;
    const auto store = test::emptyStore();
    auto screen = std::make_shared<SecondLevelViewController>(*store);
    screen->setFirstSelection("LTE");
    screen->setSeguedThroughRow("EUTRA Neighbor Info");
    TableModel model(screen);
    const QAbstractItemModelTester tester(&model,
                                          QAbstractItemModelTester::FailureReportingMode::Warning);
    EXPECT_EQ(model.rowCount(), 0);
    test::feedLteSelResel(*store, 3);
    model.reload();
    ASSERT_GT(model.rowCount(), 3);
    EXPECT_EQ(role(model, 0, TableModel::TextRole), "EUTRA Neighbor 0");
    test::feedLteSelResel(*store, 1);
    model.reload();
    EXPECT_EQ(role(model, 0, TableModel::TextRole), "EUTRA Neighbor 0");
    EXPECT_EQ(model.rowCount(), static_cast<int>(store->myLTE().EutraNbrs.at(0).size()) + 1);
    EXPECT_TRUE(catcher.warnings().isEmpty()) << catcher.warnings().join('\n').toStdString();
}

TEST(TableModel, ReloadUpdatesOnlyTheItemsThatChangedWithoutAReset) {
    auto table = std::make_shared<FakeTable>();
    table->sections = {{std::nullopt, {Cell{"a", "1"}, Cell{"b", "2"}, Cell{"c", "3"}}}};
    TableModel model(table);
    QSignalSpy resets(&model, &QAbstractItemModel::modelReset);
    QSignalSpy changes(&model, &QAbstractItemModel::dataChanged);
    QSignalSpy counts(&model, &TableModel::countChanged);
    table->sections[0].rows[1].detail = "20";
    model.reload();
    EXPECT_EQ(resets.count(), 0);
    ASSERT_EQ(changes.count(), 1);
    EXPECT_EQ(changes.at(0).at(0).toModelIndex().row(), 1);
    EXPECT_EQ(counts.count(), 0);
    EXPECT_EQ(role(model, 1, TableModel::DetailRole), "20");

    model.reload();  // nothing changed
    EXPECT_EQ(changes.count(), 1);

    table->sections[0].rows.push_back(Cell{"d", "4"});
    QSignalSpy inserts(&model, &QAbstractItemModel::rowsInserted);
    model.reload();
    ASSERT_EQ(inserts.count(), 1);
    EXPECT_EQ(inserts.at(0).at(1).toInt(), 3);
    EXPECT_EQ(counts.count(), 1);
    EXPECT_EQ(model.count(), 4);
}

}  // namespace
}  // namespace pyx::qt
