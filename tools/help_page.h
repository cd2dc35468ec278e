// The in-IDE help: parses plugin/method_help.txt (one entry per registered
// declaration, grouped by family) and renders one self-contained HTML page
// with a table of contents and an anchored entry per declaration. Every
// text is HTML-escaped; anchors are unique and every link points at one.
// Header-only on purpose: the help generator and the tests compile it
// without a library of its own, and it never goes into the plug-in.
#pragma once

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace zul::help {

struct entry {
  std::string family;       // "== " heading the entry sits under
  std::string declaration;  // exactly as registered with the host
  std::string summary, arguments, result, raises;
  std::vector<std::string> example;  // lines of code in the host's BASIC
  std::string unchecked;  // why a result stated in the example cannot be evaluated; not shown
  std::string anchor;     // unique id within the page
};

struct parsed {
  std::vector<entry> entries;  // in file order
  std::string error;           // "" when the whole file parsed
};

namespace detail {

inline std::string_view trim(std::string_view s) {
  while (!s.empty() && (s.front() == ' ' || s.front() == '\t' || s.front() == '\r'))
    s.remove_prefix(1);
  while (!s.empty() && (s.back() == ' ' || s.back() == '\t' || s.back() == '\r'))
    s.remove_suffix(1);
  return s;
}

// The method name of a declaration: everything before "(".
inline std::string_view method_name(std::string_view declaration) {
  return declaration.substr(0, declaration.find('('));
}

// The first line of source, which loses it (and its line feed).
inline std::string_view next_line(std::string_view& source) {
  const std::size_t end = source.find('\n');
  const std::string_view line = source.substr(0, end);
  source.remove_prefix(end == std::string_view::npos ? source.size() : end + 1);
  return line;
}

// Applies one "field: text" line (raw as written, line trimmed) to e; last
// becomes the field a continuation line extends. "" or what is wrong.
inline std::string apply_field(entry& e, std::string_view raw, std::string_view line,
                               std::string*& last) {
  const std::size_t colon = line.find(':');
  if (colon == std::string_view::npos) return "expected \"field: text\"";
  const std::string_view key = line.substr(0, colon);
  if (key == "example") {
    e.example.push_back(std::string(raw.substr(raw.find(':') + 1)).erase(0, 1));
    last = nullptr;
    return "";
  }
  std::string* field = key == "summary"     ? &e.summary
                       : key == "args"      ? &e.arguments
                       : key == "result"    ? &e.result
                       : key == "raises"    ? &e.raises
                       : key == "unchecked" ? &e.unchecked
                                            : nullptr;
  if (!field) return "unknown field \"" + std::string(key) + "\"";
  *field = std::string(trim(line.substr(colon + 1)));
  last = field;
  return "";
}

// Checks that every entry has summary, result and example, and gives each
// its anchor: the method name, numbered when the name is overloaded. "" or
// what is wrong.
inline std::string finish_entries(std::vector<entry>& entries) {
  std::map<std::string, int, std::less<>> uses, seen;
  for (const entry& e : entries) ++uses[std::string(method_name(e.declaration))];
  for (entry& e : entries) {
    if (e.summary.empty() || e.result.empty() || e.example.empty())
      return e.declaration + ": needs summary, result and example";
    std::string name(method_name(e.declaration));
    e.anchor = uses[name] > 1 ? name + "-" + std::to_string(++seen[name]) : name;
  }
  return "";
}

}  // namespace detail

// Parses the help source. Lines: "# ..." comment, "== Family" starts a
// family, "@ <declaration>" starts an entry, "summary:", "args:",
// "result:", "raises:", "unchecked:" set a field (a field may continue on
// lines that start with a blank), "example:" adds one line of example
// code. "unchecked:" says why a result an example states in a "//" comment
// cannot be evaluated by the example test; it is not rendered. Every
// entry needs summary, result and example; anything else is an error
// naming its line.
inline parsed parse_help(std::string_view source) {
  parsed out;
  std::string family;
  std::string* last = nullptr;
  for (int line_no = 1; !source.empty(); ++line_no) {
    const std::string_view raw = detail::next_line(source);
    const std::string_view line = detail::trim(raw);
    std::string error;
    if (line.empty() || line.front() == '#') {
      last = nullptr;
    } else if (raw.front() == ' ' && last) {  // continuation of the previous field
      *last += ' ';
      *last += line;
    } else if (line.starts_with("== ")) {
      family = std::string(detail::trim(line.substr(3)));
      last = nullptr;
    } else if (line.starts_with("@ ")) {
      if (family.empty()) error = "entry before any \"== \" family";
      out.entries.push_back(
          {family, std::string(detail::trim(line.substr(2))), {}, {}, {}, {}, {}, {}, {}});
      last = nullptr;
    } else if (out.entries.empty()) {
      error = "field before any \"@ \" entry";
    } else {
      error = detail::apply_field(out.entries.back(), raw, line, last);
    }
    if (!error.empty()) {
      out.error = "line " + std::to_string(line_no) + ": " + error;
      return out;
    }
  }
  out.error = detail::finish_entries(out.entries);
  return out;
}

// Text with &, <, > and " replaced by character references.
inline std::string escape_html(std::string_view text) {
  std::string out;
  out.reserve(text.size() + text.size() / 8);
  for (char c : text) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '>':
        out += "&gt;";
        break;
      case '"':
        out += "&quot;";
        break;
      default:
        out += c;
    }
  }
  return out;
}

