mkdir -p "$KORVEX_HOME/log"
cat > rotation.cfg << 'END'
log4cpp.rootCategory=INFO, MAIN
log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/main.log
log4cpp.appender.MAIN.maxFileSize=25
log4cpp.appender.MAIN.maxBackupIndex=2
END
rotation
tail -n +1 "$KORVEX_HOME"/log/*
