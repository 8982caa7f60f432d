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
    <message id="gallery-events-widgets">
        <source></source>
        <translation>Tapahtumawidgetit</translation>
    </message>
    <message id="gallery-events-widgets-about">
        <source></source>
        <translation>Valitse tapahtumanäkymän widgetit ja katso, mitkä ovat saatavilla.</translation>
    </message>
    <message id="gallery-events-widgets-available">
        <source></source>
        <translation>Tapahtumanäkymässä</translation>
    </message>
    <message id="gallery-events-widgets-unavailable">
        <source></source>
        <translation>Ei saatavilla tässä laitteessa</translation>
    </message>
    <message id="gallery-events-widgets-first-choice">
        <source></source>
        <translation>Ensimmäiseen valintaan asti widgetit noudattavat oletuksiaan. Ensimmäinen valinta ottaa kaikki muut käyttöön.</translation>
    </message>
    <message id="gallery-events-widgets-device">
        <source></source>
        <translation>Laite</translation>
    </message>
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Askelmittari</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>Askelwidget on saatavilla, kun askelmittarin tiedosto on olemassa. Kytkin luo ja poistaa tiedoston.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Nimet lauseena</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>Käytössä olevat yhtenä luettelona valitulla kielellä.</translation>
    </message>
    <message id="gallery-titles-widgets">
        <source></source>
        <translation>Käytössä olevat widgetit</translation>
    </message>
    <message id="gallery-titles-actions">
        <source></source>
        <translation>Käytössä olevat pikatoiminnot</translation>
    </message>
    <message id="gallery-titles-none">
        <source></source>
        <translation>Mikään ei ole käytössä.</translation>
    </message>
    <message id="gallery-card">
        <source></source>
        <translation>Muistikortti</translation>
    </message>
    <message id="gallery-card-about">
        <source></source>
        <translation>Alusta kortti, liitä ja irrota se ja seuraa vaiheita.</translation>
    </message>
    <message id="gallery-card-state">
        <source></source>
        <translation>Kortti</translation>
    </message>
    <message id="gallery-card-status">
        <source></source>
        <translation>Tila</translation>
    </message>
    <message id="gallery-card-file-system">
        <source></source>
        <translation>Tiedostojärjestelmä</translation>
    </message>
    <message id="gallery-card-unknown">
        <source></source>
        <translation>Ei vielä tiedossa</translation>
    </message>
    <message id="gallery-card-format">
        <source></source>
        <translation>Alusta: %1</translation>
    </message>
    <message id="gallery-card-mount">
        <source></source>
        <translation>Liitä</translation>
    </message>
    <message id="gallery-card-unmount">
        <source></source>
        <translation>Irrota</translation>
    </message>
    <message id="gallery-card-question">
        <source></source>
        <translation>Tyhjennetäänkö kortti?</translation>
    </message>
    <message id="gallery-card-question-text">
        <source></source>
        <translation>Kaikki kortilla oleva katoaa.</translation>
    </message>
    <message id="gallery-card-erase">
        <source></source>
        <translation>Tyhjennä</translation>
    </message>
    <message id="gallery-card-cancel">
        <source></source>
        <translation>Peruuta</translation>
    </message>
    <message id="gallery-card-steps">
        <source></source>
        <translation>Vaiheet</translation>
    </message>
    <message id="gallery-card-idle">
        <source></source>
        <translation>Valmis</translation>
    </message>
    <message id="gallery-card-unmounting">
        <source></source>
        <translation>Irrotetaan</translation>
    </message>
    <message id="gallery-card-formatting">
        <source></source>
        <translation>Alustetaan</translation>
    </message>
    <message id="gallery-card-removing-files">
        <source></source>
        <translation>Poistetaan tiedostoja</translation>
    </message>
    <message id="gallery-card-mounting">
        <source></source>
        <translation>Liitetään</translation>
    </message>
    <message id="gallery-card-probing">
        <source></source>
        <translation>Tutkitaan korttia</translation>
    </message>
    <message id="gallery-card-error">
        <source></source>
        <translation>Epäonnistui</translation>
    </message>
    <message id="gallery-card-failed">
        <source></source>
        <translation>Korttia ei voitu liittää tai irrottaa.</translation>
    </message>
    <message id="gallery-card-device-busy">
        <source></source>
        <translation>Kortti on käytössä. Sulje sitä käyttävät sovellukset ja yritä uudelleen.</translation>
    </message>
    <message id="gallery-card-already-mounted">
        <source></source>
        <translation>Kortti on jo liitetty.</translation>
    </message>
    <message id="gallery-card-not-mounted">
        <source></source>
        <translation>Korttia ei ole liitetty.</translation>
    </message>
    <message id="gallery-card-other-user">
        <source></source>
        <translation>Toinen käyttäjä on liittänyt kortin.</translation>
    </message>
    <message id="gallery-card-not-authorized">
        <source></source>
        <translation>Tämä ei ole sallittua.</translation>
    </message>
    <message id="gallery-card-not-supported">
        <source></source>
        <translation>Korttia ei voi liittää tähän laitteeseen.</translation>
    </message>
    <message id="gallery-card-timed-out">
        <source></source>
        <translation>Kortin käsittely kesti liian kauan.</translation>
    </message>
    <message id="gallery-card-service">
        <source></source>
        <translation>Levypalvelu</translation>
    </message>
    <message id="gallery-card-in-use">
        <source></source>
        <translation>Kortti on käytössä</translation>
    </message>
    <message id="gallery-card-forbidden">
        <source></source>
        <translation>Kukaan ei saa tehdä tätä</translation>
    </message>
    <message id="gallery-card-service-note">
        <source></source>
        <translation>Tämä ei ole oikea kortti: galleria esittää levypalvelua ja alustusohjelmaa.</translation>
    </message>
    <message id="gallery-sample-new-alarm">
        <source></source>
        <translation>Uusi herätys</translation>
    </message>
    <message id="settings_location-la-no_agreement_text_found">
        <source></source>
        <translation>Palvelun ehtoja ei löytynyt.</translation>
    </message>
    <message id="gallery-location">
        <source></source>
        <translation>Sijainti</translation>
    </message>
    <message id="gallery-location-about">
        <source></source>
        <translation>Kytke paikannuspalveluja, tallenna ja palauta kytkimet ja lue, mitä hyväksytään.</translation>
    </message>
    <message id="gallery-location-services">
        <source></source>
        <translation>Paikannuspalvelut</translation>
    </message>
    <message id="gallery-location-gps">
        <source></source>
        <translation>Satelliittipaikannus (GPS)</translation>
    </message>
    <message id="gallery-location-mls">
        <source></source>
        <translation>Verkkopaikannus (MLS)</translation>
    </message>
    <message id="gallery-location-mls-online">
        <source></source>
        <translation>MLS-verkkoavustus</translation>
    </message>
    <message id="gallery-location-here">
        <source></source>
        <translation>HERE-paikannus</translation>
    </message>
    <message id="gallery-location-agree-first">
        <source></source>
        <translation>Verkkopalvelun voi kytkeä, kun sen ehdot on hyväksytty.</translation>
    </message>
    <message id="gallery-location-custom">
        <source></source>
        <translation>Omat asetukset</translation>
    </message>
    <message id="gallery-location-custom-enabled">
        <source></source>
        <translation>Käytä omia asetuksia</translation>
    </message>
    <message id="gallery-location-save">
        <source></source>
        <translation>Tallenna</translation>
    </message>
    <message id="gallery-location-restore">
        <source></source>
        <translation>Palauta</translation>
    </message>
    <message id="gallery-location-custom-note">
        <source></source>
        <translation>Tallennetut kytkimet voi palauttaa myöhemmin, myös muista sovelluksista.</translation>
    </message>
    <message id="gallery-location-mls-terms">
        <source></source>
        <translation>MLS-verkkoavustuksen ehdot</translation>
    </message>
    <message id="gallery-location-here-terms">
        <source></source>
        <translation>HERE-paikannuksen ehdot</translation>
    </message>
    <message id="gallery-location-agree">
        <source></source>
        <translation>Hyväksyn</translation>
    </message>
    <message id="gallery-location-withdraw">
        <source></source>
        <translation>Peru suostumus</translation>
    </message>
    <message id="gallery-cover">
        <source></source>
        <translation>Älykuori</translation>
    </message>
    <message id="gallery-cover-about">
        <source></source>
        <translation>Kiinnitä ja irrota kuori ja katso, miten sivu seuraa kuoripalvelua.</translation>
    </message>
    <message id="gallery-cover-info">
        <source></source>
        <translation>Mitä palvelu kertoo</translation>
    </message>
    <message id="gallery-cover-id">
        <source></source>
        <translation>Tunniste</translation>
    </message>
    <message id="gallery-cover-none">
        <source></source>
        <translation>Ei kuorta</translation>
    </message>
    <message id="gallery-cover-daemon">
        <source></source>
        <translation>Kuoripalvelu</translation>
    </message>
    <message id="gallery-cover-ready">
        <source></source>
        <translation>Valmis</translation>
    </message>
    <message id="gallery-cover-not-ready">
        <source></source>
        <translation>Ei valmis</translation>
    </message>
    <message id="gallery-cover-device">
        <source></source>
        <translation>Laitteessa</translation>
    </message>
    <message id="gallery-cover-device-note">
        <source></source>
        <translation>Järjestelmäväylän palvelu huomaa kuoren ja kertoo siitä sivulle.</translation>
    </message>
    <message id="gallery-cover-attach">
        <source></source>
        <translation>Kiinnitä kuori</translation>
    </message>
    <message id="gallery-cover-remove">
        <source></source>
        <translation>Irrota kuori</translation>
    </message>
    <message id="gallery-device">
        <source></source>
        <translation>Laite</translation>
    </message>
    <message id="gallery-device-about">
        <source></source>
        <translation>Katso Bluetooth-osoite, modeemin versio ja onko Android-tuki asennettu.</translation>
    </message>
    <message id="gallery-device-radio">
        <source></source>
        <translation>Radio</translation>
    </message>
    <message id="gallery-device-bluetooth">
        <source></source>
        <translation>Bluetooth-osoite</translation>
    </message>
    <message id="gallery-device-modem">
        <source></source>
        <translation>Modeemin versio</translation>
    </message>
    <message id="gallery-device-unknown">
        <source></source>
        <translation>Ei tiedossa</translation>
    </message>
    <message id="gallery-device-storage">
        <source></source>
        <translation>Tallennustila</translation>
    </message>
    <message id="gallery-device-android">
        <source></source>
        <translation>Androidin datakansiot</translation>
    </message>
    <message id="gallery-device-android-shown">
        <source></source>
        <translation>Näytetään: Android-tuki on asennettu</translation>
    </message>
    <message id="gallery-device-android-hidden">
        <source></source>
        <translation>Piilotettu: Android-tukea ei ole</translation>
    </message>
    <message id="gallery-terms">
        <source></source>
        <translation>Käyttöehdot</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Lue alustan ja valmistajan ehdot valitsemallasi kielellä.</translation>
    </message>
    <message id="gallery-terms-locale">
        <source></source>
        <translation>Ehtojen kieli</translation>
    </message>
    <message id="gallery-terms-locale-note">
        <source></source>
        <translation>Ehdot, joita ei ole tällä kielellä, näytetään englanniksi.</translation>
    </message>
    <message id="gallery-terms-none">
        <source></source>
        <translation>Ei ehtoja</translation>
    </message>
    <message id="gallery-text-files">
        <source></source>
        <translation>Tekstitiedostot</translation>
    </message>
    <message id="gallery-text-files-about">
        <source></source>
        <translation>Lue tiedosto sekä kansio, jonka tiedostoista tulee yksi teksti.</translation>
    </message>
    <message id="gallery-text-files-file">
        <source></source>
        <translation>Tiedosto</translation>
    </message>
    <message id="gallery-text-files-note">
        <source></source>
        <translation>Tiedoston rivinvaihdot jäävät pois: kappaleisiin jaettu teksti kirjoitetaan HTML:nä.</translation>
    </message>
    <message id="gallery-text-files-folder">
        <source></source>
        <translation>Kansio</translation>
    </message>
    <message id="gallery-text-files-prefix">
        <source></source>
        <translation>Esimerkkitiedostojen lisenssit:</translation>
    </message>
</context>
</TS>
