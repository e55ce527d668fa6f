import QtQuick
import Nimbra.Window

// Leads on, or with `back` to where one came from. Drawn, as no font is sure to have it.
Item {
    id: chevron

    property bool back: false
    property color color: Theme.faint
    readonly property bool pointsLeft: back !== texts.rightToLeft

    implicitWidth: 8
    implicitHeight: 14

    Rectangle {
        x: (chevron.width - width) / 2
        y: (chevron.height - height) / 2 - 2.9
        width: 9
        height: 2
        radius: 1
        color: chevron.color
        antialiasing: true
        rotation: chevron.pointsLeft ? -45 : 45
    }
    Rectangle {
        x: (chevron.width - width) / 2
        y: (chevron.height - height) / 2 + 2.9
        width: 9
        height: 2
        radius: 1
        color: chevron.color
        antialiasing: true
        rotation: chevron.pointsLeft ? 45 : -45
    }
}
