// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/storagedeviceinfo.h"

namespace VeyFM {

// The flag behind number2 crosses the bus and its twin behind number4 does not. Services rely on
// this signature.

QDBusArgument& operator<<(QDBusArgument& argument, const StorageDeviceInfo& info)
{
    argument.beginStructure();
    argument << info.text1 << info.text2 << info.text3 << info.text4 << info.flag1;
    argument << info.text5 << info.text6 << info.text7 << info.text8 << info.text9 << info.text10;
    argument << info.number1 << info.number2 << info.flag2;
    argument << info.number3 << info.number4 << info.number5;
    argument.endStructure();
    return argument;
}

const QDBusArgument& operator>>(const QDBusArgument& argument, StorageDeviceInfo& info)
{
    argument.beginStructure();
    argument >> info.text1 >> info.text2 >> info.text3 >> info.text4 >> info.flag1;
    argument >> info.text5 >> info.text6 >> info.text7 >> info.text8 >> info.text9 >> info.text10;
    argument >> info.number1 >> info.number2 >> info.flag2;
    argument >> info.number3 >> info.number4 >> info.number5;
    argument.endStructure();
    return argument;
}

} // namespace VeyFM
