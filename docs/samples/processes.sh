mkdir -p "$KORVEX_HOME/log"
cat > processes.cfg << 'END'
rootCategory=INFO, SHARED
appender.SHARED.fileName=${KORVEX_HOME}/log/shared.log
END
processes
echo "$(wc -l < "$KORVEX_HOME/log/shared.log") lines"
echo "$(grep -cxE 'process [1-4], line [0-9]+' "$KORVEX_HOME/log/shared.log") of them whole"
echo "$(sort -u "$KORVEX_HOME/log/shared.log" | wc -l) of them different"
