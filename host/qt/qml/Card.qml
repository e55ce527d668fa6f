import QtQuick
import Nimbra.Window

// Rows on a rounded ground, with lines between them.
Rectangle {
    id: card

    default property alias content: column.data

    implicitHeight: column.implicitHeight
    radius: Theme.radius
    color: Theme.dark ? "#2a2a30" : Theme.card
    border.width: Theme.strong ? 1 : 0
    border.color: Theme.line

    Column {
        id: column

        width: parent.width
    }
}
