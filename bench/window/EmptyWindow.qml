import QtQuick

Window {
    width: 390
    height: 760
    visible: true
}
