"""smtp_server.py FOLDER USER PASSWORD CERTIFICATE: the mail side of with_servers, which says what
it keeps.

Prints four ports, a line each: no login, AUTH LOGIN only, AUTH PLAIN only, and that encrypted.
Takes nothing but mail of a text and one attachment.
"""

import asyncio
import email
import email.policy
import email.utils
import pathlib
import shutil
import ssl
import sys

from aiosmtpd.smtp import SMTP, AuthResult, LoginPassword


class Keeper:
    def __init__(self, folder):
        self.folder = pathlib.Path(folder)

    async def handle_RCPT(self, server, session, envelope, address, options):
        if "/" in address or envelope.rcpt_tos:
            return "553 one recipient, and no slash in it"
        envelope.rcpt_tos.append(address)
        return "250 OK"

    async def handle_DATA(self, server, session, envelope):
        mail = email.message_from_bytes(envelope.content, policy=email.policy.default)
        parts = list(mail.iter_parts())
        if mail.defects or [part.get_content_disposition() for part in parts] != [
                "inline", "attachment"]:
            return f"554 not a text and one attachment {mail.defects}"
        text, attachment = parts
        date = email.utils.parsedate_to_datetime(mail["Date"])
        login = session.auth_data.login.decode() if session.authenticated else ""
        headers = (mail["From"], mail["To"], mail["Subject"], str(int(date.timestamp())))

        kept = self.folder / envelope.rcpt_tos[0]
        shutil.rmtree(kept, ignore_errors=True)
        kept.mkdir()
        (kept / "message").write_bytes(envelope.content)
        (kept / "envelope").write_text(f"{envelope.mail_from}\n{login}\n")
        (kept / "headers").write_text("".join(f"{value}\n" for value in headers))
        (kept / "text").write_text(text.get_content())
        (kept / "name").write_text(attachment.get_filename() or "")
        (kept / "attachment").write_bytes(attachment.get_content())
        return "250 kept"


async def serve(folder, user, password, certificate):
    keeper = Keeper(folder)
    encryption = ssl.SSLContext(ssl.PROTOCOL_TLS_SERVER)
    encryption.load_cert_chain(certificate)

    def check(server, session, envelope, mechanism, data):
        good = data == LoginPassword(user.encode(), password.encode())
        return AuthResult(success=good, handled=False, auth_data=data)

    def protocol(refused):
        return lambda: SMTP(keeper, hostname="localhost", data_size_limit=0, authenticator=check,
                            auth_require_tls=False, auth_exclude_mechanism=refused,
                            auth_required="PLAIN" not in refused or "LOGIN" not in refused)

    servers = []
    for refused, context in ((["LOGIN", "PLAIN"], None), (["PLAIN"], None), (["LOGIN"], None),
                             (["LOGIN"], encryption)):
        server = await asyncio.get_running_loop().create_server(protocol(refused), "127.0.0.1", 0,
                                                                ssl=context)
        print(server.sockets[0].getsockname()[1], flush=True)
        servers.append(server)
    await asyncio.gather(*(server.serve_forever() for server in servers))


asyncio.run(serve(*sys.argv[1:]))
