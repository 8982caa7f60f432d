import QtQuick 2.15
import QtQuick.Controls 2.15
import com.marlo.settings.system 1.0

ListView {
    width: 360; height: 640
    model: QuickActionsModel { id: actions }
    delegate: ItemDelegate {
        text: model.title || ""
        onClicked: actions.triggerAction(index)
    }
}
