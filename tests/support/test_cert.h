// A certificate shared by the security and transport tests.
#pragma once

namespace {

// Self-signed test certificate made once with the openssl tool:
// subject C=US, O=Vexa Test Bank, CN=ofx.example.com; 1024-bit RSA key;
// valid 2026-11-23 02:38:07Z to 2036-11-20 02:38:07Z.
constexpr const char* kCertB64 =
    "MIICXDCCAcWgAwIBAgIUA9ociUiWdMp2LzyGkHOFFYcV8LUwDQYJKoZIhvcNAQELBQAwQDELMAkG"
    "A1UEBhMCVVMxFzAVBgNVBAoMDlZleGEgVGVzdCBCYW5rMRgwFgYDVQQDDA9vZnguZXhhbXBsZS5j"
    "b20wHhcNMjYxMTIzMDIzODA3WhcNMzYxMTIwMDIzODA3WjBAMQswCQYDVQQGEwJVUzEXMBUGA1UE"
    "CgwOVmV4YSBUZXN0IEJhbmsxGDAWBgNVBAMMD29meC5leGFtcGxlLmNvbTCBnzANBgkqhkiG9w0B"
    "AQEFAAOBjQAwgYkCgYEAp/AshnmyCBiz3IjUDIZKyXSerzTVsbZ2LV14icPuOyYgYcn1h3QwAemD"
    "t0RFuCRPaFQqjHv7VY8X0oHRjDJKZJaFh4zm2WRRZ2fLpJ1ysMLkN/UFbyNDf2mjo+tydbeuHjXY"
    "IM3RdQXZHwR1wS2g5s/xuDle/Ba0iK/ui4pe/HUCAwEAAaNTMFEwHQYDVR0OBBYEFOU/ZkfB4GzQ"
    "HBudOLLKrIbBBaHWMB8GA1UdIwQYMBaAFOU/ZkfB4GzQHBudOLLKrIbBBaHWMA8GA1UdEwEB/wQF"
    "MAMBAf8wDQYJKoZIhvcNAQELBQADgYEAKb4MSgVvjHEPGDnb3WL8zDFpKGChacvrLe7gHJqXusJx"
    "gDUB+lLhtFoEU7BRmT2JY/SYotNd3zbfH2TDhu/DfJvPj/3jgJDsgz7iYNezR8xHeFQMYIFpAVDU"
    "BhpnvpkfglVc5ExSwBkm4QOrj6wrdMX6DOM8rZ5e9Y8SpTZBgJg="
    ;
constexpr const char* kCertSha1B64 = "CiFXfgzGUNWZVUIBuaupzEEBtrE=";

}  // namespace
