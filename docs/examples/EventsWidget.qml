import QtQuick 2.15
import QtQuick.Controls 2.15

// The width comes from the home screen, the height from the widget.
Column {
    Label {
        width: parent.width
        //% "Sunny, %1 °C"
        text: qsTrId("weather-widget-forecast").arg(21)
        wrapMode: Text.Wrap
    }
}
