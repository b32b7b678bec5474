"""Certificates made for one run: an authority, and what it signs, well or badly."""
import subprocess

CONFIGURATION = """
[ca]
default_ca = here
[here]
dir = {folder}
database = $dir/index
serial = $dir/serial
new_certs_dir = $dir
default_md = sha256
policy = any
unique_subject = no
[any]
commonName = supplied
[authority]
basicConstraints = critical, CA:TRUE
subjectKeyIdentifier = hash
"""


class Authority:
    def __init__(self, folder):
        self.folder = folder
        self.certificate = folder / "authority.pem"
        self.configuration = folder / "ca.cnf"
        self.configuration.write_text(CONFIGURATION.format(folder=folder))
        (folder / "index").touch()
        (folder / "serial").write_text("01\n")
        self.make_key("authority")
        self.sign_itself("authority", "zarvo's own", "-extensions", "authority",
                         "-config", self.configuration)

    def openssl(self, *words):
        subprocess.run(["openssl", *map(str, words)], check=True, capture_output=True, cwd=self.folder)

    def make_key(self, name):
        self.openssl("genpkey", "-algorithm", "EC", "-pkeyopt", "ec_paramgen_curve:P-256",
                     "-out", f"{name}.key")

    def sign_itself(self, name, subject, *words):
        self.openssl("req", "-new", "-x509", "-days", "3650", "-key", f"{name}.key", "-subj",
                     f"/CN={subject}", "-out", f"{name}.pem", *words)

    def issue(self, name, names="", begin="20200101000000Z", end="20991231000000Z", subject="x"):
        """NAME.pem with the certificate and its key. `names` are as openssl writes them, such as
        "DNS:localhost, IP:127.0.0.1"; none: the subject's common name alone."""
        self.make_key(name)
        self.openssl("req", "-new", "-key", f"{name}.key", "-subj", f"/CN={subject}",
                     "-out", f"{name}.csr")
        extensions = self.folder / f"{name}.ext"
        extensions.write_text("basicConstraints = CA:FALSE\n" +
                              (f"subjectAltName = {names}\n" if names else ""))
        self.openssl("ca", "-batch", "-config", self.configuration, "-cert", self.certificate,
                     "-keyfile", "authority.key", "-startdate", begin, "-enddate", end,
                     "-in", f"{name}.csr", "-out", f"{name}.pem", "-notext", "-extfile", extensions)
        return self.with_key(name)

    def issue_itself(self, name, host):
        self.make_key(name)
        self.sign_itself(name, host, "-addext", f"subjectAltName=DNS:{host}")
        return self.with_key(name)

    def with_key(self, name):
        path = self.folder / f"{name}.pem"
        path.write_text(path.read_text() + (self.folder / f"{name}.key").read_text())
        return path
