<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="fi">
<context>
    <name></name>
    <message id="gallery-title">
        <source></source>
        <translation>Asetusgalleria</translation>
    </message>
    <message id="gallery-back">
        <source></source>
        <translation>Takaisin</translation>
    </message>
    <message id="gallery-language">
        <source></source>
        <translation>Kieli</translation>
    </message>
    <message id="gallery-quick-actions">
        <source></source>
        <translation>Pikatoiminnot</translation>
    </message>
    <message id="gallery-quick-actions-about">
        <source></source>
        <translation>Napauta toimintoa kuten kotinäkymässä ja katso, mikä kutsu lähtee.</translation>
    </message>
    <message id="gallery-quick-actions-home">
        <source></source>
        <translation>Kotinäkymässä</translation>
    </message>
    <message id="gallery-quick-actions-none">
        <source></source>
        <translation>Yhtään pikatoimintoa ei ole käytössä.</translation>
    </message>
    <message id="gallery-quick-actions-language">
        <source></source>
        <translation>Kielen vaihtuessa omaa käännöstiedostoa käyttävät toiminnot säilyttävät nimensä, kunnes sivu avataan uudelleen.</translation>
    </message>
    <message id="gallery-received-calls">
        <source></source>
        <translation>Vastaanotetut kutsut</translation>
    </message>
    <message id="gallery-received-calls-none">
        <source></source>
        <translation>Ei vielä mitään: napauta toimintoa.</translation>
    </message>
    <message id="gallery-quick-actions-settings">
        <source></source>
        <translation>Valitse pikatoiminnot</translation>
    </message>
    <message id="gallery-quick-actions-settings-about">
        <source></source>
        <translation>Ota toimintoja käyttöön ja järjestä ne vetämällä.</translation>
    </message>
    <message id="gallery-quick-actions-order">
        <source></source>
        <translation>Järjestys kotinäkymässä</translation>
    </message>
    <message id="gallery-quick-actions-available">
        <source></source>
        <translation>Saatavilla olevat toiminnot</translation>
    </message>
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>Uusi herätys</translation>
    </message>
</context>
</TS>
