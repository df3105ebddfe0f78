mkdir -p "$KORVEX_HOME/etc" "$KORVEX_HOME/log" "$KORVEX_DB/hashDb"
cat > "$KORVEX_HOME/etc/log-cmdline.cfg" << 'END'
log4cpp.rootCategory=INFO, MAIN
log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/hello.log
log4cpp.appender.MAIN.layout=PatternLayout
log4cpp.appender.MAIN.layout.ConversionPattern=%-5p %c: %m%n
END
hello
hello
cat "$KORVEX_HOME/log/hello.log"
