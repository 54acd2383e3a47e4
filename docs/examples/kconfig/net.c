#ifdef CONFIG_TLS
#if IS_MODULE(CONFIG_NET)
#endif
#endif
#if IS_ENABLED(CONFIG_NET) && CONFIG_QUEUE > 64
#endif
#ifdef CONFIG_NETWORK
#endif
