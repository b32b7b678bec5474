"""What the servers of with_servers read: @DIR@ is the run's own folder, @PORT@ a free port."""

# One process, which runs as whoever started it and keeps every file in the folder.
NGINX = """
daemon off;
master_process off;
pid @DIR@/nginx.pid;
error_log @DIR@/log;
events { worker_connections 256; }
http {
  access_log off;
  default_type application/octet-stream;
  sendfile on;
  client_max_body_size 0;
  client_body_temp_path @DIR@/body;
  proxy_temp_path @DIR@/proxy;
  fastcgi_temp_path @DIR@/fastcgi;
  uwsgi_temp_path @DIR@/uwsgi;
  scgi_temp_path @DIR@/scgi;
  server {
    listen 127.0.0.1:@PORT@;
    @LISTEN_SIX@
    root @DIR@/http;
    dav_methods PUT;
    create_full_put_path on;
    location /chunked/ {  # what passes through the filter has no length
      alias @DIR@/http/;
      ssi on;
      ssi_types *;
    }
    location /moved/ {
      rewrite ^/moved/(.*)$ /$1 redirect;
    }
    location /private/ {
      auth_basic "private";
      auth_basic_user_file @DIR@/htpasswd;
    }
  }
}
"""

# Logged-in users are guests: they need no account on the machine and share one real user, ftp.
# The sandboxes inside are off because containers often refuse them.
VSFTPD = """
listen=YES
listen_address=127.0.0.1
listen_port=@PORT@
background=NO
seccomp_sandbox=NO
isolate=NO
isolate_network=NO
session_support=NO
secure_chroot_dir=@DIR@/empty
anonymous_enable=YES
anon_root=@DIR@/ftp
anon_upload_enable=YES
anon_other_write_enable=YES
anon_world_readable_only=NO
anon_umask=022
local_enable=YES
guest_enable=YES
guest_username=ftp
virtual_use_local_privs=YES
local_root=@DIR@/ftp_home
local_umask=022
chroot_local_user=YES
allow_writeable_chroot=YES
write_enable=YES
max_per_ip=0
pam_service_name=vsftpd
xferlog_enable=YES
vsftpd_log_file=@DIR@/ftp.log
"""

# The same once more, encrypted from the first byte.
NGINX_TLS = NGINX.replace("@PORT@;", """@PORT@ ssl;
    ssl_certificate @DIR@/localhost.pem;
    ssl_certificate_key @DIR@/localhost.pem;""").replace("nginx.pid", "nginx_tls.pid")

VSFTPD_TLS = VSFTPD + """
ssl_enable=YES
implicit_ssl=YES
require_ssl_reuse=YES
allow_anon_ssl=YES
ssl_ciphers=HIGH
rsa_cert_file=@DIR@/localhost.pem
rsa_private_key_file=@DIR@/localhost.pem
"""

PAM = """
auth required @MODULE@ @LOGINS@
account required @MODULE@
"""
