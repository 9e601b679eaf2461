#include "platform/uxt_theme.h"

#include <Edje.h>
#include <Eina.h>
#include <Elementary.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <map>
#include <mutex>
#include <new>
#include <sstream>
#include <string>

#include "common/CLyLog.h"

namespace {

struct Rgba {
  int r = 0, g = 0, b = 0, a = 255;
};

struct ColorEntry {
  Rgba main, outline, shadow;
};

struct FontEntry {
  std::string family;
  std::string style;
  int size = 0;
};

}  // namespace

struct _Uxt_Theme_Color_Table {
  std::map<std::string, ColorEntry> common;
  std::map<int, std::map<std::string, ColorEntry>> styles;
};

struct _Uxt_Theme_Font_Table {
  std::map<std::string, FontEntry> fonts;
};

namespace {

std::mutex gMutex;
Uxt_Theme_Color_Table* gColorTable = nullptr;
Uxt_Theme_Font_Table* gFontTable = nullptr;
int gStyle = 0;
bool gChangeable = false;

// "#RRGGBB" or "#RRGGBBAA".
bool parseColor(const std::string& text, Rgba& out) {
  if (text.size() != 7 && text.size() != 9) return false;
  if (text[0] != '#') return false;
  for (size_t i = 1; i < text.size(); ++i) {
    if (!isxdigit(static_cast<unsigned char>(text[i]))) return false;
  }
  auto byte = [&](size_t pos) { return static_cast<int>(strtol(text.substr(pos, 2).c_str(), nullptr, 16)); };
  out.r = byte(1);
  out.g = byte(3);
  out.b = byte(5);
  out.a = text.size() == 9 ? byte(7) : 255;
  return true;
}

bool readFile(const char* file, std::string& content) {
  std::ifstream in(file, std::ios::binary);
  if (!in) return false;
  std::ostringstream ss;
  ss << in.rdbuf();
  content = ss.str();
  return true;
}

using Attributes = std::map<std::string, std::string>;

Eina_Bool collectAttribute(void* data, const char* key, const char* value) {
  (*static_cast<Attributes*>(data))[key] = value;
  return EINA_TRUE;
}

// Parse state shared by both table readers.
struct ParseState {
  Uxt_Theme_Color_Table* colors = nullptr;
  Uxt_Theme_Font_Table* fonts = nullptr;
  const char* file = "";
  int style = -1;  // inside <Theme style="N">, else -1
  int entries = 0;
  bool broken = false;
};

std::string tagName(const char* content, unsigned length) {
  unsigned n = 0;
  while (n < length && !isspace(static_cast<unsigned char>(content[n])) && content[n] != '/' &&
         content[n] != '>')
    ++n;
  return std::string(content, n);
}

Attributes tagAttributes(const char* content, unsigned length) {
  Attributes attributes;
  const char* start = eina_simple_xml_tag_attributes_find(content, length);
  if (start) {
    unsigned rest = length - static_cast<unsigned>(start - content);
    eina_simple_xml_attributes_parse(start, rest, collectAttribute, &attributes);
  }
  return attributes;
}

void addColor(ParseState& state, const Attributes& attributes) {
  auto code = attributes.find("code");
  auto main = attributes.find("main");
  ColorEntry entry;
  if (code == attributes.end() || code->second.empty() || main == attributes.end() ||
      !parseColor(main->second, entry.main)) {
    LYLOG_E("%s: colour entry without a code or a valid main colour", state.file);
    return;
  }
  entry.outline = entry.main;
  entry.shadow = entry.main;
  auto outline = attributes.find("outline");
  if (outline != attributes.end() && !parseColor(outline->second, entry.outline)) {
    LYLOG_E("%s: bad outline colour of %s", state.file, code->second.c_str());
  }
  auto shadow = attributes.find("shadow");
  if (shadow != attributes.end() && !parseColor(shadow->second, entry.shadow)) {
    LYLOG_E("%s: bad shadow colour of %s", state.file, code->second.c_str());
  }
  if (state.style >= 0) {
    state.colors->styles[state.style][code->second] = entry;
  } else {
    state.colors->common[code->second] = entry;
  }
  ++state.entries;
}

void addFont(ParseState& state, const Attributes& attributes) {
  auto code = attributes.find("code");
  auto family = attributes.find("family");
  if (code == attributes.end() || code->second.empty() || family == attributes.end() ||
      family->second.empty()) {
    LYLOG_E("%s: font entry without a code or a family", state.file);
    return;
  }
  FontEntry entry;
  entry.family = family->second;
  if (auto style = attributes.find("style"); style != attributes.end()) entry.style = style->second;
  if (auto size = attributes.find("size"); size != attributes.end()) entry.size = atoi(size->second.c_str());
  if (entry.size < 0 || entry.size > 1000) entry.size = 0;
  state.fonts->fonts[code->second] = entry;
  ++state.entries;
}

Eina_Bool onXml(void* data, Eina_Simple_XML_Type type, const char* content, unsigned, unsigned length) {
  auto& state = *static_cast<ParseState*>(data);
  switch (type) {
    case EINA_SIMPLE_XML_OPEN:
    case EINA_SIMPLE_XML_OPEN_EMPTY: {
      std::string name = tagName(content, length);
      Attributes attributes = tagAttributes(content, length);
      if (state.colors && name == "Color") {
        addColor(state, attributes);
      } else if (state.fonts && name == "Font") {
        addFont(state, attributes);
      } else if (state.colors && name == "Theme" && type == EINA_SIMPLE_XML_OPEN) {
        auto style = attributes.find("style");
        state.style = style != attributes.end() ? atoi(style->second.c_str()) : 0;
      }
      break;
    }
    case EINA_SIMPLE_XML_CLOSE:
      if (tagName(content, length) == "Theme") state.style = -1;
      break;
    case EINA_SIMPLE_XML_ERROR:
      state.broken = true;
      return EINA_FALSE;
    default:
      break;
  }
  return EINA_TRUE;
}

bool parseTable(const char* file, ParseState& state) {
  std::string content;
  if (!file || !readFile(file, content)) {
    LYLOG_E("Cannot read theme table %s", file ? file : "(null)");
    return false;
  }
  state.file = file;
  Eina_Bool ok =
      eina_simple_xml_parse(content.c_str(), static_cast<unsigned>(content.size()), EINA_TRUE, onXml, &state);
  if (!ok || state.broken) {
    LYLOG_E("Theme table %s is not well formed", file);
    return false;
  }
  if (state.entries == 0) {
    LYLOG_E("Theme table %s holds no entry", file);
    return false;
  }
  return true;
}

// Call with gMutex held. The colour of `code` in the current style.
const ColorEntry* findColor(const char* code) {
  if (!gColorTable || !code) return nullptr;
  auto style = gColorTable->styles.find(gStyle);
  if (style != gColorTable->styles.end()) {
    auto it = style->second.find(code);
    if (it != style->second.end()) return &it->second;
  }
  auto it = gColorTable->common.find(code);
  return it != gColorTable->common.end() ? &it->second : nullptr;
}

// Runs fn only while edje is up (edje_init() answers 1 when it was not).
template <typename Fn>
void withEdje(Fn fn) {
  int count = edje_init();
  if (count > 1) fn();
  edje_shutdown();
}

// Call with gMutex held: publishes the tables as edje colour / text classes.
void publishLocked() {
  if (!gChangeable) return;
  withEdje([] {
    if (gColorTable) {
      std::map<std::string, ColorEntry> all = gColorTable->common;
      auto style = gColorTable->styles.find(gStyle);
      if (style != gColorTable->styles.end()) {
        for (const auto& entry : style->second) all[entry.first] = entry.second;
      }
      for (const auto& [code, c] : all) {
        edje_color_class_set(code.c_str(), c.main.r, c.main.g, c.main.b, c.main.a, c.outline.r, c.outline.g,
                             c.outline.b, c.outline.a, c.shadow.r, c.shadow.g, c.shadow.b, c.shadow.a);
      }
    }
    if (gFontTable) {
      for (const auto& [code, f] : gFontTable->fonts) {
        std::string font = f.style.empty() ? f.family : f.family + ":style=" + f.style;
        edje_text_class_set(code.c_str(), font.c_str(), f.size);
      }
    }
  });
}

void setIf(int* out, int value) {
  if (out) *out = value;
}

// Colour and font tables load, drop and switch the same way; `Slot` says
// which half of the parse state a table fills.
template <typename Table, Table* ParseState::*Slot>
Table* addTable(const char* file) {
  auto* table = new (std::nothrow) Table;
  if (!table) return nullptr;
  ParseState state;
  state.*Slot = table;
  if (!parseTable(file, state)) {
    delete table;
    return nullptr;
  }
  return table;
}

template <typename Table>
int deleteTable(Table* table, Table*& current) {
  if (!table) return UXT_THEME_ERROR_INVALID_PARAMETER;
  std::lock_guard<std::mutex> lock(gMutex);
  if (current == table) current = nullptr;
  delete table;
  return UXT_THEME_ERROR_NONE;
}

template <typename Table>
int setTable(Table* table, Table*& current) {
  if (!table) return UXT_THEME_ERROR_INVALID_PARAMETER;
  std::lock_guard<std::mutex> lock(gMutex);
  current = table;
  publishLocked();
  return UXT_THEME_ERROR_NONE;
}

}  // namespace

