#!/usr/bin/env bash
# Makes the four root certificates that the library carries and prints them
# as C++ byte arrays for src/net/OENetBuiltInRoots.cpp. They are our own,
# made with throwaway 1024- and 1536-bit keys (never kept) and the subjects and validity
# periods of the roots that OFX servers of that era chained to; the Class 3
# authority signs the OFX CA. Running it again gives new keys, hence new bytes.
set -euo pipefail
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work"

cat > ca.cnf <<'EOF'
[ca]
default_ca = roots
[roots]
dir = .
database = index.txt
new_certs_dir = .
serial = serial
default_md = sha256
policy = anything
copy_extensions = none
unique_subject = no
[anything]
countryName = optional
organizationName = optional
organizationalUnitName = optional
commonName = optional
[req]
distinguished_name = dn
prompt = no
[dn]
[root]
basicConstraints = critical, CA:TRUE
keyUsage = keyCertSign, cRLSign
subjectKeyIdentifier = hash
[plain]
basicConstraints = critical, CA:TRUE
EOF

# make NAME BITS EXTENSIONS SUBJECT START END [ISSUER]: a key, a request, then
# the signed certificate in NAME.der; self-signed unless an issuer is named.
make() {
  local name=$1 bits=$2 extensions=$3 subject=$4 start=$5 end=$6 issuer=${7:-}
  : > index.txt
  openssl rand -hex 8 > serial
  openssl genrsa -out "$name.key" "$bits" 2> /dev/null
  openssl req -new -config ca.cnf -key "$name.key" -subj "$subject" -out "$name.csr"
  if [ -z "$issuer" ]; then
    openssl ca -batch -config ca.cnf -selfsign -keyfile "$name.key" -in "$name.csr" -out "$name.pem" \
      -startdate "$start" -enddate "$end" -extensions "$extensions" -notext 2> /dev/null
  else
    openssl ca -batch -config ca.cnf -cert "$issuer.pem" -keyfile "$issuer.key" -in "$name.csr" \
      -out "$name.pem" -startdate "$start" -enddate "$end" -extensions "$extensions" -notext 2> /dev/null
  fi
  openssl x509 -in "$name.pem" -outform DER -out "$name.der"
}

make branding 1536 root "/C=US/O=Vexari Inc./OU=OFX Branding/CN=Vexari OFX Branding Private CA" 970903000000Z 020903000000Z
make class3 1024 plain "/C=US/O=VeriSign, Inc./OU=Class 3 Public Primary Certification Authority" \
  960129000000Z 040107235959Z
make ofxca 1024 root "/O=VeriSign, Inc./OU=VeriSign Trust Network/CN=Open Financial Exchange CA - Class 3" \
  970710000000Z 020710235959Z class3
make rsa 1024 plain "/C=US/O=RSA Data Security, Inc./OU=Secure Server Certification Authority" \
  941109000000Z 100107235959Z

for name in branding ofxca class3 rsa; do
  python3 - "$name" "$(openssl x509 -in "$name.pem" -noout -subject -startdate -enddate | tr '\n' ';')" <<'EOF'
import sys
name, info = sys.argv[1], sys.argv[2]
data = open(name + ".der", "rb").read()
ident = "k" + {"branding": "Branding", "ofxca": "OFXCA", "class3": "Class3", "rsa": "RSAServer"}[name] + "Root"
print("// " + "; ".join(part.strip() for part in info.split(";") if part.strip()))
print("const unsigned char %s[%d] = {" % (ident, len(data)))
for i in range(0, len(data), 16):
    print("    " + ", ".join("0x%02x" % b for b in data[i:i + 16]) + ",")
print("};\n")
EOF
done