// Renders the whole help page: title, introduction, table of contents by
// family, then one section per entry in the order given.
inline std::string render_help(const std::vector<entry>& entries) {
  std::string html = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<title>StringGlobalsZUL</title>
<style>
body { font-family: -apple-system, "Segoe UI", Helvetica, Arial, sans-serif; margin: 2em auto; max-width: 60em; padding: 0 1em; line-height: 1.45; color: #222; }
h1 { margin-bottom: 0.2em; }
h2 { border-bottom: 1px solid #ccc; padding-bottom: 0.2em; margin-top: 2em; }
code, pre { font-family: Menlo, Consolas, monospace; font-size: 0.92em; }
.decl { background: #f3f5f8; border-left: 4px solid #4a78c2; padding: 0.4em 0.7em; overflow-x: auto; white-space: pre-wrap; }
pre.example { background: #fbfbf4; border: 1px solid #e4e4cc; padding: 0.5em 0.7em; overflow-x: auto; }
dl { margin: 0.4em 0; } dt { font-weight: bold; float: left; width: 7em; clear: left; } dd { margin-left: 7.5em; }
nav ul { columns: 2; padding-left: 1.2em; } nav li { break-inside: avoid; margin-bottom: 0.2em; } nav h3 { margin-bottom: 0.2em; }
section.entry { margin-bottom: 1.6em; }
</style>
</head>
<body>
<h1>StringGlobalsZUL</h1>
<p>Text and binary-string functions for your projects. Every function below is global: call it like a built-in.
Strings are byte strings with a text encoding; each entry says what the result's encoding is.
An empty or Nil argument reads as empty. Any function that returns a string can raise OutOfMemoryException
when the result itself cannot be built.</p>
<nav id="contents">
<h2>Contents</h2>
)";
  std::string current;
  auto close_list = [&] {
    if (!current.empty()) html += "</ul>\n";
  };
  for (const entry& e : entries) {
    if (e.family != current) {
      close_list();
      current = e.family;
      html += "<h3>" + escape_html(current) + "</h3>\n<ul>\n";
    }
    html += "<li><a href=\"#" + e.anchor + "\"><code>" + escape_html(e.declaration) +
            "</code></a></li>\n";
  }
  close_list();
  html += "</nav>\n";
  current.clear();
  for (const entry& e : entries) {
    if (e.family != current) {
      current = e.family;
      html += "<h2>" + escape_html(current) + "</h2>\n";
    }
    html += "<section class=\"entry\" id=\"" + e.anchor + "\">\n";
    html += "<h3>" + escape_html(detail::method_name(e.declaration)) + "</h3>\n";
    html += "<pre class=\"decl\">" + escape_html(e.declaration) + "</pre>\n";
    html += "<p>" + escape_html(e.summary) + "</p>\n<dl>\n";
    if (!e.arguments.empty())
      html += "<dt>Arguments</dt><dd>" + escape_html(e.arguments) + "</dd>\n";
    html += "<dt>Result</dt><dd>" + escape_html(e.result) + "</dd>\n";
    html +=
        "<dt>Exceptions</dt><dd>" + escape_html(e.raises.empty() ? "None." : e.raises) + "</dd>\n";
    html += "</dl>\n<pre class=\"example\">";
    for (const std::string& line : e.example) html += escape_html(line) + "\n";
    html += "</pre>\n<p><a href=\"#contents\">Contents</a></p>\n</section>\n";
  }
  html += "</body>\n</html>\n";
  return html;
}

// The href values in html that lead nowhere: "#x" with no element whose id
// is x, and any link out of the page.
inline std::vector<std::string> broken_links(std::string_view html) {
  auto values = [&](std::string_view attribute) {
    std::vector<std::string> found;
    for (std::size_t at = html.find(attribute); at != std::string_view::npos;
         at = html.find(attribute, at + 1)) {
      std::size_t begin = at + attribute.size();
      std::size_t end = html.find('"', begin);
      if (end == std::string_view::npos) break;
      found.emplace_back(html.substr(begin, end - begin));
    }
    return found;
  };
  std::vector<std::string> ids = values(" id=\"");
  std::vector<std::string> broken;
  for (const std::string& target : values(" href=\"")) {
    if (!target.starts_with("#")) {  // the help folder holds this page only
      broken.push_back(target);
      continue;
    }
    bool ok = false;
    for (const std::string& id : ids) ok = ok || "#" + id == target;
    if (!ok) broken.push_back(target);
  }
  return broken;
}

}  // namespace zul::help