extern "C" Uxt_Theme_Color_Table* uxt_theme_add_color_table(const char* file) {
  return addTable<Uxt_Theme_Color_Table, &ParseState::colors>(file);
}

extern "C" int uxt_theme_delete_color_table(Uxt_Theme_Color_Table* table) {
  return deleteTable(table, gColorTable);
}

extern "C" int uxt_theme_set_color_table(Uxt_Theme_Color_Table* table) {
  return setTable(table, gColorTable);
}

extern "C" Uxt_Theme_Font_Table* uxt_theme_add_font_table(const char* file) {
  return addTable<Uxt_Theme_Font_Table, &ParseState::fonts>(file);
}

extern "C" int uxt_theme_delete_font_table(Uxt_Theme_Font_Table* table) {
  return deleteTable(table, gFontTable);
}

extern "C" int uxt_theme_set_font_table(Uxt_Theme_Font_Table* table) {
  return setTable(table, gFontTable);
}

extern "C" int uxt_theme_set_style(int style) {
  if (style < 0) return UXT_THEME_ERROR_INVALID_PARAMETER;
  std::lock_guard<std::mutex> lock(gMutex);
  gStyle = style;
  publishLocked();
  return UXT_THEME_ERROR_NONE;
}

extern "C" int uxt_theme_set_changeable_ui_enabled(bool enabled) {
  std::lock_guard<std::mutex> lock(gMutex);
  gChangeable = enabled;
  publishLocked();
  return UXT_THEME_ERROR_NONE;
}

