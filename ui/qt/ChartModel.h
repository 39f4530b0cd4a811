// A chart page's contents for Qt Quick: the history of one chart over the chosen window, as
// one panel per unit (dBm, dB) holding the lines of that unit, all over one time axis. The
// page asks it to refresh (at most once a second while it is shown); a refresh reads the
// history only when points were added to this chart (or the history started over), or when a
// line it draws leaves the window. When only the time moved on (other kinds arrived), the
// window follows it: the time axis scrolls and nothing else is read.
//
// A page is open all day, so a refresh that finds the same lines as before (the common case:
// a point or two more, the oldest ones leaving the window) does not have the page rebuild
// them: it notes which segments changed, the page hands only those their points (extend()),
// and each change to the chart is one change (the window's two ends move together, the value
// range and its rounding too), since Qt Charts lays out every line again on each. A line
// whose points change is emptied before the axes move (clearChanged()), so that each line is
// laid out once a refresh. The work per refresh depends on the window and, for a long one,
// on how wide the page is (columns), never on how long the program has run.
#pragma once

#include <QList>
#include <QObject>
#include <QPointF>
#include <QString>
#include <QStringList>

#include <cstdint>
#include <memory>
#include <vector>

#include "metrics/history/Chart.h"
#include "metrics/history/History.h"
#include "metrics/history/Quantity.h"

class QAbstractSeries;
class QXYSeries;

namespace pyx::qt {

class ChartModel : public QObject {
    Q_OBJECT
    Q_PROPERTY(QString title READ title CONSTANT)
    Q_PROPERTY(
        int windowMinutes READ windowMinutes WRITE setWindowMinutes NOTIFY windowMinutesChanged)
    Q_PROPERTY(QList<int> windowChoices READ windowChoices CONSTANT)
    Q_PROPERTY(bool empty READ empty NOTIFY changed)
    Q_PROPERTY(QString emptyText READ emptyText NOTIFY changed)
    Q_PROPERTY(QString missingText READ missingText NOTIFY changed)
    Q_PROPERTY(int panelCount READ panelCount NOTIFY changed)
    Q_PROPERTY(double fromMs READ fromMs NOTIFY windowMoved)
    Q_PROPERTY(double toMs READ toMs NOTIFY windowMoved)
    Q_PROPERTY(int columns READ columns WRITE setColumns NOTIFY columnsChanged)

  public:
    ChartModel(std::shared_ptr<const History> history, Chart chart, QObject* parent = nullptr);

    [[nodiscard]] QString title() const;
    // The time shown, up to the newest point: 1, 5, 15 or 30 minutes (5 at first).
    [[nodiscard]] int windowMinutes() const { return windowMinutes_; }
    void setWindowMinutes(int minutes);
    [[nodiscard]] static QList<int> windowChoices() { return {1, 5, 15, 30}; }

    // No point of the chart within the window.
    [[nodiscard]] bool empty() const { return panels_.empty(); }
    // What the page says instead of drawing empty axes.
    [[nodiscard]] QString emptyText() const;
    // The quantities of the chart without a point in the window ("No data: RSRQ avg, SINR").
    [[nodiscard]] QString missingText() const { return missingText_; }
    [[nodiscard]] int panelCount() const { return static_cast<int>(panels_.size()); }
    [[nodiscard]] double fromMs() const { return fromMs_; }
    // How many pixels wide the lines are drawn (0, the first, for no limit). Where the window
    // holds several slots per pixel, the slots of each run that still fits within a pixel are
    // drawn as one, their lowest and highest value: the points handed to the chart depend on
    // the width, not on the window (half an hour on a phone is two slots to a pixel).
    [[nodiscard]] int columns() const { return columns_; }
    void setColumns(int columns);
    [[nodiscard]] double toMs() const { return toMs_; }

