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
        <translation>Näyttää käytössä olevat pikatoiminnot ja käynnistää ne, kuten kotinäkymä.</translation>
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
        <translation>Luettelee kaikki tarjolla olevat pikatoiminnot: otettavaksi käyttöön ja järjestettäväksi.</translation>
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
        <translation>Luettelee tapahtumanäkymän widgetit: saatavilla olevat voi ottaa käyttöön ja poistaa käytöstä.</translation>
    </message>
    <message id="gallery-events-widgets-available">
        <source></source>
        <translation>Tarjolla olevat widgetit</translation>
    </message>
    <message id="gallery-events-widgets-unavailable">
        <source></source>
        <translation>Ei saatavilla tässä laitteessa</translation>
    </message>
    <message id="gallery-events-widgets-first-choice">
        <source></source>
        <translation>Ensimmäiseen valintaan asti widgetit noudattavat oletuksiaan. Ensimmäinen valinta ottaa kaikki muut käyttöön.</translation>
    </message>
    <message id="gallery-events-widgets-step-counter">
        <source></source>
        <translation>Askelmittari</translation>
    </message>
    <message id="gallery-events-widgets-step-counter-note">
        <source></source>
        <translation>Askelwidget on saatavilla, kun tämä on olemassa ja sivu tarkistaa sen.</translation>
    </message>
    <message id="gallery-titles">
        <source></source>
        <translation>Nimet lauseena</translation>
    </message>
    <message id="gallery-titles-about">
        <source></source>
        <translation>Yhdistää mallin rivien nimet, kuten käytössä olevat, luetteloksi valitulla kielellä.</translation>
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
        <translation>Alustaa, tyhjentää, ottaa käyttöön ja irrottaa muistikortin ja näyttää sen tiedostojärjestelmän.</translation>
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
        <translation>Kaikki kortilla oleva häviää. Kortille luodaan tyhjä %1-tiedostojärjestelmä.</translation>
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
        <translation>Irrottaminen</translation>
    </message>
    <message id="gallery-card-formatting">
        <source></source>
        <translation>Alustaminen</translation>
    </message>
    <message id="gallery-card-removing-files">
        <source></source>
        <translation>Tiedostojen poistaminen</translation>
    </message>
    <message id="gallery-card-mounting">
        <source></source>
        <translation>Liittäminen</translation>
    </message>
    <message id="gallery-card-probing">
        <source></source>
        <translation>Tiedostojärjestelmän tunnistaminen</translation>
    </message>
    <message id="gallery-card-error">
        <source></source>
        <translation>Epäonnistui</translation>
    </message>
    <message id="gallery-card-failed">
        <source></source>
        <translation>levypalvelu ilmoitti virheestä</translation>
    </message>
    <message id="gallery-card-device-busy">
        <source></source>
        <translation>kortti on käytössä. Sulje sitä käyttävät sovellukset ja yritä uudelleen.</translation>
    </message>
    <message id="gallery-card-already-mounted">
        <source></source>
        <translation>kortti oli jo liitetty</translation>
    </message>
    <message id="gallery-card-not-mounted">
        <source></source>
        <translation>korttia ei ole liitetty</translation>
    </message>
    <message id="gallery-card-other-user">
        <source></source>
        <translation>toinen käyttäjä on liittänyt kortin</translation>
    </message>
    <message id="gallery-card-not-authorized">
        <source></source>
        <translation>ei sallittua</translation>
    </message>
    <message id="gallery-card-not-supported">
        <source></source>
        <translation>tämä laite ei tue sitä</translation>
    </message>
    <message id="gallery-card-timed-out">
        <source></source>
        <translation>kortti vastasi liian hitaasti</translation>
    </message>
    <message id="gallery-card-service">
        <source></source>
        <translation>Levypalvelu</translation>
    </message>
    <message id="gallery-card-in-use">
        <source></source>
        <translation>Ohjelmalla on sen tiedosto auki</translation>
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
        <translation>Kytkee paikannuspalvelut, tallentaa ja palauttaa kytkimet ja sisältää hyväksyttävät ehdot.</translation>
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
        <translation>Seuraa älykuorta: mikä kuori on kiinni ja voiko sen tunnistaa.</translation>
    </message>
    <message id="gallery-cover-id">
        <source></source>
        <translation>Kiinnitetty kuori</translation>
    </message>
    <message id="gallery-cover-none">
        <source></source>
        <translation>Ei mitään</translation>
    </message>
    <message id="gallery-cover-ready">
        <source></source>
        <translation>Valmis</translation>
    </message>
    <message id="gallery-cover-not-ready">
        <source></source>
        <translation>Ei vielä valmis</translation>
    </message>
    <message id="gallery-terms">
        <source></source>
        <translation>Käyttöehdot</translation>
    </message>
    <message id="gallery-terms-about">
        <source></source>
        <translation>Lukee alustan ja valmistajan ehdot käyttäjän kielellä.</translation>
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
        <translation>Lukee tekstitiedoston ja hakemiston tiedostot yhtenä tekstinä.</translation>
    </message>
    <message id="gallery-text-files-file">
        <source></source>
        <translation>Tiedosto</translation>
    </message>
    <message id="gallery-text-files-note">
        <source></source>
        <translation>Tiedoston rivinvaihdot jäävät pois: kappaleisiin jaettu teksti kirjoitetaan HTML:nä.</translation>
    </message>
    <message id="gallery-text-files-prefix">
        <source></source>
        <translation>Esimerkkitiedostojen lisenssit:</translation>
    </message>
    <message id="gallery-bluetooth">
        <source></source>
        <translation>Bluetooth</translation>
    </message>
    <message id="gallery-bluetooth-about">
        <source></source>
        <translation>Kertoo Bluetooth-sovittimen osoitteen.</translation>
    </message>
    <message id="gallery-bluetooth-address">
        <source></source>
        <translation>Sovittimen osoite</translation>
    </message>
    <message id="gallery-bluetooth-installed">
        <source></source>
        <translation>Alustalla on osoitetiedosto</translation>
    </message>
    <message id="gallery-android">
        <source></source>
        <translation>Android-tuki</translation>
    </message>
    <message id="gallery-android-about">
        <source></source>
        <translation>Kertoo, näytetäänkö Android-sovellusten hakemistot.</translation>
    </message>
    <message id="gallery-android-shown">
        <source></source>
        <translation>Näytetään: Android-tuki on asennettu</translation>
    </message>
    <message id="gallery-android-hidden">
        <source></source>
        <translation>Piilotettu: Android-tukea ei ole</translation>
    </message>
    <message id="gallery-android-installed">
        <source></source>
        <translation>Android-tuki on asennettu</translation>
    </message>
    <message id="gallery-modem">
        <source></source>
        <translation>Modeemi</translation>
    </message>
    <message id="gallery-modem-about">
        <source></source>
        <translation>Kertoo, mikä modeemiohjelmiston versio laitteessa on.</translation>
    </message>
    <message id="gallery-modem-variant">
        <source></source>
        <translation>Ohjelmiston versio</translation>
    </message>
    <message id="gallery-modem-installed">
        <source></source>
        <translation>Modeemiohjelmisto on asennettu</translation>
    </message>
    <message id="gallery-unknown">
        <source></source>
        <translation>Ei tiedossa</translation>
    </message>
    <message id="gallery-text-files-none">
        <source></source>
        <translation>Ei luettavaa.</translation>
    </message>
    <message id="gallery-text-files-file-installed">
        <source></source>
        <translation>Tiedosto on olemassa</translation>
    </message>
    <message id="gallery-terms-platform-installed">
        <source></source>
        <translation>Alustalla on ehdot</translation>
    </message>
    <message id="gallery-terms-vendor-installed">
        <source></source>
        <translation>Valmistajalla on ehdot</translation>
    </message>
    <message id="gallery-simulation">
        <source></source>
        <translation>Simulointi</translation>
    </message>
    <message id="gallery-simulation-note">
        <source></source>
        <translation>Kullakin sivulla on keltainen paneeli, joka simuloi sivun ympärillä olevaa laitetta. Oma sivusi ei tarvitse paneelia.</translation>
    </message>
    <message id="gallery-simulation-reload">
        <source></source>
        <translation>Avaa sivu uudelleen</translation>
    </message>
    <message id="gallery-simulation-constant">
        <source></source>
        <translation>Sivu lukee tämän, kun se avataan.</translation>
    </message>
    <message id="gallery-log">
        <source></source>
        <translation>Loki: %1</translation>
    </message>
    <message id="gallery-log-clear">
        <source></source>
        <translation>Tyhjennä</translation>
    </message>
    <message id="gallery-quick-actions-installed">
        <source></source>
        <translation>Pikatoimintoja on asennettu</translation>
    </message>
    <message id="gallery-quick-actions-not-installed">
        <source></source>
        <translation>Yhtään pikatoimintoa ei ole asennettu.</translation>
    </message>
    <message id="gallery-quick-actions-fail">
        <source></source>
        <translation>Palvelut vastaavat virheellä</translation>
    </message>
    <message id="gallery-quick-actions-absent">
        <source></source>
        <translation>Navigointipalvelua ei ole asennettu: sen toiminto pyytää pakettia kaupasta.</translation>
    </message>
    <message id="gallery-quick-actions-broken">
        <source></source>
        <translation>Tyhjä määrittelytiedosto on olemassa</translation>
    </message>
    <message id="gallery-quick-actions-keys">
        <source></source>
        <translation>Myös Ctrl ja nuolinäppäimet siirtävät riviä. Muuttuneet tiedostot näkyvät sekunnin kuluttua.</translation>
    </message>
    <message id="gallery-events-widgets-none">
        <source></source>
        <translation>Yhtään widgetiä ei ole asennettu.</translation>
    </message>
    <message id="gallery-events-widgets-check">
        <source></source>
        <translation>Tarkista saatavuus</translation>
    </message>
    <message id="gallery-events-widgets-installed">
        <source></source>
        <translation>Widgetejä on asennettu</translation>
    </message>
    <message id="gallery-events-widgets-broken">
        <source></source>
        <translation>Rikkinäinen määrittelytiedosto on olemassa</translation>
    </message>
    <message id="gallery-titles-language">
        <source></source>
        <translation>Kielen vaihtuessa lauseet muuttuvat, kun sivu avataan uudelleen.</translation>
    </message>
    <message id="gallery-card-none">
        <source></source>
        <translation>Korttia ei ole paikallaan.</translation>
    </message>
    <message id="gallery-card-empty">
        <source></source>
        <translation>Poista kaikki tiedostot</translation>
    </message>
    <message id="gallery-card-empty-question">
        <source></source>
        <translation>Poistetaanko kaikki tiedostot?</translation>
    </message>
    <message id="gallery-card-empty-question-text">
        <source></source>
        <translation>Kaikki kortin tiedostot ja hakemistot katoavat. Tiedostojärjestelmä jää.</translation>
    </message>
    <message id="gallery-card-remove">
        <source></source>
        <translation>Poista</translation>
    </message>
    <message id="gallery-card-real">
        <source></source>
        <translation>Oikea kortti: %1, ext4-tiedostojärjestelmä muistissa, ja oikea levypalvelu</translation>
    </message>
    <message id="gallery-card-simulated">
        <source></source>
        <translation>Kortti ja levypalvelu on simuloitu. Kortin irrottaminen poistaa sen tiedostot.</translation>
    </message>
    <message id="gallery-card-files">
        <source></source>
        <translation>Kortti on liitetty. Tiedostoja ja hakemistoja ylimmällä tasolla: %1</translation>
    </message>
    <message id="gallery-card-is-unmounted">
        <source></source>
        <translation>Korttia ei ole liitetty.</translation>
    </message>
    <message id="gallery-card-fill">
        <source></source>
        <translation>Pane kortille tiedostoja</translation>
    </message>
    <message id="gallery-card-inserted">
        <source></source>
        <translation>Kortti on paikallaan</translation>
    </message>
    <message id="gallery-card-helper">
        <source></source>
        <translation>Apuohjelma on asennettu</translation>
    </message>
    <message id="gallery-card-helper-waits">
        <source></source>
        <translation>Apuohjelma vitkastelee</translation>
    </message>
    <message id="gallery-card-service-works">
        <source></source>
        <translation>Toimii</translation>
    </message>
    <message id="gallery-card-service-forbids">
        <source></source>
        <translation>Kieltää kaiken</translation>
    </message>
    <message id="gallery-card-service-silent">
        <source></source>
        <translation>Ei vastaa</translation>
    </message>
    <message id="gallery-card-service-absent">
        <source></source>
        <translation>Puuttuu</translation>
    </message>
    <message id="gallery-location-mls-installed">
        <source></source>
        <translation>MLS-ehdot on asennettu</translation>
    </message>
    <message id="gallery-location-here-installed">
        <source></source>
        <translation>HERE-ehdot on asennettu</translation>
    </message>
    <message id="gallery-cover-no-daemon">
        <source></source>
        <translation>Mikään ei vastaa</translation>
    </message>
    <message id="gallery-cover-removed">
        <source></source>
        <translation>Ei kuorta</translation>
    </message>
    <message id="gallery-cover-attached">
        <source></source>
        <translation>Kuori, kun tunnistus ei ole valmis</translation>
    </message>
    <message id="gallery-cover-attached-ready">
        <source></source>
        <translation>Kuori</translation>
    </message>
    <message id="gallery-cover-note">
        <source></source>
        <translation>Kun vastaukset loppuvat, avoin sivu säilyttää viimeisen tietonsa.</translation>
    </message>
    <message id="gallery-card-waiting">
        <source></source>
        <translation>Odotetaan levypalvelua</translation>
    </message>
    <message id="gallery-card-progress">
        <source></source>
        <translation>Edistyminen</translation>
    </message>
    <message id="gallery-card-no-answer">
        <source></source>
        <translation>levypalvelu puuttuu tai ei vastannut oikein</translation>
    </message>
    <message id="gallery-card-removing-failed">
        <source></source>
        <translation>kaikkia tiedostoja ei voitu poistaa</translation>
    </message>
    <message id="gallery-card-already-unmounting">
        <source></source>
        <translation>korttia irrotetaan jo</translation>
    </message>
    <message id="gallery-move-up">
        <source></source>
        <translation>Siirrä ylös: %1</translation>
    </message>
    <message id="gallery-move-down">
        <source></source>
        <translation>Siirrä alas: %1</translation>
    </message>
    <message id="gallery-untitled">
        <source></source>
        <translation>Tässä määrittelytiedostossa ei ole otsikkoa.</translation>
    </message>
    <message id="gallery-card-helper-failed">
        <source></source>
        <translation>apuohjelma epäonnistui</translation>
    </message>
    <message id="gallery-card-helper-missing">
        <source></source>
        <translation>apuohjelma puuttuu</translation>
    </message>
    <message id="gallery-android-directories">
        <source></source>
        <translation>Android-sovellusten datahakemistot</translation>
    </message>
    <message id="gallery-text-files-directory">
        <source></source>
        <translation>Hakemisto</translation>
    </message>
    <message id="gallery-text-files-directory-installed">
        <source></source>
        <translation>Hakemisto on olemassa</translation>
    </message>
    <message id="gallery-cover-recognition">
        <source></source>
        <translation>Kuorten tunnistus</translation>
    </message>
    <message id="gallery-events-widgets-live">
        <source></source>
        <translation>Tapahtumanäkymässä</translation>
    </message>
    <message id="gallery-events-widgets-live-none">
        <source></source>
        <translation>Yhtään saatavilla olevaa widgetiä ei ole käytössä.</translation>
    </message>
</context>
</TS>
