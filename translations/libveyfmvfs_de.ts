<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de_DE" sourcelanguage="en">
<context>
    <name>QObject</name>
    <message>
        <source>service %1 is not installed</source>
        <translation>Der Dienst %1 ist nicht installiert</translation>
    </message>
    <message>
        <source>can&apos;t connect to DBus service %1, perhaps usage &apos;dbus-launch &lt;program&gt;&apos; can solve this problem</source>
        <translation>Der D-Bus-Dienst %1 ist nicht erreichbar; vielleicht hilft der Aufruf „dbus-launch &lt;Programm&gt;“</translation>
    </message>
    <message>
        <source>service %1 does not answer, going on without it</source>
        <translation>Der Dienst %1 antwortet nicht; es geht ohne ihn weiter</translation>
    </message>
</context>
<context>
    <name>VeyFM::CheckSmbShareAuthJob</name>
    <message>
        <source>You must be in &apos;fuse&apos; group in order to browse samba shares!</source>
        <translation>Sie müssen Mitglied der Gruppe „fuse“ sein, um Samba-Freigaben zu durchsuchen.</translation>
    </message>
    <message>
        <source>Login cancelled</source>
        <translation>Anmeldung abgebrochen</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Zugriff verweigert</translation>
    </message>
    <message>
        <source>Logon failure</source>
        <translation>Anmeldung fehlgeschlagen</translation>
    </message>
    <message>
        <source>Access denied for %1</source>
        <translation>Zugriff auf %1 verweigert</translation>
    </message>
    <message>
        <source>Logon failure for %1</source>
        <translation>Anmeldung bei %1 fehlgeschlagen</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountFtpURLJob</name>
    <message>
        <source>Url scheme is not ftp</source>
        <translation>Das Schema der Adresse ist nicht ftp</translation>
    </message>
    <message>
        <source>Mounting ftp resource failed</source>
        <translation>Die FTP-Ressource konnte nicht eingehängt werden</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Zugriff verweigert</translation>
    </message>
    <message>
        <source>Enter host password for user:</source>
        <translation>Passwort des Benutzers auf dem Rechner:</translation>
    </message>
    <message>
        <source>Accessing ftp resource was cancelled</source>
        <translation>Der Zugriff auf die FTP-Ressource wurde abgebrochen</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountFuseEntryJob</name>
    <message>
        <source>You must be in &apos;fuse&apos; group in order to view urls with protocol &apos;%1&apos;!</source>
        <translation>Sie müssen Mitglied der Gruppe „fuse“ sein, um Adressen mit dem Protokoll „%1“ anzuzeigen.</translation>
    </message>
    <message>
        <source>Can&apos;t create entry for url</source>
        <translation>Für die Adresse lässt sich kein Eintrag anlegen</translation>
    </message>
    <message>
        <source>Couldn&apos;t access resource</source>
        <translation>Auf die Ressource konnte nicht zugegriffen werden</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountResourceJob</name>
    <message>
        <source>No progress within %1 s</source>
        <translation>Seit %1 s kein Fortschritt</translation>
    </message>
    <message>
        <source>Mounting was cancelled</source>
        <translation>Das Einhängen wurde abgebrochen</translation>
    </message>
    <message>
        <source>Can&apos;t start %1: %2</source>
        <translation>%1 lässt sich nicht starten: %2</translation>
    </message>
    <message>
        <source>%1 has not handed the mount over</source>
        <translation>%1 hat die Einhängung nicht übergeben</translation>
    </message>
    <message>
        <source>Can&apos;t understand %1: %2</source>
        <translation>%1 ist nicht zu verstehen: %2</translation>
    </message>
    <message>
        <source>%1 was ended by signal %2</source>
        <translation>%1 wurde durch Signal %2 beendet</translation>
    </message>
    <message>
        <source>%1 has ended too early</source>
        <translation>%1 hat sich zu früh beendet</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountSFtpURLJob</name>
    <message>
        <source>Url scheme is not sftp</source>
        <translation>Das Schema der Adresse ist nicht sftp</translation>
    </message>
    <message>
        <source>Mounting sftp resource failed</source>
        <translation>Die SFTP-Ressource konnte nicht eingehängt werden</translation>
    </message>
    <message>
        <source>The authenticity of host &apos;%1&apos; can&apos;t be established.
RSA key fingerprint is %2.
Are you sure you want to continue connecting?</source>
        <translation>Die Echtheit des Rechners „%1“ kann nicht bestätigt werden.
