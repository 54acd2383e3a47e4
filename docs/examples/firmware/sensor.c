/* Reads the sensors over one of two buses. */
#if defined(BUS_I2C) && defined(BUS_SPI)
#error "one bus only"
#elif defined(BUS_I2C)
static int busSpeed(void) {
#if I2C_KHZ > 400
    return I2C_KHZ;
#elif I2C_KHZ >= 100 && I2C_KHZ <= 400
    return 400;
#elif !defined(BUS_SPI)
    return 100;
#else
    return 0;
#endif
}
#endif

#if SENSORS > 0 && (LOG_LEVEL >= 2 || SENSORS > 1)
void logSensors(void);
#if SENSORS != 0
void calibrate(void);
#endif
#if LOG_LEVEL < 2 && SENSORS == 1
void quiet(void);
#endif
#endif
