#pragma once
// The device's hardware keys for EFL objects: "back" and "more".
//
// Desktop key mapping:
//   back  Escape, or XF86Back on keyboards that have a back key
//   more  Menu, or XF86Menu
//
// Of all visible objects of a window with a callback for the pressed key,
// the one shown (or first given a callback) most recently gets the key; its
// callbacks run in the order they were added. A handled key is marked as
// held, so widgets do not act on it a second time.

#include <Evas.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  EEXT_CALLBACK_BACK,
  EEXT_CALLBACK_MORE,
  EEXT_CALLBACK_LAST,
} Eext_Callback_Type;

typedef void (*Eext_Event_Cb)(void* data, Evas_Object* obj, void* event_info);

void eext_object_event_callback_add(Evas_Object* obj, Eext_Callback_Type type, Eext_Event_Cb func,
                                    void* data);
// Removes the first callback `func` of `type` from `obj`; returns its data.
void* eext_object_event_callback_del(Evas_Object* obj, Eext_Callback_Type type, Eext_Event_Cb func);

// Ready-made callbacks: pop the naviframe's top item, press its "more"
// button, dismiss a ctxpopup or delete a popup.
void eext_naviframe_back_cb(void* data, Evas_Object* obj, void* event_info);
void eext_naviframe_more_cb(void* data, Evas_Object* obj, void* event_info);
void eext_ctxpopup_back_cb(void* data, Evas_Object* obj, void* event_info);
void eext_popup_back_cb(void* data, Evas_Object* obj, void* event_info);

#ifdef __cplusplus
}
#endif