    // The panel's unit ("dBm"), its lines' names, and the value range drawn.
    Q_INVOKABLE QString unit(int panel) const;
    Q_INVOKABLE QStringList seriesNames(int panel) const;
    // What the names of a panel of neighbours are made of ("EARFCN/PCI"); empty otherwise.
    Q_INVOKABLE QString caption(int panel) const;
    Q_INVOKABLE double minimum(int panel) const;
    Q_INVOKABLE double maximum(int panel) const;
    // A line is drawn as one or more segments: it breaks where its points stop for a while
    // (a neighbour that was not among the strongest, a kind that paused).
    Q_INVOKABLE int segmentCount(int panel) const;
    // The line (index into seriesNames) that segment belongs to.
    Q_INVOKABLE int segmentLine(int panel, int segment) const;
    // The points of a segment: x in ms since 1970, each slot as its minimum and maximum in
    // the order they came.
    Q_INVOKABLE QList<QPointF> points(int panel, int segment) const;
    // Puts those points into a line series of the chart view (replacing its points).
    Q_INVOKABLE void fill(int panel, int segment, QObject* series) const;
    // After extended(): gives a line series the segment's points when they changed since the
    // refresh before (one change, so the chart lays the line out once); a series whose points
    // are as they were is left alone.
    Q_INVOKABLE void extend(int panel, int segment, QObject* series) const;
    // Empties a line series unless it holds the segment's points as they were (after changed(),
    // every one): called before the axes move, so that moving them lays out only the lines that
    // keep their points, and each of the others is laid out once, when extend() or fill() gives
    // it its points.
    Q_INVOKABLE void clearChanged(int panel, int segment, QObject* series) const;
    // Sets a date-time axis to the window in one change (its minimum and maximum set one after
    // the other would lay every line out twice).
    Q_INVOKABLE void showWindow(QObject* axis) const;
    // Sets a value axis to the panel's value range rounded out to nice numbers (as
    // applyNiceNumbers() rounds it, from the axis's tick count) in one change of range.
    Q_INVOKABLE void showRange(int panel, QObject* axis) const;

    // Reads the history again if points were added to the chart since it was last read, or a
    // line would leave the window, and emits changed (and windowMoved), or extended (and
    // windowMoved) when the panels, lines and segments are the ones drawn already; when only
    // the newest time moved on, moves the window to it and emits windowMoved alone.
    Q_INVOKABLE void refresh();

  signals:
    // The lines, panels and texts changed (the window too).
    void changed();
    // The same lines, segments and texts as before; points were added, changed or left the
    // window, and the value range may have moved (the window too): extend() each segment.
    void extended();
    // The window's times changed.
    void windowMoved();
    void windowMinutesChanged();
    void columnsChanged();

  private:
    // Whether a segment's points differ from the refresh before.
    enum class Change { Unknown, Same, Changed };
    struct Panel {
        Unit unit = Unit::Dbm;
        QStringList names;
        QString caption;
        std::vector<QList<QPointF>> segments;
        std::vector<int> segmentLines;
        std::vector<Change> changes;  // one per segment, after extended()
        double minimum = 0;
        double maximum = 0;
    };
    [[nodiscard]] const Panel* panelAt(int panel) const;
    // The points a line series is to draw for segment `index` of a panel when they are not the
    // ones it holds (changed since the refresh before, or not as many); nullptr when they are,
    // or for no such series or segment.
    [[nodiscard]] const QList<QPointF>* staleSegment(int panel, int index,
                                                     const QXYSeries* line) const;
    void rebuild();
    // Whether the panels now draw the same lines and segments as before, and if so each
    // segment's change since.
    [[nodiscard]] bool sameShape(const std::vector<Panel>& before);

    std::shared_ptr<const History> history_;
    Chart chart_;
    int windowMinutes_ = 5;
    int columns_ = 0;
    std::vector<Panel> panels_;
    QString missingText_;
    double fromMs_ = 0;
    double toMs_ = 0;
    std::uint64_t readRevision_ = 0;  // the chart's revision of the history last read
    // The oldest of the drawn lines' newest points: once the window starts after it, that
    // line leaves the chart.
    double leavesAfterMs_ = 0;
};

}  // namespace pyx::qt
