rootCategory=INFO, A
appender.A.fileName=/var/log/a.log
appender.A.layout.ConversionPattern=%d{yyyy-MM-dd'T'HH:mm:ss,SSS} %d{HH:MM} %d{h:mm a} %m%n
