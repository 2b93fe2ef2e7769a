#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

"""An FTP server for the accounts of the machine, whose homes are all that they see.

ftpserver.py HOST [--anonymous ACCOUNT] [--idle SECONDS]

Anonymous visitors see the home of an account, and may not change it. Connections that do nothing
for some seconds are closed.
"""

import argparse

from pyftpdlib.authorizers import UnixAuthorizer
from pyftpdlib.handlers import FTPHandler
from pyftpdlib.servers import FTPServer


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("host")
    parser.add_argument("--anonymous")
    parser.add_argument("--idle", type=int, default=300)
    arguments = parser.parse_args()

    authorizer = UnixAuthorizer(anonymous_user=arguments.anonymous)
    if arguments.anonymous:
        authorizer.override_user("anonymous", perm="elr")
    FTPHandler.authorizer = authorizer
    FTPHandler.timeout = arguments.idle
    # A refusal comes at once; servers usually keep their visitors waiting.
    FTPHandler.auth_failed_timeout = 0
    FTPServer((arguments.host, 21), FTPHandler).serve_forever()


main()
