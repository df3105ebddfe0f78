cat > life.cfg << 'END'
log4cpp.category.life=DEBUG, STDERR
log4cpp.appender.STDERR.layout=SimpleLayout
END
lifecycle
