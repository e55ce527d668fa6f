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

    Repeater {
        model: 2

        Rectangle {
            required property int index

            x: (chevron.width - width) / 2
            y: chevron.height / 2 - height / 2 + (index === 0 ? -2.9 : 2.9)
            width: 9
            height: 2
            radius: 1
            color: chevron.color
            antialiasing: true
            rotation: (index === 0) === chevron.pointsLeft ? -45 : 45
        }
    }
}
