import QtQuick

// A padlock: what stands beside it cannot be used.
Item {
    id: lock

    implicitWidth: 12
    implicitHeight: 16

    Rectangle {
        x: 2
        width: 8
        height: 12
        radius: 4
        color: "transparent"
        border.width: 2
        border.color: Theme.faint
    }
    Rectangle {
        y: 7
        width: 12
        height: 9
        radius: 2
        color: Theme.faint
    }
}
