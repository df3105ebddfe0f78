echo 'rootCategory=INFO' > signals.cfg
signals
