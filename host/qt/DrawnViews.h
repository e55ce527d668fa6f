#pragma once

#include "platform/views/Geometry.h"

#include <QAbstractListModel>
#include <QString>
#include <functional>
#include <memory>
#include <vector>

namespace nimbra {
class View;
}

namespace nimbra::window {

class WindowMetrics;

/// The views of a tree that have something to draw, back to front, each with the frame that the
/// page has given it: labels, buttons, bars, spinners and pictures. Main queue.
class DrawnViews final : public QAbstractListModel {
    Q_OBJECT

public:
    enum Role {
        /// "label", "button", "bar", "spinner" or "picture".
        KindRole = Qt::UserRole,
        /// In points from the upper left corner of the root.
        FrameRole,
        /// Of a label its text, as a rich text of its own lines; of a button its title.
        TextRole,
        /// The same in letters alone.
        PlainTextRole,
        FontRole,
        OpacityRole,
        IsEnabledRole,
        /// Of a bar, from 0 to 1.
        ProgressRole,
        /// Whether the bar moves there, rather than jumps.
        IsProgressAnimatedRole,
        IsTurningRole,
        /// The URL of a picture.
        SourceRole,
    };

    /// How the views come out in a window.
    struct Look {
        /// The ones that the views were measured with; they outlive the model.
        const WindowMetrics& metrics;
        /// Gives the URL of the picture that a page calls by a name.
        std::function<QString(const std::string& name)> pictureUrl;
        /// Whether the window is for a reader from right to left.
        bool isMirrored = false;
    };

    explicit DrawnViews(Look look);

    /// Shows the tree below `root` as it is now; nothing for null.
    void show(const View* root);

    [[nodiscard]] int rowCount(const QModelIndex& parent = {}) const override;
    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;
    [[nodiscard]] QHash<int, QByteArray> roleNames() const override;

private:
    struct Drawn {
        /// Only to know it again; it may have gone.
        const View* view;
        QHash<int, QVariant> values;

        friend bool operator==(const Drawn&, const Drawn&) = default;
    };

    void collect(const View& view, Point origin, double opacity, std::vector<Drawn>& drawn) const;
    [[nodiscard]] QHash<int, QVariant> valuesOf(const View& view) const;

    const WindowMetrics& _metrics;
    std::function<QString(const std::string& name)> _pictureUrl;
    bool _isMirrored;
    std::vector<Drawn> _drawn;
};

} // namespace nimbra::window
