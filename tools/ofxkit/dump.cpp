// ofxkit dump: the object tree of an OFX file and the warnings of its parse.
#include <cstdio>
#include <nlohmann/json.hpp>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kDumpHelp[] =
    "usage: ofxkit dump [--json] [--strict] FILE\n"
    "Parses an OFX request or response file and prints its object tree, then the\n"
    "warnings of the parse (code, tag, value, position). Passwords are never shown.\n"
    "  --json   print the same as one JSON document\n"
    "  --strict read by the OFX 1.x rules only (by default, blank lines before the\n"
    "           headers, ENCODING:UTF-8 and empty elements are read, with warnings)\n"
    "Data of the file that could not be read is reported on standard error.\n"
    "Exit status: 0 clean parse, 1 parsed with warnings, 2 parse failed, 3 unreadable\n"
    "or not OFX, 64 bad command line.\n";


// One element value of an object, as the tree shows it.
struct Element {
  OETagID tag;
  std::string value;
};

// The present elements of an object, in writing order (passwords hidden).
std::vector<Element> ElementsOf(const OEDataObj* obj) {
  std::vector<Element> out;
  const OEAggregate* agg = dynamic_cast<const OEAggregate*>(obj);
  if (!agg) return out;
  const OEAggregateInfo& info = agg->GetInfo();
  OEString text;
  for (size_t i = 0; i < info.writeList.size(); ++i) {
    const OEFieldDesc* d = info.writeList[i];
    OETagID tag = info.writeTags[i];
    if (!d->text || !agg->ValidateTag(tag)) continue;
    unsigned short n = d->count ? d->count(agg) : 1;
    for (unsigned short k = 0; k < n; ++k) {
      if (tag == OE_TAG_USERPASS || tag == OE_TAG_NEWUSERPASS) {
        out.push_back({tag, "(hidden)"});
      } else if (d->text(agg, k, text)) {
        out.push_back({tag, OutputText(text.c_str(), TagName(tag))});
      }
    }
  }
  return out;
}

const char* HeaderName(int32_t h) { return OEDataConversion::Text(static_cast<OEHeaderTag>(h)); }

void HeadersOf(const OEDataObj* obj, std::vector<Element>& out) {
  const OEFileOFX* file = dynamic_cast<const OEFileOFX*>(obj);
  if (!file) return;
  for (int32_t h = OE_HEADER_OFXHEADER; h <= OE_HEADER_NEWFILEUID; ++h)
    if (const OEString* value = file->GetHeader(static_cast<OEHeaderTag>(h)))
      out.push_back({static_cast<OETagID>(h), OutputText(value->c_str(), HeaderName(h))});
}

// The children to show: the object's own, and a securities-list response
// set's list, which stands beside its wrappers rather than among them.
std::vector<const OEDataObj*> ChildrenOf(const OEDataObj* obj) {
  std::vector<const OEDataObj*> out;
  for (unsigned short i = 0, n = obj->GetNumberOfChildren(); i < n; ++i)
    if (const OEDataObj* child = obj->GetChild(i)) out.push_back(child);
  if (const auto* set = dynamic_cast<const OEMessageSetRs*>(obj))
    if (set->GetSecList()) out.push_back(set->GetSecList());
  return out;
}

// Any byte string as a JSON string literal. Text from a file may be in any
// character set (or none): valid UTF-8 is kept, every other byte becomes
// U+FFFD, and control characters are escaped, so the JSON output is always
// well formed and writing it never fails. Every text of the JSON output
// (headers, elements, warnings, names) goes through here.
std::string JsonText(const std::string& bytes) {
  std::string utf8;
  utf8.reserve(bytes.size());
  const unsigned char* p = reinterpret_cast<const unsigned char*>(bytes.data());
  const size_t n = bytes.size();
  for (size_t i = 0; i < n;) {
    const unsigned char c = p[i];
    size_t length = c < 0x80 ? 1 : (c >> 5) == 0x6 ? 2 : (c >> 4) == 0xE ? 3 : (c >> 3) == 0x1E ? 4 : 0;
    bool valid = length > 0 && i + length <= n;
    for (size_t k = 1; valid && k < length; ++k) valid = (p[i + k] & 0xC0) == 0x80;
    if (valid && length > 1) {  // no overlong forms, surrogates or values past U+10FFFF
      const unsigned char d = p[i + 1];
      valid = !(c == 0xC0 || c == 0xC1 || (c == 0xE0 && d < 0xA0) || (c == 0xED && d >= 0xA0) ||
                (c == 0xF0 && d < 0x90) || (c == 0xF4 && d >= 0x90) || c > 0xF4);
    }
    if (valid) {
      utf8.append(bytes, i, length);
      i += length;
    } else {
      utf8 += "\xEF\xBF\xBD";
      ++i;
    }
  }
  return nlohmann::json(utf8).dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
}

std::string JsonText(const char* text) { return JsonText(std::string(text ? text : "")); }

