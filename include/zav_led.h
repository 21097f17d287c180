/* The record that is exchanged with the LED-event driver. */
#ifndef ZAV_LED_H
#define ZAV_LED_H

#ifdef __cplusplus
extern "C" {
#endif

typedef struct zavLEDEvent {
    int priority;
    int ledcode;
    int state;
} zavLEDEvent;

#ifdef __cplusplus
}
#endif

#endif
