#include "stream/http_digest.h"

#include <cstdio>

#include "stream/md5.h"

namespace {

std::string Lower(std::string_view text) {
    std::string lower(text);
    for (char& c : lower) {
        if (c >= 'A' && c <= 'Z') {
            c = static_cast<char>(c - 'A' + 'a');
        }
    }
    return lower;
}

std::string Join(std::initializer_list<std::string_view> parts) {
    std::string joined;
    bool first = true;
    for (std::string_view part : parts) {
        if (!first) {
            joined += ':';
        }
        joined.append(part);
        first = false;
    }
    return joined;
}

std::string Hex8(uint32_t value) {
    char buf[9];
    std::snprintf(buf, sizeof(buf), "%08x", value);
    return buf;
}

}  // namespace

bool CHttpDigest::FindHeader(std::string_view text, std::string_view name,
                             std::string_view* value) {
    const std::string lowerText = Lower(text);
    const std::string lowerName = Lower(name);
    const std::string_view hay(lowerText);
    size_t valueStart = std::string_view::npos;

    const std::string colon = lowerName + ":";
    const std::string spaceColon = lowerName + " :";
    if (hay.substr(0, colon.size()) == colon) {
        valueStart = colon.size();
    } else if (hay.substr(0, spaceColon.size()) == spaceColon) {
        valueStart = spaceColon.size();
    } else {
        const std::string lineColon = "\n" + colon;
        const std::string lineSpaceColon = "\n" + spaceColon;
        size_t at = hay.find(lineColon);
        if (at != std::string_view::npos) {
            valueStart = at + lineColon.size();
        } else if ((at = hay.find(lineSpaceColon)) != std::string_view::npos) {
            valueStart = at + lineSpaceColon.size();
        }
    }
    if (valueStart == std::string_view::npos) {
        return false;
    }
    while (valueStart < text.size() && (text[valueStart] == ' ' || text[valueStart] == '\t')) {
        ++valueStart;
    }
    size_t end = text.find("\r\n", valueStart);
    if (end == std::string_view::npos) {
        end = text.size();
    }
    *value = text.substr(valueStart, end - valueStart);
    return true;
}

bool CHttpDigest::FindParameter(std::string_view list, std::string_view name, std::string* value) {
    const std::string lowerList = Lower(list);
    const std::string key = Lower(name) + "=";
    const std::string_view hay(lowerList);
    size_t start = std::string_view::npos;
    if (hay.substr(0, key.size()) == key) {
        start = key.size();
    } else {
        size_t at = hay.find(", " + key);
        if (at != std::string_view::npos) {
            start = at + 2 + key.size();
        } else if ((at = hay.find("," + key)) != std::string_view::npos) {
            start = at + 1 + key.size();
        }
    }
    if (start == std::string_view::npos) {
        return false;
    }
    value->clear();
    if (start < list.size() && list[start] == '"') {
        size_t pos = start + 1;
        for (;;) {
            size_t quote = list.find('"', pos);
            if (quote == std::string_view::npos) {
                // Unterminated: the value cannot be trusted.
                return true;
            }
            if (quote + 1 < list.size() && list[quote + 1] == '"') {
                pos = quote + 2;
                continue;
            }
            *value = std::string(list.substr(start + 1, quote - start - 1));
            return true;
        }
    }
    size_t end = list.find(',', start);
    if (end == std::string_view::npos) {
        end = list.size();
    }
    *value = std::string(list.substr(start, end - start));
    return true;
}

void CHttpDigest::ParseChallenge(std::string_view text, SDigestChallenge* challenge) {
    *challenge = SDigestChallenge{};
    std::string_view header;
    if (!FindHeader(text, "WWW-Authenticate", &header)) {
        return;
    }
    size_t space = header.find(' ');
    if (space == std::string_view::npos) {
        return;
    }
    challenge->scheme = std::string(header.substr(0, space));
    std::string_view params = header.substr(space + 1);
    FindParameter(params, "realm", &challenge->realm);
    FindParameter(params, "qop", &challenge->qop);
    FindParameter(params, "nonce", &challenge->nonce);
    FindParameter(params, "opaque", &challenge->opaque);
    std::string stale;
    if (FindParameter(params, "stale", &stale)) {
        challenge->stale = (stale == "true");
    }
}

std::string CHttpDigest::ComputeResponse(std::string_view password) const {
    const std::string ha1 = CMd5::Hex(Join({username, realm, password}));
    std::string a2 = Join({method, uri});
    if (qop == "auth_int") {
        a2 += ":" + CMd5::Hex(entityBody);
    }
    const std::string ha2 = CMd5::Hex(a2);
    if (qop == "auth" || qop == "auth_int") {
        return CMd5::Hex(Join({ha1, nonce, Hex8(nonceCount), cnonce, "auth", ha2}));
    }
    return CMd5::Hex(Join({ha1, nonce, ha2}));
}

std::string CHttpDigest::BuildAuthorization(std::string_view response401, std::string_view user,
                                            std::string_view password) {
    SDigestChallenge challenge;
    ParseChallenge(response401, &challenge);
    scheme = "Digest";
    username = std::string(user);
    realm = challenge.realm;
    nonce = challenge.nonce;
    opaque = challenge.opaque;
    // The camera's own qop offer is not consulted: cameras all take "auth".
    qop = "auth";
    nonceCount = 1;
    cnonce = kClientNonce;
    entityBody.clear();
    response = ComputeResponse(password);

    std::string line = "Authorization: " + scheme + " username=\"" + username + "\", realm=\"" +
                       realm + "\", nonce=\"" + nonce + "\", uri=\"" + uri + "\", qop=" + qop +
                       ", nc=" + Hex8(nonceCount) + ", cnonce=\"" + cnonce + "\", response=\"" +
                       response + "\", opaque=\"" + opaque + "\"";
    line += "\r\n";
    return line;
}