void DumpText(const OEDataObj* obj, int depth, FILE* out) {
  std::string indent(static_cast<size_t>(depth) * 2, ' ');
  std::fprintf(out, "%s%s\n", indent.c_str(), TagName(obj->GetType()));
  std::vector<Element> headers;
  HeadersOf(obj, headers);
  for (const Element& h : headers)
    std::fprintf(out, "%s  %s:%s\n", indent.c_str(), HeaderName(h.tag), h.value.c_str());
  for (const Element& e : ElementsOf(obj))
    std::fprintf(out, "%s  %s = %s\n", indent.c_str(), TagName(e.tag), e.value.c_str());
  for (const OEDataObj* child : ChildrenOf(obj)) DumpText(child, depth + 1, out);
}

// Streams the tree as JSON, one object at a time, so a large statement does
// not need its whole JSON document in memory.
void DumpJson(const OEDataObj* obj, FILE* out) {
  std::fprintf(out, "{\"type\":%s", JsonText(TagName(obj->GetType())).c_str());
  std::vector<Element> headers;
  HeadersOf(obj, headers);
  for (size_t i = 0; i < headers.size(); ++i)
    std::fprintf(out, "%s%s:%s", i ? "," : ",\"headers\":{", JsonText(HeaderName(headers[i].tag)).c_str(),
                 JsonText(headers[i].value).c_str());
  if (!headers.empty()) std::fprintf(out, "}");
  // Elements by name; a repeated element gives an array of its values.
  std::vector<Element> elements = ElementsOf(obj);
  std::vector<bool> written(elements.size(), false);
  bool first = true;
  for (size_t i = 0; i < elements.size(); ++i) {
    if (written[i]) continue;
    std::vector<size_t> same;
    for (size_t k = i; k < elements.size(); ++k)
      if (!written[k] && elements[k].tag == elements[i].tag) same.push_back(k);
    std::fprintf(out, "%s%s:%s", first ? ",\"elements\":{" : ",", JsonText(TagName(elements[i].tag)).c_str(),
                 same.size() > 1 ? "[" : "");
    first = false;
    for (size_t k = 0; k < same.size(); ++k) {
      std::fprintf(out, "%s%s", k ? "," : "", JsonText(elements[same[k]].value).c_str());
      written[same[k]] = true;
    }
    if (same.size() > 1) std::fprintf(out, "]");
  }
  if (!first) std::fprintf(out, "}");
  first = true;
  for (const OEDataObj* child : ChildrenOf(obj)) {
    std::fprintf(out, first ? ",\"children\":[" : ",");
    first = false;
    DumpJson(child, out);
  }
  if (!first) std::fprintf(out, "]");
  std::fprintf(out, "}");
}

void WarningJson(const OEParseException& w, FILE* out) {
  std::fprintf(out, "{\"code\":%s,\"tag\":%s,\"value\":%s,\"position\":%d}",
               JsonText(OEParseException::WarningName(w.warning)).c_str(),
               JsonText(w.tag ? TagName(w.tag) : OutputText(w.tagName.c_str(), "a warning")).c_str(),
               JsonText(OutputText(w.value.c_str(), "a warning")).c_str(),
               static_cast<int>(w.position));
}

}  // namespace

int CmdDump(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kDumpHelp, stdout);
    return kClean;
  }
  bool json = args.Flag("json");
  bool strict = args.Flag("strict");
  std::string error;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit dump: %s\n%s", error.empty() ? "expected one FILE" : error.c_str(), kDumpHelp);
    return kUsage;
  }
  ParsedFile parsed;
  parsed.strict = strict;
  int rc = ParseOFXFile(files[0], parsed, &error);
  if (rc == kBadInput) {
    std::fprintf(stderr, "ofxkit dump: %s\n", error.c_str());
    return rc;
  }
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (json) {
    std::fprintf(stdout, "{\"status\":%d,\"tree\":", static_cast<int>(parsed.status));
    DumpJson(parsed.file.get(), stdout);
    std::fprintf(stdout, ",\"warnings\":[");
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      if (i) std::fprintf(stdout, ",");
      WarningJson(*log->Get(i), stdout);
    }
    std::fprintf(stdout, "]}\n");
  } else {
    DumpText(parsed.file.get(), 0, stdout);
    std::fprintf(stdout, "parse status %d, %u warning(s)\n", static_cast<int>(parsed.status),
                 static_cast<unsigned>(log->Entries()));
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      const OEParseException* w = log->Get(i);
      std::fprintf(stdout, "  %s tag=%s value=\"%s\" position=%d\n", OEParseException::WarningName(w->warning),
                   w->tag ? TagName(w->tag) : OutputText(w->tagName.c_str(), "a warning").c_str(),
                   OutputText(w->value.c_str(), "a warning").c_str(), static_cast<int>(w->position));
    }
  }
  return ReportLosses("dump", parsed, rc);
}

}  // namespace cli
