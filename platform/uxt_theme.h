#pragma once
// UI-extension theme service: changeable colour and font tables.
//
// Colour table file (XML):
//   <ColorTable>
//     <Color code="AO013" main="#RRGGBB[AA]" outline="#RRGGBB[AA]" shadow="#RRGGBB[AA]"/>
//     <Theme style="1"> <Color .../> ... </Theme>
//   </ColorTable>
// Colours outside <Theme> belong to every style; those inside a <Theme> of the
// selected style (uxt_theme_set_style) override them. "outline" and "shadow"
// default to the main colour.
//
// Font table file (XML):
//   <FontTable>
//     <Font code="T01" family="Sans" style="Regular" size="28"/>
//   </FontTable>
//
// Setting a table (and enabling changeable UI) publishes every entry as an
// edje colour class / text class named after its code, so theme groups may
// use them directly.

#include <Evas.h>
#include <stdbool.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _Uxt_Theme_Color_Table Uxt_Theme_Color_Table;
typedef struct _Uxt_Theme_Font_Table Uxt_Theme_Font_Table;

typedef enum {
  UXT_THEME_ERROR_NONE = 0,
  UXT_THEME_ERROR_INVALID_PARAMETER = -22,
  UXT_THEME_ERROR_OUT_OF_MEMORY = -12,
  UXT_THEME_ERROR_NOT_FOUND = -2,
  UXT_THEME_ERROR_NOT_SUPPORTED = -95,
} uxt_theme_error_e;

// NULL when the file cannot be read or holds no entry.
Uxt_Theme_Color_Table* uxt_theme_add_color_table(const char* file);
int uxt_theme_delete_color_table(Uxt_Theme_Color_Table* table);
int uxt_theme_set_color_table(Uxt_Theme_Color_Table* table);
Uxt_Theme_Font_Table* uxt_theme_add_font_table(const char* file);
int uxt_theme_delete_font_table(Uxt_Theme_Font_Table* table);
int uxt_theme_set_font_table(Uxt_Theme_Font_Table* table);

int uxt_theme_set_style(int style);
int uxt_theme_set_changeable_ui_enabled(bool enabled);

// Colour of `code` in the current table (0..255 each); any out-parameter may
// be NULL. Fails (and writes nothing) when no table is set or the code is
// unknown.
int uxt_theme_get_color(const char* code, int* r, int* g, int* b, int* a, int* outline_r, int* outline_g,
                        int* outline_b, int* outline_a, int* shadow_r, int* shadow_g, int* shadow_b,
                        int* shadow_a);
// Font of `code` in the current font table: *family is a heap copy, caller frees.
int uxt_theme_get_font(const char* code, char** family, char** style, int* size);

// Colours an object with the colour of `code` (premultiplied as evas wants).
int uxt_theme_object_set_color(Evas_Object* obj, const char* code);
// On an elementary widget, colour class `from_code` takes the colour of `to_code`.
int uxt_theme_object_replace_color(Evas_Object* obj, const char* from_code, const char* to_code);

#ifdef __cplusplus
}
#endif
