import QtQuick

// Where in what it shows a part of a view stands; nothing where it shows all. Beside the view.
Rectangle {
    id: mark

    property Flickable view
    readonly property real share: view.visibleArea.heightRatio

    anchors.right: view.right
    anchors.rightMargin: 3
    y: Math.round(view.y + Math.max(0, Math.min(1 - share, view.visibleArea.yPosition)) * view.height)
    width: 4
    height: Math.max(24, Math.round(share * view.height))
    radius: 2
    color: Theme.edge
    visible: share < 1
    opacity: view.moving ? 0.9 : 0.4
}
