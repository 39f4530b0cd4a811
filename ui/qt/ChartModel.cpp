#include "ui/qt/ChartModel.h"

#include <QDateTime>
#include <QDateTimeAxis>
#include <QValueAxis>
#include <QXYSeries>

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace pyx::qt {
namespace {

// A line breaks where its points stop for longer than this and than kGapSpacings times
// its mean spacing in the window (so that a quantity reported seldom still draws a line).
constexpr double kGapMs = 10'000;
constexpr double kGapSpacings = 5;

// The index of a ring's first bucket at fromMs or later (its buckets are in time order), so
// that reading the window costs what the window holds, not what the ring holds.
std::size_t firstInWindow(const SeriesRing& ring, double fromMs) {
    std::size_t low = 0;
    std::size_t high = ring.size();
    while (low < high) {
        const std::size_t middle = low + (high - low) / 2;
        if (ring.at(middle).timeMs < fromMs)
            low = middle + 1;
        else
            high = middle;
    }
    return low;
}

// The slots of one column of pixels merged, drawn as their lowest and highest value (one
// point when those are equal), the one that came last drawn last, at the first slot's time.
struct Column {
    bool open = false;
    std::int64_t number = 0;
    double timeMs = 0;
    float min = 0;
    float max = 0;
    bool endsHigh = false;

    void start(std::int64_t columnNumber, const Bucket& b) {
        open = true;
        number = columnNumber;
        timeMs = b.timeMs;
        min = b.min;
        max = b.max;
        endsHigh = b.last == b.max;
    }
    // A later slot: an end it reaches came after the ends of the slots before it.
    void merge(const Bucket& b) {
        const bool lower = b.min <= min;
        const bool higher = b.max >= max;
        if (lower && higher)
            endsHigh = b.last == b.max;
        else if (lower || higher)
            endsHigh = higher;
        min = std::min(min, b.min);
        max = std::max(max, b.max);
    }
    void drawInto(QList<QPointF>& line) {
        open = false;
        if (min == max) {
            line.append(QPointF(timeMs, min));
            return;
        }
        line.append(QPointF(timeMs, endsHigh ? min : max));
        line.append(QPointF(timeMs + 1, endsHigh ? max : min));
    }
};

}  // namespace

ChartModel::ChartModel(std::shared_ptr<const History> history, Chart chart, QObject* parent)
    : QObject(parent), history_(std::move(history)), chart_(chart) {
    rebuild();
}

QString ChartModel::title() const {
    return QString::fromUtf8(chartTitle(chart_));
}

void ChartModel::setWindowMinutes(int minutes) {
    if (minutes == windowMinutes_ || !windowChoices().contains(minutes)) return;
    windowMinutes_ = minutes;
    emit windowMinutesChanged();
    rebuild();
    emit changed();
    emit windowMoved();
}

void ChartModel::setColumns(int columns) {
    if (columns == columns_ || columns < 0) return;
    columns_ = columns;
    emit columnsChanged();
    rebuild();
    emit changed();
    emit windowMoved();
}

QString ChartModel::emptyText() const {
    if (!empty()) return {};
    if (!history_->newestMs())
        return QStringLiteral(
            "Nothing has arrived yet. The chart starts with the first "
            "measurement.");
    return QStringLiteral(
               "No %1 measurement in the last %2 min. The source has not reported "
               "any of: %3.")
        .arg(title(), QString::number(windowMinutes_), missingText_);
}

const ChartModel::Panel* ChartModel::panelAt(int panel) const {
    if (panel < 0 || panel >= panelCount()) return nullptr;
    return &panels_[static_cast<std::size_t>(panel)];
}

QString ChartModel::unit(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? QString::fromUtf8(unitText(p->unit)) : QString();
}

QStringList ChartModel::seriesNames(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? p->names : QStringList();
}

QString ChartModel::caption(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? p->caption : QString();
}

double ChartModel::minimum(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? p->minimum : 0;
}

double ChartModel::maximum(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? p->maximum : 0;
}

int ChartModel::segmentCount(int panel) const {
    const Panel* p = panelAt(panel);
    return p ? static_cast<int>(p->segments.size()) : 0;
}

int ChartModel::segmentLine(int panel, int segment) const {
    const Panel* p = panelAt(panel);
    if (p == nullptr || segment < 0 || segment >= static_cast<int>(p->segments.size())) return -1;
    return p->segmentLines[static_cast<std::size_t>(segment)];
}

QList<QPointF> ChartModel::points(int panel, int segment) const {
    const Panel* p = panelAt(panel);
    if (p == nullptr || segment < 0 || segment >= static_cast<int>(p->segments.size())) return {};
    return p->segments[static_cast<std::size_t>(segment)];
}

void ChartModel::fill(int panel, int index, QObject* series) const {
    if (auto* const line = qobject_cast<QXYSeries*>(series)) line->replace(points(panel, index));
}

const QList<QPointF>* ChartModel::staleSegment(int panel, int index, const QXYSeries* line) const {
    const Panel* p = panelAt(panel);
    if (line == nullptr || p == nullptr || index < 0 ||
        index >= static_cast<int>(p->segments.size()))
        return nullptr;
    const auto at = static_cast<std::size_t>(index);
    if (p->changes[at] == Change::Same && line->count() == p->segments[at].size()) return nullptr;
    return &p->segments[at];
}

void ChartModel::extend(int panel, int index, QObject* series) const {
    auto* const line = qobject_cast<QXYSeries*>(series);
    if (const QList<QPointF>* points = staleSegment(panel, index, line)) line->replace(*points);
}

void ChartModel::clearChanged(int panel, int index, QObject* series) const {
    auto* const line = qobject_cast<QXYSeries*>(series);
    if (line != nullptr && line->count() > 0 && staleSegment(panel, index, line) != nullptr)
        line->replace(QList<QPointF>());
}

void ChartModel::showRange(int panel, QObject* axis) const {
    auto* const value = qobject_cast<QValueAxis*>(axis);
    const Panel* p = panelAt(panel);
    if (value == nullptr || p == nullptr) return;
    // Rounded on an axis of no chart: on the drawn one, the range and the rounding would each
    // lay every line out again.
    QValueAxis nice;
    nice.setTickCount(value->tickCount());
    nice.setRange(p->minimum, p->maximum);
    nice.applyNiceNumbers();
    value->setTickCount(nice.tickCount());
    value->setRange(nice.min(), nice.max());
}

void ChartModel::showWindow(QObject* axis) const {
    if (auto* const time = qobject_cast<QDateTimeAxis*>(axis))
        time->setRange(QDateTime::fromMSecsSinceEpoch(static_cast<qint64>(fromMs_)),
                       QDateTime::fromMSecsSinceEpoch(static_cast<qint64>(toMs_)));
}

bool ChartModel::sameShape(const std::vector<Panel>& before) {
    if (before.size() != panels_.size()) return false;
    for (std::size_t i = 0; i < panels_.size(); ++i) {
        const Panel& old = before[i];
        const Panel& now = panels_[i];
        if (old.unit != now.unit || old.names != now.names || old.caption != now.caption ||
            old.segmentLines != now.segmentLines)
            return false;
    }
    for (std::size_t i = 0; i < panels_.size(); ++i) {
        Panel& now = panels_[i];
        for (std::size_t k = 0; k < now.segments.size(); ++k)
            now.changes[k] =
                before[i].segments[k] == now.segments[k] ? Change::Same : Change::Changed;
    }
    return true;
}

void ChartModel::refresh() {
    const double newestMs = history_->newestMs().value_or(0);
    const double windowMs = windowMinutes_ * 60'000.0;
    const bool moved = newestMs != toMs_;
    if (history_->revision(chart_) != readRevision_ ||
        (moved && !panels_.empty() && newestMs - windowMs > leavesAfterMs_)) {
        const std::vector<Panel> before = std::move(panels_);
        const QString missingBefore = missingText_;
        rebuild();
        if (missingText_ == missingBefore && sameShape(before))
            emit extended();
        else
            emit changed();
        emit windowMoved();
    } else if (moved) {
        toMs_ = newestMs;
        fromMs_ = toMs_ - windowMs;
        emit windowMoved();
    }
}

void ChartModel::rebuild() {
    readRevision_ = history_->revision(chart_);
    panels_.clear();
    toMs_ = history_->newestMs().value_or(0);
    fromMs_ = toMs_ - windowMinutes_ * 60'000.0;

    // Slots to a column: as many as fit within a pixel, at least one.
    const History::Limits& limits = history_->limits();
    const double slotMs = limits.windowMs / static_cast<double>(limits.pointsPerSeries);
    const auto slotsPerColumn = static_cast<std::int64_t>(
        std::max(1.0, columns_ > 0 ? std::floor((toMs_ - fromMs_) / (columns_ * slotMs)) : 1.0));

    const auto series = history_->seriesOf(chart_, fromMs_);
    leavesAfterMs_ = std::numeric_limits<double>::infinity();
    for (const Series* s : series)
        leavesAfterMs_ = std::min(leavesAfterMs_, s->points().newest().timeMs);
    // Panels in the order their units first occur among the chart's quantities.
    const auto quantities = historyQuantities();
    std::vector<bool> present(quantities.size(), false);
    for (const Series* s : series) present[s->key().quantity] = true;
    QStringList missing;
    for (std::size_t i = 0; i < quantities.size(); ++i) {
        const Quantity& q = quantities[i];
        if (q.chart != chart_) continue;
        if (!present[i]) {
            const QString name = QString::fromUtf8(q.name);
            if (!missing.contains(name)) missing << name;
            continue;
        }
        const bool known = std::any_of(panels_.begin(), panels_.end(),
                                       [&](const Panel& p) { return p.unit == q.unit; });
        if (!known) {
            const bool pairs = q.pick == Pick::Strongest && !q.keyB.empty();
            panels_.push_back(Panel{
                q.unit,
                {},
                pairs ? QString::fromUtf8(q.labelA) + '/' + QString::fromUtf8(q.labelB) : QString(),
                {},
                {},
                {},
                0,
                0});
        }
    }
    missingText_ = missing.join(QStringLiteral(", "));

    for (Panel& panel : panels_) {
        double low = std::numeric_limits<double>::infinity();
        double high = -std::numeric_limits<double>::infinity();
        for (const Series* s : series) {
            if (s->quantity().unit != panel.unit) continue;
            const int lineIndex = static_cast<int>(panel.names.size());
            panel.names << QString::fromStdString(s->label());
            QList<QPointF> line;
            const SeriesRing& ring = s->points();
            const std::size_t first = firstInWindow(ring, fromMs_);
            const std::size_t shown = ring.size() - first;
            const double firstMs = shown > 0 ? ring.at(first).timeMs : 0;
            const double spacing =
                shown > 1 ? (ring.newest().timeMs - firstMs) / static_cast<double>(shown - 1) : 0;
            const double gapMs = std::max(kGapMs, kGapSpacings * spacing);
            double previousMs = -std::numeric_limits<double>::infinity();
            Column column;
            for (std::size_t i = first; i < ring.size(); ++i) {
                const Bucket& b = ring.at(i);
                if (b.timeMs - previousMs > gapMs && column.open) {
                    column.drawInto(line);
                    panel.segments.push_back(std::move(line));
                    panel.segmentLines.push_back(lineIndex);
                    line = QList<QPointF>();
                }
                previousMs = b.timeMs;
                low = std::min(low, static_cast<double>(b.min));
                high = std::max(high, static_cast<double>(b.max));
                const std::int64_t number = b.slot / slotsPerColumn;
                if (column.open && column.number == number) {
                    column.merge(b);
                    continue;
                }
                if (column.open) column.drawInto(line);
                column.start(number, b);
            }
            if (column.open) {
                column.drawInto(line);
                panel.segments.push_back(std::move(line));
                panel.segmentLines.push_back(lineIndex);
            }
        }
        panel.changes.assign(panel.segments.size(), Change::Unknown);
        // Room above and below the lines, and at least a few units of range.
        const double span = std::max(high - low, 4.0);
        const double middle = (high + low) / 2;
        panel.minimum = std::floor(middle - span * 0.6);
        panel.maximum = std::ceil(middle + span * 0.6);
    }
}

}  // namespace pyx::qt
