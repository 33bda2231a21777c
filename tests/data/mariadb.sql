GRANT ALL ON *.* TO 'kest'@'127.0.0.1' IDENTIFIED BY 's3cret' WITH GRANT OPTION;
-- the component always logs in as "sa", and its password is empty by default
GRANT ALL ON *.* TO 'sa'@'127.0.0.1' IDENTIFIED BY '' WITH GRANT OPTION;