extern "C" int uxt_theme_get_color(const char* code, int* r, int* g, int* b, int* a, int* outline_r,
                                   int* outline_g, int* outline_b, int* outline_a, int* shadow_r,
                                   int* shadow_g, int* shadow_b, int* shadow_a) {
  if (!code) return UXT_THEME_ERROR_INVALID_PARAMETER;
  std::lock_guard<std::mutex> lock(gMutex);
  const ColorEntry* entry = findColor(code);
  if (!entry) return UXT_THEME_ERROR_NOT_FOUND;
  setIf(r, entry->main.r);
  setIf(g, entry->main.g);
  setIf(b, entry->main.b);
  setIf(a, entry->main.a);
  setIf(outline_r, entry->outline.r);
  setIf(outline_g, entry->outline.g);
  setIf(outline_b, entry->outline.b);
  setIf(outline_a, entry->outline.a);
  setIf(shadow_r, entry->shadow.r);
  setIf(shadow_g, entry->shadow.g);
  setIf(shadow_b, entry->shadow.b);
  setIf(shadow_a, entry->shadow.a);
  return UXT_THEME_ERROR_NONE;
}

extern "C" int uxt_theme_get_font(const char* code, char** family, char** style, int* size) {
  if (!code) return UXT_THEME_ERROR_INVALID_PARAMETER;
  std::lock_guard<std::mutex> lock(gMutex);
  if (!gFontTable) return UXT_THEME_ERROR_NOT_FOUND;
  auto it = gFontTable->fonts.find(code);
  if (it == gFontTable->fonts.end()) return UXT_THEME_ERROR_NOT_FOUND;
  if (family) *family = strdup(it->second.family.c_str());
  if (style) *style = strdup(it->second.style.c_str());
  if (size) *size = it->second.size;
  return UXT_THEME_ERROR_NONE;
}

extern "C" int uxt_theme_object_set_color(Evas_Object* obj, const char* code) {
  if (!obj || !code) return UXT_THEME_ERROR_INVALID_PARAMETER;
  Rgba c;
  {
    std::lock_guard<std::mutex> lock(gMutex);
    const ColorEntry* entry = findColor(code);
    if (!entry) return UXT_THEME_ERROR_NOT_FOUND;
    c = entry->main;
  }
  // Evas colours are premultiplied by alpha.
  evas_object_color_set(obj, c.r * c.a / 255, c.g * c.a / 255, c.b * c.a / 255, c.a);
  return UXT_THEME_ERROR_NONE;
}

extern "C" int uxt_theme_object_replace_color(Evas_Object* obj, const char* from_code, const char* to_code) {
  if (!obj || !from_code || !to_code) return UXT_THEME_ERROR_INVALID_PARAMETER;
  ColorEntry c;
  {
    std::lock_guard<std::mutex> lock(gMutex);
    const ColorEntry* entry = findColor(to_code);
    if (!entry) return UXT_THEME_ERROR_NOT_FOUND;
    c = *entry;
  }
  Evas_Object* edje = nullptr;
  const char* type = evas_object_type_get(obj);
  if (type && strcmp(type, "edje") == 0) {
    edje = obj;
  } else if (elm_object_widget_check(obj)) {
    edje = elm_layout_edje_get(obj);
  }
  if (!edje) return UXT_THEME_ERROR_NOT_SUPPORTED;
  edje_object_color_class_set(edje, from_code, c.main.r, c.main.g, c.main.b, c.main.a, c.outline.r,
                              c.outline.g, c.outline.b, c.outline.a, c.shadow.r, c.shadow.g, c.shadow.b,
                              c.shadow.a);
  return UXT_THEME_ERROR_NONE;
}
