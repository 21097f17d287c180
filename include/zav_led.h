/* LEDs: their states, and the record that is exchanged with the LED-event driver. */
#ifndef ZAV_LED_H
#define ZAV_LED_H

#ifdef __cplusplus
extern "C" {
#endif

/* ---- States of the LEDs. The number of the first is also that of ZAV_RC_ERR_LED. ---- */

#define ZAV_LED_OFF 0x2500
#define ZAV_LED_ON 0x2501     /* LEDs of the front panel */
#define ZAV_LED_VALUE2 0x2502 /* front panel, LED 5 only; the GPIO driver defines what it shows */

/* A disk's LED has two lines; the first can be 0, 1 or 2. */
#define ZAV_HDDLED_SECOND_ON 0x2503
#define ZAV_HDDLED_FIRST_ON 0x2504
#define ZAV_HDDLED_FIRST_2 0x2506
#define ZAV_HDDLED_FIRST_2_SECOND_ON 0x2507

typedef struct zavLEDEvent {
    int priority;
    int ledcode;
    int state;
} zavLEDEvent;

#ifdef __cplusplus
}
#endif

#endif