Der Fingerabdruck des RSA-Schlüssels ist %2.
Soll die Verbindung wirklich aufgebaut werden?</translation>
    </message>
    <message>
        <source>Question</source>
        <translation>Frage</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Zugriff verweigert</translation>
    </message>
    <message>
        <source>Enter host password for user:</source>
        <translation>Passwort des Benutzers auf dem Rechner:</translation>
    </message>
    <message>
        <source>Can&apos;t pass password to sshfs</source>
        <translation>Das Passwort kann nicht an sshfs übergeben werden</translation>
    </message>
    <message>
        <source>Accessing sftp resource was cancelled</source>
        <translation>Der Zugriff auf die SFTP-Ressource wurde abgebrochen</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountSmbURLJob</name>
    <message>
        <source>Url scheme is not smb</source>
        <translation>Das Schema der Adresse ist nicht smb</translation>
    </message>
    <message>
        <source>Incorrect url</source>
        <translation>Ungültige Adresse</translation>
    </message>
    <message>
        <source>Url must contain host name</source>
        <translation>Die Adresse muss einen Rechnernamen enthalten</translation>
    </message>
    <message>
        <source>Url must contain share name</source>
        <translation>Die Adresse muss den Namen einer Freigabe enthalten</translation>
    </message>
    <message>
        <source>Can&apos;t get local path for samba network</source>
        <translation>Der lokale Pfad des Samba-Netzwerks ist nicht zu ermitteln</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountURLJob</name>
    <message>
        <source>This network protocol is not supported</source>
        <translation>Dieses Netzwerkprotokoll wird nicht unterstützt</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceEjectJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Die Schnittstelle des Dienstes ist nicht erreichbar</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceJob</name>
    <message>
        <source>Unexpected reply signature: got &quot;%1&quot;, expected &quot;b&quot;</source>
        <translation>Unerwartete Signatur der Antwort: „%1“ statt „b“</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceMountJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Die Schnittstelle des Dienstes ist nicht erreichbar</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceUnmountJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Die Schnittstelle des Dienstes ist nicht erreichbar</translation>
    </message>
</context>
<context>
    <name>VeyFM::UnmountResourceJob</name>
    <message>
        <source>%1 is no mount of a network resource</source>
        <translation>%1 ist keine eingehängte Netzwerkressource</translation>
    </message>
    <message>
        <source>The file system of %1 does not answer</source>
        <translation>Das Dateisystem von %1 antwortet nicht</translation>
    </message>
    <message>
        <source>Nothing is mounted on %1</source>
        <translation>In %1 ist nichts eingehängt</translation>
    </message>
    <message>
        <source>%1 is being mounted by another program</source>
        <translation>%1 wird gerade von einem anderen Programm eingehängt</translation>
    </message>
    <message>
        <source>%1 does not come to an end</source>
        <translation>%1 kommt zu keinem Ende</translation>
    </message>
    <message>
        <source>Can&apos;t start %1: %2</source>
        <translation>%1 lässt sich nicht starten: %2</translation>
    </message>
    <message>
        <source>%1 is in use by: %2</source>
        <translation>%1 wird benutzt von: %2</translation>
    </message>
    <message>
        <source>%1 is in use</source>
        <translation>%1 wird benutzt</translation>
    </message>
    <message>
        <source>Can&apos;t unmount %1</source>
        <translation>%1 lässt sich nicht aushängen</translation>
    </message>
</context>
<context>
    <name>VeyFM::UpdateNetworkPlaceJob</name>
    <message>
        <source>Can&apos;t find entry for network place</source>
        <translation>Zu diesem Netzwerkort gibt es keinen Eintrag</translation>
    </message>
</context>
<context>
    <name>VeyFM::UpdateSmbEntryJob</name>
    <message>
        <source>Not a samba entry</source>
        <translation>Kein Samba-Eintrag</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFS</name>
    <message>
        <source>Places</source>
        <translation>Orte</translation>
    </message>
    <message>
        <source>Computer</source>
        <translation>Computer</translation>
    </message>
    <message>
        <source>Favourites</source>
        <translation>Favoriten</translation>
    </message>
    <message>
        <source>Storage devices</source>
        <translation>Speichergeräte</translation>
    </message>
    <message>
        <source>Desktop</source>
        <translation>Arbeitsfläche</translation>
    </message>
    <message>
        <source>Trash</source>
        <translation>Papierkorb</translation>
    </message>
    <message>
        <source>Home</source>
        <translation>Persönlicher Ordner</translation>
    </message>
    <message>
        <source>File System</source>
        <translation>Dateisystem</translation>
    </message>
    <message>
        <source>Network</source>
        <translation>Netzwerk</translation>
    </message>
    <message>
        <source>Samba</source>
        <translation>Samba</translation>
    </message>
    <message>
        <source>FTP</source>
        <translation>FTP</translation>
    </message>
    <message>
        <source>SFTP</source>
        <translation>SFTP</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageEjectJob</name>
    <message>
        <source>This type of point cannot be ejected</source>
        <translation>Orte dieser Art können nicht ausgeworfen werden</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Die Schnittstelle des Dienstes ist nicht erreichbar</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageMountJob</name>
    <message>
        <source>This type of point cannot be mounted</source>
        <translation>Orte dieser Art können nicht eingehängt werden</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageUnmountJob</name>
    <message>
        <source>This type of point cannot be unmounted</source>
        <translation>Orte dieser Art können nicht ausgehängt werden</translation>
    </message>
</context>
</TS>
