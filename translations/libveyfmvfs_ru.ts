<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="ru_RU" sourcelanguage="en">
<context>
    <name>QObject</name>
    <message>
        <source>service %1 is not installed</source>
        <translation>Служба %1 не установлена</translation>
    </message>
    <message>
        <source>can&apos;t connect to DBus service %1, perhaps usage &apos;dbus-launch &lt;program&gt;&apos; can solve this problem</source>
        <translation>Не удалось подключиться к службе D-Bus %1; возможно, поможет запуск «dbus-launch &lt;программа&gt;»</translation>
    </message>
    <message>
        <source>service %1 does not answer, going on without it</source>
        <translation>Служба %1 не отвечает; работа продолжается без неё</translation>
    </message>
</context>
<context>
    <name>VeyFM::CheckSmbShareAuthJob</name>
    <message>
        <source>You must be in &apos;fuse&apos; group in order to browse samba shares!</source>
        <translation>Для просмотра ресурсов Samba вы должны состоять в группе «fuse»!</translation>
    </message>
    <message>
        <source>Login cancelled</source>
        <translation>Вход отменён</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Доступ запрещён</translation>
    </message>
    <message>
        <source>Logon failure</source>
        <translation>Ошибка входа</translation>
    </message>
    <message>
        <source>Access denied for %1</source>
        <translation>Доступ к %1 запрещён</translation>
    </message>
    <message>
        <source>Logon failure for %1</source>
        <translation>Не удалось войти на %1</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountFtpURLJob</name>
    <message>
        <source>Url scheme is not ftp</source>
        <translation>Схема адреса не ftp</translation>
    </message>
    <message>
        <source>Mounting ftp resource failed</source>
        <translation>Не удалось подключить ресурс FTP</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Доступ запрещён</translation>
    </message>
    <message>
        <source>Enter host password for user:</source>
        <translation>Введите пароль пользователя на узле:</translation>
    </message>
    <message>
        <source>Accessing ftp resource was cancelled</source>
        <translation>Доступ к ресурсу FTP отменён</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountFuseEntryJob</name>
    <message>
        <source>You must be in &apos;fuse&apos; group in order to view urls with protocol &apos;%1&apos;!</source>
        <translation>Для просмотра адресов с протоколом «%1» вы должны состоять в группе «fuse»!</translation>
    </message>
    <message>
        <source>Can&apos;t create entry for url</source>
        <translation>Не удалось создать запись для адреса</translation>
    </message>
    <message>
        <source>Couldn&apos;t access resource</source>
        <translation>Не удалось получить доступ к ресурсу</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountResourceJob</name>
    <message>
        <source>No progress within %1 s</source>
        <translation>Нет продвижения в течение %1 с</translation>
    </message>
    <message>
        <source>Mounting was cancelled</source>
        <translation>Подключение отменено</translation>
    </message>
    <message>
        <source>Can&apos;t start %1: %2</source>
        <translation>Не удалось запустить %1: %2</translation>
    </message>
    <message>
        <source>%1 has not handed the mount over</source>
        <translation>%1 не передал подключённый ресурс</translation>
    </message>
    <message>
        <source>Can&apos;t understand %1: %2</source>
        <translation>Не удалось понять %1: %2</translation>
    </message>
    <message>
        <source>%1 was ended by signal %2</source>
        <translation>%1 завершён сигналом %2</translation>
    </message>
    <message>
        <source>%1 has ended too early</source>
        <translation>%1 завершился слишком рано</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountSFtpURLJob</name>
    <message>
        <source>Url scheme is not sftp</source>
        <translation>Схема адреса не sftp</translation>
    </message>
    <message>
        <source>Mounting sftp resource failed</source>
        <translation>Не удалось подключить ресурс SFTP</translation>
    </message>
    <message>
        <source>The authenticity of host &apos;%1&apos; can&apos;t be established.
RSA key fingerprint is %2.
Are you sure you want to continue connecting?</source>
        <translation>Подлинность узла «%1» не может быть установлена.
