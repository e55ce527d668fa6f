import QtQuick
import Nimbra.Window

// Leads on, or with `back` to where one came from. Drawn, as no font is sure to have it.
Item {
    id: chevron

    property bool back: false
    property color color: Theme.faint
    readonly property bool pointsLeft: back !== texts.rightToLeft

    implicitWidth: 8 * Theme.symbol
    implicitHeight: 14 * Theme.symbol

    Rectangle {
        x: (chevron.width - width) / 2
        y: (chevron.height - height) / 2 - 2.9 * Theme.symbol
        width: 9 * Theme.symbol
        height: 2 * Theme.symbol
        radius: height / 2
        color: chevron.color
        antialiasing: true
        rotation: chevron.pointsLeft ? -45 : 45
    }
    Rectangle {
        x: (chevron.width - width) / 2
        y: (chevron.height - height) / 2 + 2.9 * Theme.symbol
        width: 9 * Theme.symbol
        height: 2 * Theme.symbol
        radius: height / 2
        color: chevron.color
        antialiasing: true
        rotation: chevron.pointsLeft ? 45 : -45
    }
}
