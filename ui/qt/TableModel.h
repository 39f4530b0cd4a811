// A table screen as one flat list for Qt Quick: each titled section contributes a header item,
// followed by its rows. The model keeps the answers of its last reload, so that what the view
// counts and what it reads agree until the next reload.
#pragma once

#include <QAbstractListModel>
#include <QHash>
#include <QVariant>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "ui/TableController.h"

namespace pyx::qt {

class TableModel : public QAbstractListModel {
    Q_OBJECT
    Q_PROPERTY(int count READ count NOTIFY countChanged)

  public:
    enum Role {
        KindRole = Qt::UserRole + 1,  // "header" or "row"
        SectionTitleRole,             // the section's title; undefined when untitled
        TextRole,                     // main text; undefined when left as dequeued
        DetailRole,                   // detail text; undefined when left as dequeued
        SectionRole,
        RowRole,
    };
    Q_ENUM(Role)

    explicit TableModel(std::shared_ptr<const TableController> controller,
                        QObject* parent = nullptr);

    [[nodiscard]] int rowCount(const QModelIndex& parent = QModelIndex()) const override;
    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;
    [[nodiscard]] QHash<int, QByteArray> roleNames() const override;
    [[nodiscard]] int count() const { return static_cast<int>(items_.size()); }

    // Asks the controller again and updates the items that changed; items that stay the same
    // keep their place, so the view keeps its scroll position and current row.
    Q_INVOKABLE void reload();

    // Whether item index is a row (not a header, not out of range).
    Q_INVOKABLE bool isRow(int index) const;
    // The first row at or after index (step 1) or at or before it (step -1); -1 when none.
    Q_INVOKABLE int rowFrom(int index, int step) const;
    // The table position of item index; nullopt for a header or an index out of range.
    [[nodiscard]] std::optional<std::pair<int, int>> indexPath(int index) const;
    [[nodiscard]] std::optional<Cell> cellAt(int index) const;

  signals:
    void countChanged();

  private:
    struct Item {
        bool header = false;
        int section = 0;
        int row = 0;
        std::optional<std::string> title;
        Cell cell;
        friend bool operator==(const Item&, const Item&) = default;
    };
    [[nodiscard]] std::vector<Item> snapshot() const;

    std::shared_ptr<const TableController> controller_;
    std::vector<Item> items_;
};

}  // namespace pyx::qt