Отпечаток ключа RSA: %2.
Вы действительно хотите продолжить подключение?</translation>
    </message>
    <message>
        <source>Question</source>
        <translation>Вопрос</translation>
    </message>
    <message>
        <source>Access denied</source>
        <translation>Доступ запрещён</translation>
    </message>
    <message>
        <source>Enter host password for user:</source>
        <translation>Введите пароль пользователя на узле:</translation>
    </message>
    <message>
        <source>Can&apos;t pass password to sshfs</source>
        <translation>Не удалось передать пароль программе sshfs</translation>
    </message>
    <message>
        <source>Accessing sftp resource was cancelled</source>
        <translation>Доступ к ресурсу SFTP отменён</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountSmbURLJob</name>
    <message>
        <source>Url scheme is not smb</source>
        <translation>Схема адреса не smb</translation>
    </message>
    <message>
        <source>Incorrect url</source>
        <translation>Неверный адрес</translation>
    </message>
    <message>
        <source>Url must contain host name</source>
        <translation>Адрес должен содержать имя узла</translation>
    </message>
    <message>
        <source>Url must contain share name</source>
        <translation>Адрес должен содержать имя общего ресурса</translation>
    </message>
    <message>
        <source>Can&apos;t get local path for samba network</source>
        <translation>Не удалось узнать локальный путь сети Samba</translation>
    </message>
</context>
<context>
    <name>VeyFM::MountURLJob</name>
    <message>
        <source>This network protocol is not supported</source>
        <translation>Этот сетевой протокол не поддерживается</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceEjectJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Не удалось получить интерфейс службы</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceJob</name>
    <message>
        <source>Unexpected reply signature: got &quot;%1&quot;, expected &quot;b&quot;</source>
        <translation>Неожиданная сигнатура ответа: «%1» вместо «b»</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceMountJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Не удалось получить интерфейс службы</translation>
    </message>
</context>
<context>
    <name>VeyFM::StoragePlaceUnmountJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Не удалось получить интерфейс службы</translation>
    </message>
</context>
<context>
    <name>VeyFM::UnmountResourceJob</name>
    <message>
        <source>%1 is no mount of a network resource</source>
        <translation>%1 не является подключённым сетевым ресурсом</translation>
    </message>
    <message>
        <source>The file system of %1 does not answer</source>
        <translation>Файловая система %1 не отвечает</translation>
    </message>
    <message>
        <source>Nothing is mounted on %1</source>
        <translation>К %1 ничего не подключено</translation>
    </message>
    <message>
        <source>%1 is being mounted by another program</source>
        <translation>%1 сейчас подключает другая программа</translation>
    </message>
    <message>
        <source>%1 does not come to an end</source>
        <translation>%1 не завершается</translation>
    </message>
    <message>
        <source>Can&apos;t start %1: %2</source>
        <translation>Не удалось запустить %1: %2</translation>
    </message>
    <message>
        <source>%1 is in use by: %2</source>
        <translation>%1 используется программами: %2</translation>
    </message>
    <message>
        <source>%1 is in use</source>
        <translation>%1 используется</translation>
    </message>
    <message>
        <source>Can&apos;t unmount %1</source>
        <translation>Не удалось отключить %1</translation>
    </message>
</context>
<context>
    <name>VeyFM::UpdateNetworkPlaceJob</name>
    <message>
        <source>Can&apos;t find entry for network place</source>
        <translation>Не найдена запись для сетевого места</translation>
    </message>
</context>
<context>
    <name>VeyFM::UpdateSmbEntryJob</name>
    <message>
        <source>Not a samba entry</source>
        <translation>Это не запись Samba</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFS</name>
    <message>
        <source>Places</source>
        <translation>Места</translation>
    </message>
    <message>
        <source>Computer</source>
        <translation>Компьютер</translation>
    </message>
    <message>
        <source>Favourites</source>
        <translation>Избранное</translation>
    </message>
    <message>
        <source>Storage devices</source>
        <translation>Устройства хранения</translation>
    </message>
    <message>
        <source>Desktop</source>
        <translation>Рабочий стол</translation>
    </message>
    <message>
        <source>Trash</source>
        <translation>Корзина</translation>
    </message>
    <message>
        <source>Home</source>
        <translation>Домашняя папка</translation>
    </message>
    <message>
        <source>File System</source>
        <translation>Файловая система</translation>
    </message>
    <message>
        <source>Network</source>
        <translation>Сеть</translation>
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
        <translation>Места этого типа нельзя извлечь</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageJob</name>
    <message>
        <source>Can&apos;t get service interface</source>
        <translation>Не удалось получить интерфейс службы</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageMountJob</name>
    <message>
        <source>This type of point cannot be mounted</source>
        <translation>Места этого типа нельзя подключить</translation>
    </message>
</context>
<context>
    <name>VeyFM::VFSStorageUnmountJob</name>
    <message>
        <source>This type of point cannot be unmounted</source>
        <translation>Места этого типа нельзя отключить</translation>
    </message>
</context>
</TS>
