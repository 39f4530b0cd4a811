#include "ui/qt/TableModel.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace pyx::qt {
namespace {

QVariant text(const std::optional<std::string>& value) {
    return value ? QVariant(QString::fromStdString(*value)) : QVariant();
}

}  // namespace

TableModel::TableModel(std::shared_ptr<const TableController> controller, QObject* parent)
    : QAbstractListModel(parent), controller_(std::move(controller)), items_(snapshot()) {}

std::vector<TableModel::Item> TableModel::snapshot() const {
    std::vector<Item> items;
    const int sections = controller_->numberOfSections();
    for (int section = 0; section < sections; ++section) {
        std::optional<std::string> title = controller_->titleForHeaderInSection(section);
        if (title) items.push_back(Item{true, section, 0, title, Cell{}});
        const int rows = controller_->numberOfRowsInSection(section);
        for (int row = 0; row < rows; ++row)
            items.push_back(
                Item{false, section, row, title, controller_->cellForRowAtIndexPath(section, row)});
    }
    return items;
}

int TableModel::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : count();
}

QVariant TableModel::data(const QModelIndex& index, int role) const {
    if (!checkIndex(index, CheckIndexOption::IndexIsValid | CheckIndexOption::ParentIsInvalid))
        return {};
    const Item& item = items_[static_cast<std::size_t>(index.row())];
    switch (role) {
        case KindRole:
            return item.header ? QStringLiteral("header") : QStringLiteral("row");
        case SectionTitleRole:
            return text(item.title);
        case Qt::DisplayRole:
        case TextRole:
            return item.header ? text(item.title) : text(item.cell.text);
        case DetailRole:
            return text(item.cell.detail);
        case SectionRole:
            return item.section;
        case RowRole:
            return item.header ? QVariant() : QVariant(item.row);
        default:
            return {};
    }
}

QHash<int, QByteArray> TableModel::roleNames() const {
    return {{Qt::DisplayRole, "display"},
            {KindRole, "kind"},
            {SectionTitleRole, "sectionTitle"},
            {TextRole, "text"},
            {DetailRole, "detail"},
            {SectionRole, "section"},
            {RowRole, "row"}};
}

void TableModel::reload() {
    std::vector<Item> fresh = snapshot();
    const std::size_t before = items_.size();
    const std::size_t common = std::min(items_.size(), fresh.size());
    if (fresh.size() < items_.size()) {
        beginRemoveRows({}, static_cast<int>(fresh.size()), static_cast<int>(items_.size()) - 1);
        items_.resize(fresh.size());
        endRemoveRows();
    }
    for (std::size_t i = 0; i < common; ++i) {
        if (items_[i] == fresh[i]) continue;
        items_[i] = fresh[i];
        const QModelIndex changed = index(static_cast<int>(i));
        emit dataChanged(changed, changed);
    }
    if (fresh.size() > items_.size()) {
        beginInsertRows({}, static_cast<int>(items_.size()), static_cast<int>(fresh.size()) - 1);
        items_.insert(items_.end(),
                      std::make_move_iterator(fresh.begin() + static_cast<long>(common)),
                      std::make_move_iterator(fresh.end()));
        endInsertRows();
    }
    if (items_.size() != before) emit countChanged();
}

bool TableModel::isRow(int index) const {
    return index >= 0 && index < count() && !items_[static_cast<std::size_t>(index)].header;
}

int TableModel::rowFrom(int index, int step) const {
    if (step == 0) return isRow(index) ? index : -1;
    for (int i = index; i >= 0 && i < count(); i += step)
        if (isRow(i)) return i;
    return -1;
}

std::optional<std::pair<int, int>> TableModel::indexPath(int index) const {
    if (!isRow(index)) return std::nullopt;
    const Item& item = items_[static_cast<std::size_t>(index)];
    return std::pair{item.section, item.row};
}

std::optional<Cell> TableModel::cellAt(int index) const {
    if (!isRow(index)) return std::nullopt;
    return items_[static_cast<std::size_t>(index)].cell;
}

}  // namespace pyx::qt
